// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// UTF-8, strictly: no overlong forms, no surrogates, nothing beyond U+10FFFF.
#ifndef TAVOCORE_UTF8_H_
#define TAVOCORE_UTF8_H_

#include <cstddef>
#include <span>
#include <string_view>

namespace mediidx::platform {

/// Bytes of the valid UTF-8 character that `text` begins with; 0 when there is none.
constexpr std::size_t utf8_length(std::string_view text) {
  const auto byte = [&](std::size_t at) {
    return at < text.size() ? static_cast<unsigned char>(text[at]) : 0U;
  };
  const auto within = [&](std::size_t at, unsigned low, unsigned high) {
    return at < text.size() && byte(at) >= low && byte(at) <= high;
  };
  const auto tail = [&](std::size_t at) { return within(at, 0x80, 0xBF); };
  if (text.empty()) return 0;
  const unsigned lead = byte(0);
  if (lead < 0x80) return 1;
  if (lead >= 0xC2 && lead <= 0xDF) return tail(1) ? 2 : 0;
  if (lead >= 0xE0 && lead <= 0xEF) {
    const unsigned low = lead == 0xE0 ? 0xA0 : 0x80;
    const unsigned high = lead == 0xED ? 0x9F : 0xBF;
    return within(1, low, high) && tail(2) ? 3 : 0;
  }
  if (lead >= 0xF0 && lead <= 0xF4) {
    const unsigned low = lead == 0xF0 ? 0x90 : 0x80;
    const unsigned high = lead == 0xF4 ? 0x8F : 0xBF;
    return within(1, low, high) && tail(2) && tail(3) ? 4 : 0;
  }
  return 0;
}

constexpr bool is_utf8(std::string_view text) {
  while (!text.empty()) {
    const std::size_t length = utf8_length(text);
    if (length == 0) return false;
    text.remove_prefix(length);
  }
  return true;
}

/// The longest beginning of at most `width` bytes that cuts no UTF-8 character in two. Bytes that
/// are no UTF-8 count as characters of their own.
constexpr std::string_view cut_utf8(std::string_view text, std::size_t width) {
  if (text.size() <= width) return text;
  for (std::size_t back = 1; back <= 3 && back <= width; ++back) {
    if (utf8_length(text.substr(width - back)) > back) return text.substr(0, width - back);
  }
  return text.substr(0, width);
}

/// Copies `text` into `field`, cut as above, and terminates it. An empty field is left alone.
inline void copy_cut(std::span<char> field, std::string_view text) {
  if (field.empty()) return;
  const auto kept = cut_utf8(text, field.size() - 1);
  kept.copy(field.data(), kept.size());
  field[kept.size()] = '\0';
}

/// The same for a text that must not be cut; false, and the field left alone, when it does not fit.
inline bool copy_whole(std::span<char> field, std::string_view text) {
  if (text.size() >= field.size()) return false;
  copy_cut(field, text);
  return true;
}

}  // namespace mediidx::platform

#endif
