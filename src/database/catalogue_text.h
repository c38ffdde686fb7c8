// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// How flags and decimal numbers stand in the catalogue's text columns.
#ifndef MEDIIDX_DATABASE_CATALOGUE_TEXT_H_
#define MEDIIDX_DATABASE_CATALOGUE_TEXT_H_

#include <array>
#include <cstdio>

namespace mediidx::catalogue {

constexpr const char* text_flag(bool flag) { return flag ? "TRUE" : "FALSE"; }

/// The longest float takes 48 bytes.
using DecimalText = std::array<char, 64>;

inline DecimalText decimal_text(float number) {
  DecimalText text;
  std::snprintf(text.data(), text.size(), "%f", static_cast<double>(number));
  return text;
}

}  // namespace mediidx::catalogue

#endif
