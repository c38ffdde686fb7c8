// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Texts in fixed-size fields.
#ifndef MEDIIDX_SUPPORT_TEXT_H_
#define MEDIIDX_SUPPORT_TEXT_H_

#include <cstddef>
#include <span>
#include <string_view>

namespace mediidx {

/// The longest beginning of `text` of at most `width` bytes that ends at the border of a UTF-8
/// character. Bytes that are no UTF-8 count as characters of their own.
std::string_view cut_at_character(std::string_view text, std::size_t width);

/// Copies `text` into `field`, cut at the border of a character, and terminates it.
void copy_text(std::span<char> field, std::string_view text);

}  // namespace mediidx

#endif
