// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The border of the exported functions: no exception passes it.
#ifndef TAVOCORE_BORDER_H_
#define TAVOCORE_BORDER_H_

#include <tavocore.h>

#include <utility>

namespace mediidx::platform {

/// Runs `body` and returns what it returns; an exception (memory that ran out) sets the platform
/// error and becomes `on_failure`.
template <class Result, class Body>
Result no_throw(Result on_failure, const char* file, int line, Body&& body) noexcept {
  try {
    return std::forward<Body>(body)();
  } catch (...) {
    TLIBCErrSetEx(TAVO_ERR_OUT_OF_MEMORY, file, line);
  }
  return on_failure;
}

/// Sets the platform error and returns `result`, for `return failed(-1, ...)`.
template <class Result>
Result failed(Result result, int code, const char* file, int line) noexcept {
  TLIBCErrSetEx(code, file, line);
  return result;
}

}  // namespace mediidx::platform

#endif
