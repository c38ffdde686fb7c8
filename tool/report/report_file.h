// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The file that a report is written to.
#ifndef MEDIIDX_TOOL_REPORT_REPORT_FILE_H_
#define MEDIIDX_TOOL_REPORT_REPORT_FILE_H_

#include <filesystem>
#include <string>
#include <string_view>

namespace mediidx::tool {

/// A new file, or an earlier report's: no other is ever replaced. Where the path is a link, the
/// file that it leads to is meant.
class ReportFile {
 public:
  /// Throws std::runtime_error, which names the file, when it is there and is no report.
  explicit ReportFile(const std::string& named);

  /// Puts the page in place at once: a reader sees the earlier report or this one, never a part.
  /// Throws likewise; then nothing has changed.
  void write(std::string_view page) const;

 private:
  std::string named_;
  std::filesystem::path target_;
};

}  // namespace mediidx::tool

#endif
