// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A scan as the verbs and programs run it: messages, progress and exit status.
#ifndef MEDIIDX_TOOL_CLI_SCAN_RUN_H_
#define MEDIIDX_TOOL_CLI_SCAN_RUN_H_

#include <string>
#include <vector>

#include "scan/scanner.h"

namespace mediidx::tool {

struct ScanSetting {
  ScanOptions options;
  bool full_speed = false;
  bool json_progress = false;
};

/// Scans folders, all index folders when none is named. The caller is the only one that scans.
ScanReport run_scanner(const DataFolder& data, Database& database,
                       const std::vector<std::string>& folders, const ScanSetting& setting);

/// How a report is told.
struct ReportStyle {
  bool json = false;
  bool timings = false;  ///< Where the time went, too.
};

/// "added 1, changed 2, … seconds 0.4", behind a table of the timings, or one JSON object.
std::string report_text(const ScanReport& report, double seconds, ReportStyle style);

int exit_status(const ScanReport& report);

/// Seconds since the object was made.
class Stopwatch {
 public:
  double seconds() const {
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - begin_).count();
  }

 private:
  std::chrono::steady_clock::time_point begin_ = std::chrono::steady_clock::now();
};

}  // namespace mediidx::tool

#endif
