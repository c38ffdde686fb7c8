// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Compiled by tests only, once per case: all but the first must be refused.
#include "support/statement.h"

namespace mediidx {

constexpr Template<const char*, int> kGood = "'@TAVO:VAR' @TAVO:INT";
#if MISFILLED_CASE == 1
constexpr Template<const char*> kBad = "'@TAVO:VAR' @TAVO:INT";
#elif MISFILLED_CASE == 2
constexpr Template<const char*, int, int> kBad = "'@TAVO:VAR' @TAVO:INT";
#elif MISFILLED_CASE == 3
constexpr Template<int, const char*> kBad = "'@TAVO:VAR' @TAVO:INT";
#elif MISFILLED_CASE == 4
constexpr Template<const char*, std::int64_t> kBad = "'@TAVO:VAR' @TAVO:INT";
#elif MISFILLED_CASE == 5
constexpr Template<const char*, unsigned> kBad = "'@TAVO:VAR' @TAVO:INT";
#endif

OwnedText filled(const char* text) {
#if MISFILLED_CASE == 6
  return fill(1, kGood, text);
#elif MISFILLED_CASE == 7
  return fill(1, kGood, text, std::int64_t{1});
#elif MISFILLED_CASE == 8
  return fill(1, text, text, 1);
#else
  return fill(1, kGood, text, 1);
#endif
}

}  // namespace mediidx
