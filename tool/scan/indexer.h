// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Hands what a walk found to the library.
#ifndef MEDIIDX_TOOL_SCAN_INDEXER_H_
#define MEDIIDX_TOOL_SCAN_INDEXER_H_

#include <array>
#include <cstddef>
#include <functional>
#include <string>
#include <vector>

#include "scan/file_walk.h"
#include "store/database.h"

namespace mediidx::tool {

/// What became of the files.
struct IndexReport {
  std::array<std::size_t, kKinds> files{};  ///< Saved, by kind.
  std::size_t folders = 0;                  ///< Saved.
  std::size_t switched_off = 0;             ///< Files that the configuration leaves out.
  std::vector<Failure> failures;            ///< Those of the walk first.
  bool stopped = false;                     ///< `go_on` said no before the end.
};

class Indexer {
 public:
  /// Told of each path before it is read; false stops before that path.
  using GoOn = std::function<bool(const std::string& path)>;

  Indexer(Database& database, GoOn go_on) : database_(database), go_on_(std::move(go_on)) {}

  /// Saves the folders, then the media, then playlists, then cue sheets: each after what it names.
  /// A file that cannot be read or saved is a failure, and the others go on. Throws
  /// std::runtime_error when the database no longer answers.
  IndexReport run(const Found& found);

 private:
  void add_folder(const std::string& path);
  void add_file(const FoundFile& file);
  void save(const MediaFile& file);
  /// The reason is the database's, behind `about`, or else `fallback`.
  void take_failure(const std::string& path, const std::string& fallback,
                    const std::string& about = {});
  bool asks_to_stop(const std::string& path);

  Database& database_;
  GoOn go_on_;
  IndexReport report_;
};

}  // namespace mediidx::tool

#endif
