// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Points in time as SQL timestamps.
#ifndef MEDIIDX_TOOL_TAGS_FILE_TIMES_H_
#define MEDIIDX_TOOL_TAGS_FILE_TIMES_H_

#include <sys/stat.h>

#include <cstdint>
#include <string>
#include <string_view>

namespace mediidx::tool {

/// Seconds since 1970 as "YYYY-MM-DD HH:MM:SS" in UTC; empty outside the years 1 to 9999.
std::string to_timestamp(std::int64_t seconds);

struct FileTimes {
  std::string created;  ///< The modification time where the file system keeps no birth time.
  std::string modified;
};
FileTimes file_times(const struct statx& status);

/// A camera's "2004:05:01 12:00:00" (or with dashes) as a timestamp, its time zone left open; empty
/// when it is none, zeros and impossible dates among them.
std::string camera_time(std::string_view text);

/// The year that begins a date ("2004-05-01", "2004-05", "2004", "20040501"); 0 when there is none.
int year_of(std::string_view date);

/// The number that begins "3/12" or "3"; 0 when there is none or it does not fit.
int leading_number(std::string_view text);

}  // namespace mediidx::tool

#endif
