// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/cue_position.h"

#include <array>
#include <charconv>
#include <limits>

namespace mediidx {
namespace {

constexpr bool is_white_space(char c) { return c == ' ' || (c >= '\t' && c <= '\r'); }

std::uint32_t number(std::string_view text) {
  return static_cast<std::uint32_t>(leading_number(text));
}

}  // namespace

std::int64_t leading_number(std::string_view text) {
  using Range = std::numeric_limits<std::int64_t>;
  while (!text.empty() && is_white_space(text.front())) text.remove_prefix(1);
  if (text.starts_with('+') && !text.starts_with("+-")) text.remove_prefix(1);
  std::int64_t value = 0;
  const auto read = std::from_chars(text.data(), text.data() + text.size(), value);
  if (read.ec != std::errc::result_out_of_range) return value;
  return text.starts_with('-') ? Range::min() : Range::max();
}

std::int32_t frames_from_position(std::string_view position) {
  const auto first = position.find(':');
  const auto last = position.rfind(':');
  const bool has_colon = first != position.npos;
  const auto minutes = position.substr(0, first);
  const auto frames = has_colon ? position.substr(last + 1) : position;
  const auto seconds = first == last ? frames : position.substr(first + 1, last - first - 1);
  return static_cast<std::int32_t>(number(minutes) * kFramesPerMinute +
                                   number(seconds) * kFramesPerSecond + number(frames));
}

std::string position_from_frames(std::int32_t frames) {
  const std::int32_t rest = frames % kFramesPerMinute;
  const std::array parts{frames / kFramesPerMinute, rest / kFramesPerSecond,
                         rest % kFramesPerSecond};
  std::string position;
  for (const auto part : parts) {
    const auto digits = std::to_string(part);
    if (!position.empty()) position += ':';
    if (digits.size() < 2) position += '0';
    position += digits;
  }
  return position;
}

std::int32_t add_frames(std::int32_t a, std::int32_t b) {
  return static_cast<std::int32_t>(static_cast<std::uint32_t>(a) + static_cast<std::uint32_t>(b));
}

std::int32_t subtract_frames(std::int32_t a, std::int32_t b) {
  return static_cast<std::int32_t>(static_cast<std::uint32_t>(a) - static_cast<std::uint32_t>(b));
}

}  // namespace mediidx
