// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

#include <cstring>
#include <string_view>

#include "utf8.h"

namespace {

// ASCII only, whatever the locale: bytes of UTF-8 characters are never white space.
char* trim(char* text, std::string_view blanks) {
  if (!text) return text;
  const std::string_view whole(text);
  const auto first = whole.find_first_not_of(blanks);
  if (first == std::string_view::npos) {
    *text = '\0';
    return text;
  }
  const auto length = whole.find_last_not_of(blanks) - first + 1;
  std::memmove(text, text + first, length);
  text[length] = '\0';
  return text;
}

}  // namespace

extern "C" char* StringTrim(char* text) { return trim(text, " \t\n\v\f\r"); }

extern "C" char* TLIBCStrTrimSpace(char* text) { return trim(text, " \t"); }

extern "C" int IsUnicodeString(const char* text) {
  return text && mediidx::platform::is_utf8(text) ? 1 : 0;
}
