// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "support/text.h"

#include <algorithm>

namespace mediidx {
namespace {

constexpr std::size_t kLongestCharacter = 4;

constexpr bool is_continuation(char byte) {
  return (static_cast<unsigned char>(byte) & 0xC0U) == 0x80U;
}

/// Bytes of the character that a lead byte announces; 1 for anything that leads none.
constexpr std::size_t announced_length(char byte) {
  const auto lead = static_cast<unsigned char>(byte);
  if (lead >= 0xF0U) return 4;
  if (lead >= 0xE0U) return 3;
  if (lead >= 0xC0U) return 2;
  return 1;
}

}  // namespace

std::string_view cut_at_character(std::string_view text, std::size_t width) {
  if (text.size() <= width) return text;
  std::size_t lead = width;
  while (lead > 0 && width - lead < kLongestCharacter - 1 && is_continuation(text[lead])) --lead;
  const bool splits = lead < width && announced_length(text[lead]) > width - lead;
  return text.substr(0, splits ? lead : width);
}

void copy_text(std::span<char> field, std::string_view text) {
  if (field.empty()) return;
  const auto kept = cut_at_character(text, field.size() - 1);
  *std::copy(kept.begin(), kept.end(), field.begin()) = '\0';
}

}  // namespace mediidx
