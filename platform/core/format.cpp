// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

#include <cstdarg>
#include <cstdlib>

#include "border.h"

namespace {

using mediidx::platform::failed;

__attribute__((format(printf, 1, 0))) char* format_text(const char* format, va_list values) {
  if (!format) return failed<char*>(nullptr, TAVO_ERR_BAD_PARAMETERS, "format.cpp", 1);
  char* text = nullptr;
  if (vasprintf(&text, format, values) < 0) {
    return failed<char*>(nullptr, TAVO_ERR_OUT_OF_MEMORY, "format.cpp", 2);
  }
  return text;
}

}  // namespace

extern "C" char* TLIBCStrGet(const char* format, ...) {
  va_list values;
  va_start(values, format);
  char* text = format_text(format, values);
  va_end(values);
  return text;
}

extern "C" char* TLIBCStrGetEx(const char* format, ...) {
  va_list values;
  va_start(values, format);
  char* text = format_text(format, values);
  va_end(values);
  return text;
}

extern "C" void TLIBCStrPut(char* text) { std::free(text); }
