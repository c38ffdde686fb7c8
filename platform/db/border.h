// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The border of the exported functions: no exception passes it.
#ifndef TAVODB_BORDER_H_
#define TAVODB_BORDER_H_

#include <utility>

namespace mediidx::platform {

/// Runs `body` and returns what it returns; an exception (memory that ran out) becomes
/// `on_failure`.
template <class Result, class Body>
Result no_throw(Result on_failure, Body&& body) noexcept {
  try {
    return std::forward<Body>(body)();
  } catch (...) {
    return on_failure;
  }
}

}  // namespace mediidx::platform

#endif
