// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The border of the C functions: nothing escapes it.
#ifndef TAVODB_BORDER_H_
#define TAVODB_BORDER_H_

#include <utility>

namespace tavodb {

template <class Result, class Body>
Result guarded(Result on_failure, Body &&body) noexcept {
  try {
    return std::forward<Body>(body)();
  } catch (...) { // without memory there is nothing more to say
    return on_failure;
  }
}

} // namespace tavodb

#endif
