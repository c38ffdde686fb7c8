// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Values of a JSON object as the fields of a record take them.
#ifndef TAVOINDEX_JSON_FIELD_H_
#define TAVOINDEX_JSON_FIELD_H_

#include <json/value.h>

#include <cstdint>
#include <limits>
#include <string_view>

namespace mediidx::platform {

/// A text up to its first null byte; empty for anything but a text. Lives as long as the value.
std::string_view text_of(const Json::Value& value);

/// A whole number within a range: numbers and decimal texts are truncated toward zero and held
/// within it, booleans are 0 or 1, anything else is 0.
std::int64_t integer_of(const Json::Value& value, std::int64_t lowest, std::int64_t highest);

/// The same for the type that takes it.
template <class Integer>
Integer integer_of(const Json::Value& value) {
  using Limits = std::numeric_limits<Integer>;
  return static_cast<Integer>(integer_of(value, Limits::min(), Limits::max()));
}

/// A finite number, found in the same way.
float float_of(const Json::Value& value);

}  // namespace mediidx::platform

#endif
