// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "support/sort_key.h"

#include <algorithm>

#include "support/text.h"

namespace mediidx {
namespace {

/// What toupper does in the "C" locale; the process may run in another one.
constexpr char raised(char byte) {
  return byte >= 'a' && byte <= 'z' ? static_cast<char>(byte - 'a' + 'A') : byte;
}

std::span<char> buffer(char* start, int length) {
  return start && length > 0 ? std::span(start, static_cast<std::size_t>(length))
                             : std::span<char>();
}

}  // namespace

std::string_view without_article(std::string_view search_key) {
  for (const std::string_view article : {"A ", "AN ", "THE "}) {
    if (search_key.starts_with(article)) return search_key.substr(article.size());
  }
  return search_key;
}

void sort_and_search_keys(std::string_view name, std::span<char> search, std::span<char> sort) {
  std::string_view search_key;
  if (!search.empty()) {
    const auto kept = cut_at_character(name, search.size() - 1);
    *std::transform(kept.begin(), kept.end(), search.begin(), raised) = '\0';
    search_key = {search.data(), kept.size()};
  }
  std::ranges::fill(sort, '\0');
  copy_text(sort, without_article(search_key));
}

char* make_sort_and_search_keys(const char* name, char* search, int search_length, char* sort,
                                int sort_length) {
  sort_and_search_keys(name ? name : "", buffer(search, search_length), buffer(sort, sort_length));
  return sort;
}

}  // namespace mediidx
