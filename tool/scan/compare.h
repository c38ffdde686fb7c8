// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What has to be done for one folder: what is there against what was there.
#ifndef MEDIIDX_TOOL_SCAN_COMPARE_H_
#define MEDIIDX_TOOL_SCAN_COMPARE_H_

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "scan/scan_state.h"

namespace mediidx::tool {

/// What a look at a single path finds.
enum class Presence {
  kGone,  ///< "No such file": it is really not there.
  kFolder,
  kOther,
  kUnknown,  ///< It cannot be told.
};
Presence look_at(const std::string& path);

/// How far the modification times of a file system may be off, in nanoseconds: FAT keeps two
/// seconds, others what they are told.
std::int64_t time_tolerance(const std::string& folder);

struct Comparison {
  std::vector<Change> changes;
  std::size_t left_alone = 0;    ///< Files that failed, and have not changed.
  std::size_t switched_off = 0;  ///< Files that the configuration leaves out.
};

struct CompareOptions {
  bool full = false;           ///< No file counts as unchanged.
  std::int64_t tolerance = 0;  ///< See time_tolerance.
  std::function<Presence(const std::string& path)> look = look_at;
};

/// Appends what there is to do for a folder that could be read.
void compare(const ListedFolder& listed, const KnownFolder& known, const CompareOptions& options,
             Comparison& out);

}  // namespace mediidx::tool

#endif
