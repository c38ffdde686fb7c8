// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Reading many cue sheets without asking the database for one audio file at a time, over a
/// connection of its own each.
#ifndef MEDIIDX_PLAYLIST_CUE_DURATIONS_H_
#define MEDIIDX_PLAYLIST_CUE_DURATIONS_H_

#include <map>
#include <optional>
#include <set>
#include <span>
#include <string>
#include <vector>

#include "mediidx/record.h"

namespace mediidx {

/// The lengths of audio files by path, in seconds as the database writes them.
using KnownDurations = std::map<std::string, std::string>;

/// While it lives, the parser asks it for lengths instead of the database. One at a time.
class CueDurations {
 public:
  explicit CueDurations(const KnownDurations& known);
  ~CueDurations();
  CueDurations(const CueDurations&) = delete;
  CueDurations& operator=(const CueDurations&) = delete;

  /// The one that lives, or null.
  static CueDurations* current();
  /// Empty for a file that is not known; the question is kept.
  std::optional<std::string> find(const std::string& audio_path);
  /// Keeps a line of a sheet, as the parser gets it.
  void keep_line(const char* line) { lines_.emplace_back(line); }

  const std::set<std::string>& asked() const { return asked_; }
  std::vector<std::string> take_lines() { return std::move(lines_); }

 private:
  const KnownDurations& known_;
  std::set<std::string> asked_;
  std::vector<std::string> lines_;
};

/// Parses the kept lines of a sheet once more, with lengths that were not known then. The list, or
/// null, as TAVOParseCueByPath gives it; false when there was no memory for it.
bool parse_again(std::span<const std::string> lines, const char* cue_path,
                 const KnownDurations& known, _PLAYLIST_REC** out);

}  // namespace mediidx

#endif
