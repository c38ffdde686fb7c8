// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/file_times.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <chrono>
#include <cstdio>
#include <ctime>

namespace mediidx::tool {
namespace {

constexpr int kLastYear = 9999;

std::string format(int year, unsigned month, unsigned day, int hour, int minute, int second) {
  std::array<char, 64> buffer;
  std::snprintf(buffer.data(), buffer.size(), "%04d-%02u-%02u %02d:%02d:%02d", year, month, day,
                hour, minute, second);
  return buffer.data();
}

/// Takes a number of exactly `digits` digits and, where given, one of the separators behind it off
/// the text; -1 when it does not begin so.
int take_number(std::string_view& text, std::size_t digits, std::string_view separators) {
  int value = -1;
  if (text.size() < digits) return -1;
  const auto* end = text.data() + digits;
  const auto [stop, error] = std::from_chars(text.data(), end, value);
  if (error != std::errc{} || stop != end) return -1;
  text.remove_prefix(digits);
  if (separators.empty()) return value;
  if (text.empty() || separators.find(text[0]) == std::string_view::npos) return -1;
  text.remove_prefix(1);
  return value;
}

}  // namespace

std::string to_timestamp(std::int64_t seconds) {
  const std::time_t time = seconds;
  std::tm parts{};
  if (!gmtime_r(&time, &parts)) return {};
  const long year = 1900L + parts.tm_year;
  if (year < 1 || year > kLastYear) return {};
  return format(static_cast<int>(year), static_cast<unsigned>(parts.tm_mon + 1),
                static_cast<unsigned>(parts.tm_mday), parts.tm_hour, parts.tm_min, parts.tm_sec);
}

FileTimes file_times(const struct statx& status) {
  const bool has_birth = (status.stx_mask & STATX_BTIME) != 0 && status.stx_btime.tv_sec != 0;
  return {to_timestamp(has_birth ? status.stx_btime.tv_sec : status.stx_mtime.tv_sec),
          to_timestamp(status.stx_mtime.tv_sec)};
}

std::string camera_time(std::string_view text) {
  const int year = take_number(text, 4, ":-");
  const int month = take_number(text, 2, ":-");
  const int day = take_number(text, 2, " T");
  const int hour = take_number(text, 2, ":");
  const int minute = take_number(text, 2, ":");
  const int second = take_number(text, 2, "");
  if (year < 1 || month < 1 || day < 1 || hour < 0 || minute < 0 || second < 0) return {};
  const std::chrono::year_month_day date{std::chrono::year(year),
                                         std::chrono::month(static_cast<unsigned>(month)),
                                         std::chrono::day(static_cast<unsigned>(day))};
  if (!date.ok() || hour > 23 || minute > 59 || second > 59) return {};
  return format(year, static_cast<unsigned>(month), static_cast<unsigned>(day), hour, minute,
                second);
}

int year_of(std::string_view date) {
  const int year = take_number(date, 4, "");
  const auto digits = std::min(date.find_first_not_of("0123456789"), date.size());
  constexpr std::size_t kMonthAndDay = 4;
  return year > 0 && (digits == 0 || digits == kMonthAndDay) ? year : 0;
}

int leading_number(std::string_view text) {
  while (text.starts_with(' ')) text.remove_prefix(1);
  int value = 0;
  const auto [stop, error] = std::from_chars(text.data(), text.data() + text.size(), value);
  return error == std::errc{} && value > 0 ? value : 0;
}

}  // namespace mediidx::tool
