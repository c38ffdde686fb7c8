// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

namespace {

struct PlatformError {
  int code = 0;
  const char* file = "";
  int line = 0;
};

PlatformError last_error;

}  // namespace

extern "C" int TLIBCErrGet(void) { return last_error.code; }

extern "C" const char* TLIBCErrorGetFile(void) { return last_error.file; }

extern "C" int TLIBCErrorGetLine(void) { return last_error.line; }

extern "C" void TLIBCErrSetEx(int code, const char* file, int line) {
  last_error = {code, file ? file : "", line};
}
