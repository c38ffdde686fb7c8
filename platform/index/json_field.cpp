// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "json_field.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <optional>

namespace mediidx::platform {

namespace {

std::string_view trimmed(std::string_view text) {
  constexpr std::string_view kWhiteSpace = " \t\r\n\v\f";
  const auto first = text.find_first_not_of(kWhiteSpace);
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(kWhiteSpace) - first + 1);
}

std::string_view without_plus(std::string_view number) {
  const bool plus = number.size() > 1 && number[0] == '+' && number[1] != '-';
  return plus ? number.substr(1) : number;
}

std::optional<std::int64_t> parse_integer(std::string_view number) {
  std::int64_t value = 0;
  const auto read = std::from_chars(number.data(), number.data() + number.size(), value);
  const bool whole = read.ec == std::errc() && read.ptr == number.data() + number.size();
  return whole ? std::optional(value) : std::nullopt;
}

/// 0 when the text is no number; infinite when it is too large for one.
double parse_double(std::string_view number) {
  double value = 0;
  const char* end = number.data() + number.size();
  const auto read = std::from_chars(number.data(), end, value, std::chars_format::general);
  if (read.ptr != end) return 0;
  if (read.ec == std::errc()) return std::isfinite(value) ? value : 0;
  if (read.ec != std::errc::result_out_of_range) return 0;
  const bool tiny = number.find("e-") != number.npos || number.find("E-") != number.npos ||
                    number.starts_with("0.") || number.starts_with("-0.");
  if (tiny) return 0;
  return number.starts_with('-') ? -HUGE_VAL : HUGE_VAL;
}

std::int64_t held(double value, std::int64_t lowest, std::int64_t highest) {
  if (std::isnan(value)) return 0;
  // As doubles the bounds may round up to a number that no integer takes: compare first.
  if (value >= static_cast<double>(highest)) return highest;
  if (value <= static_cast<double>(lowest)) return lowest;
  return std::clamp(static_cast<std::int64_t>(value), lowest, highest);
}

double finite_or_zero(double value) { return std::isfinite(value) ? value : 0; }

/// The value as a double; 0 when it is no number.
double number_of(const Json::Value& value) {
  switch (value.type()) {
    case Json::intValue:
      return static_cast<double>(value.asInt64());
    case Json::uintValue:
      return static_cast<double>(value.asUInt64());
    case Json::realValue:
      return finite_or_zero(value.asDouble());
    case Json::booleanValue:
      return value.asBool() ? 1 : 0;
    case Json::stringValue:
      return parse_double(without_plus(trimmed(text_of(value))));
    default:
      return 0;
  }
}

/// The value where it is a whole number that 64 bits take exactly.
std::optional<std::int64_t> exact_integer(const Json::Value& value) {
  if (value.type() == Json::intValue || value.type() == Json::uintValue) {
    return value.isInt64() ? std::optional<std::int64_t>(value.asInt64()) : std::nullopt;
  }
  if (value.isString()) return parse_integer(without_plus(trimmed(text_of(value))));
  return std::nullopt;
}

}  // namespace

std::string_view text_of(const Json::Value& value) {
  const char* begin = nullptr;
  const char* end = nullptr;
  if (!value.isString() || !value.getString(&begin, &end)) return {};
  const std::string_view text(begin, static_cast<std::size_t>(end - begin));
  return text.substr(0, text.find('\0'));
}

std::int64_t integer_of(const Json::Value& value, std::int64_t lowest, std::int64_t highest) {
  if (const auto exact = exact_integer(value)) return std::clamp(*exact, lowest, highest);
  return held(number_of(value), lowest, highest);
}

float float_of(const Json::Value& value) {
  constexpr double kLargest = std::numeric_limits<float>::max();
  return static_cast<float>(std::clamp(number_of(value), -kLargest, kLargest));
}

}  // namespace mediidx::platform
