// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "api/replay_gain.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>
#include <string>
#include <string_view>
#include <system_error>

namespace mediidx {
namespace {

std::string_view trimmed(std::string_view text) {
  constexpr std::string_view kBlanks = " \t\r\n";
  const auto first = text.find_first_not_of(kBlanks);
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

/// Independent of the process's locale; 0 for a text that is not wholly a decimal number.
double parse_decimal(std::string_view text) {
  text = trimmed(text);
  if (text.starts_with('+') && !text.starts_with("+-")) text.remove_prefix(1);
  double value = 0;
  const char* end = text.data() + text.size();
  const auto read = std::from_chars(text.data(), end, value);
  return read.ec == std::errc() && read.ptr == end ? value : 0;
}

float as_float(const Json::Value& value) {
  double number = 0;
  if (value.isNumeric()) number = value.asDouble();
  if (value.isString()) number = parse_decimal(value.asString());
  if (!std::isfinite(number)) return 0;
  constexpr double kLargest = std::numeric_limits<float>::max();
  return static_cast<float>(std::clamp(number, -kLargest, kLargest));
}

}  // namespace

std::optional<std::array<float, 4>> find_replay_gain(const Json::Value& json) {
  if (!json.isObject() || json["rg_track_gain"].isNull()) return std::nullopt;
  return std::array{as_float(json["rg_track_gain"]), as_float(json["rg_track_peak"]),
                    as_float(json["rg_album_gain"]), as_float(json["rg_album_peak"])};
}

}  // namespace mediidx
