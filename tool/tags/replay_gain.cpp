// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/replay_gain.h"

#include <charconv>
#include <cmath>

namespace mediidx::tool {
namespace {

constexpr double kLargestGain = 128;  // dB; what the 16 bits of Opus hold
constexpr double kLargestPeak = 1000;
constexpr double kR128Unit = 256;
constexpr double kR128ToReplayGain = 5;  // dB

std::optional<double> leading_decimal(std::string_view text) {
  while (text.starts_with(' ')) text.remove_prefix(1);
  if (text.starts_with('+')) text.remove_prefix(1);
  double value = 0;
  const auto [stop, error] = std::from_chars(text.data(), text.data() + text.size(), value);
  if (error != std::errc{} || !std::isfinite(value)) return std::nullopt;
  return value;
}

}  // namespace

std::optional<double> parse_gain(std::string_view text) {
  const auto value = leading_decimal(text);
  return value && std::abs(*value) <= kLargestGain ? value : std::nullopt;
}

std::optional<double> parse_peak(std::string_view text) {
  const auto value = leading_decimal(text);
  return value && *value >= 0 && *value <= kLargestPeak ? value : std::nullopt;
}

std::optional<double> parse_r128_gain(std::string_view text) {
  const auto value = leading_decimal(text);
  if (!value || std::abs(*value / kR128Unit) > kLargestGain) return std::nullopt;
  return *value / kR128Unit + kR128ToReplayGain;
}

}  // namespace mediidx::tool
