// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// How far long work has come.
#ifndef MEDIIDX_TOOL_CLI_PROGRESS_H_
#define MEDIIDX_TOOL_CLI_PROGRESS_H_

#include <chrono>
#include <cstddef>
#include <optional>
#include <string>

namespace mediidx::tool {

/// So far, at one moment.
struct ProgressState {
  std::size_t done = 0;
  std::size_t total = 0;  ///< 0: not known yet.
  double seconds = 0;     ///< Since the first.

  /// Per second; empty while it cannot be told.
  std::optional<double> rate() const;
  /// Seconds; likewise.
  std::optional<double> remaining() const;
};

/// One line of a bar, at most `width` columns wide:
/// "[####    ]  50%  5/10  820/s  0:05 left  name", or "? left" when that is unknown.
std::string progress_line(const ProgressState& state, const std::string& name, int width);
/// Where there is no terminal: "5 of 10 files, 820/s, 0:05 left".
std::string progress_words(const ProgressState& state);
/// The same for a program, as one line of JSON.
std::string progress_json(const ProgressState& state, const std::string& path);

/// Tells on standard error: a bar on a terminal, elsewhere a line now and then, or lines of JSON.
/// The bar goes with the object.
class Progress {
 public:
  enum class Style { kForPeople, kJson };

  explicit Progress(Style style);
  /// So much is to be done, and told to people.
  explicit Progress(std::size_t total);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  /// What was found while it is not known what has to be done.
  void look(std::size_t files, std::size_t folders);
  /// So much is to be done, from now on.
  void start(std::size_t total);
  /// Counts one more, at work on this path.
  void step(const std::string& path);
  /// Tells now, whatever there is to be told.
  void answer();
  /// Makes room for a message.
  void clear();

 private:
  using Clock = std::chrono::steady_clock;

  bool is_due();
  void tell(const std::string& path);

  bool as_json_;
  bool on_terminal_;
  ProgressState state_;
  Clock::time_point begin_ = Clock::now();
  Clock::time_point next_;
};

}  // namespace mediidx::tool

#endif
