// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>
#include <unicase.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string_view>

#include "utf8.h"

namespace {

bool is_ascii(std::string_view text) {
  return std::ranges::all_of(text, [](char c) { return static_cast<unsigned char>(c) < 0x80; });
}

unsigned char fold_ascii(char c) {
  return static_cast<unsigned char>(c >= 'A' && c <= 'Z' ? c - 'A' + 'a' : c);
}

int compare_ascii(std::string_view a, std::string_view b) {
  const auto order = std::lexicographical_compare_three_way(
      a.begin(), a.end(), b.begin(), b.end(),
      [](char x, char y) { return fold_ascii(x) <=> fold_ascii(y); });
  return order < 0 ? -1 : order > 0 ? 1 : 0;
}

const std::uint8_t* bytes_of(std::string_view text) {
  return reinterpret_cast<const std::uint8_t*>(text.data());
}

int compare_folded(std::string_view a, std::string_view b) {
  using mediidx::platform::is_utf8;
  int order = 0;
  // libunistring expects valid texts; others are compared as the bytes that they are.
  if (is_utf8(a) && is_utf8(b) &&
      u8_casecmp(bytes_of(a), a.size(), bytes_of(b), b.size(), nullptr, nullptr, &order) == 0) {
    return order;
  }
  return a.compare(b);
}

}  // namespace

extern "C" int TLIBCUnicodeUTF8StrCaseCmp(const char* a, const char* b) {
  if (!a || !b) return a ? 1 : b ? -1 : 0;
  if (std::strcmp(a, b) == 0) return 0;
  return is_ascii(a) && is_ascii(b) ? compare_ascii(a, b) : compare_folded(a, b);
}
