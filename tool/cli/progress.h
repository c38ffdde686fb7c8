// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A progress bar.
#ifndef MEDIIDX_TOOL_CLI_PROGRESS_H_
#define MEDIIDX_TOOL_CLI_PROGRESS_H_

#include <chrono>
#include <cstddef>
#include <string>

namespace mediidx::tool {

/// One line of a bar, at most `width` columns wide: "[####    ]  50%  5/10  name".
std::string progress_line(std::size_t done, std::size_t total, const std::string& name, int width);

/// Draws on standard error where that is a terminal, else does nothing. The line goes with the
/// object.
class Progress {
 public:
  explicit Progress(std::size_t total);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  /// Counts one more, at work on this path.
  void step(const std::string& path);

 private:
  bool on_terminal_;
  std::size_t total_;
  std::size_t done_ = 0;
  std::chrono::steady_clock::time_point next_{};
};

}  // namespace mediidx::tool

#endif
