// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The keys by which names are searched and sorted.
///
/// A search key is the name with a to z raised, whatever the process's locale; a sort key is the
/// search key without one leading article ("A ", "AN ", "THE "). Both are cut at the border of a
/// UTF-8 character.
#ifndef MEDIIDX_SUPPORT_SORT_KEY_H_
#define MEDIIDX_SUPPORT_SORT_KEY_H_

#include <cstddef>
#include <span>
#include <string_view>

namespace mediidx {

/// The width of a stored key, terminator included.
inline constexpr std::size_t kKeySize = 256;

/// The rest of an upper-cased text behind one leading article.
std::string_view without_article(std::string_view search_key);

/// Writes both keys of `name`, each within its span and terminated; the rest of `sort` is zeroed.
/// The sort key is made of the search key as it was cut. A span for no more than the terminator
/// holds an empty key; an empty span is left alone.
void sort_and_search_keys(std::string_view name, std::span<char> search, std::span<char> sort);

/// The same for C buffers and their lengths, terminators included. A null name has empty keys; a
/// null buffer or a length below 1 is no buffer. Returns `sort`.
char* make_sort_and_search_keys(const char* name, char* search, int search_length, char* sort,
                                int sort_length);

/// Both keys of a name at their stored width.
struct NameKeys {
  explicit NameKeys(std::string_view name) { sort_and_search_keys(name, search, sort); }

  char sort[kKeySize];
  char search[kKeySize];
};

}  // namespace mediidx

#endif
