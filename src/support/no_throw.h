// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The border of the exported C functions: nothing escapes it.
#ifndef MEDIIDX_SUPPORT_NO_THROW_H_
#define MEDIIDX_SUPPORT_NO_THROW_H_

#include <exception>
#include <utility>

#include "support/log.h"

namespace mediidx {

/// Runs `body` and returns what it returns; an exception is logged once as `log`'s and becomes
/// `on_failure`.
template <class Result, class Body>
Result no_throw(const Log& log, Result on_failure, Body&& body) noexcept {
  constexpr int kUnexpected = 1;
  try {
    return std::forward<Body>(body)();
  } catch (const std::exception& error) {
    log.colon(kUnexpected, "Unexpected failure: %s", error.what());
  } catch (...) {
    log.colon(kUnexpected, "Unexpected failure");
  }
  return on_failure;
}

}  // namespace mediidx

#endif
