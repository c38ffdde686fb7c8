// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What there is to index below some folders.
#ifndef MEDIIDX_TOOL_SCAN_FILE_WALK_H_
#define MEDIIDX_TOOL_SCAN_FILE_WALK_H_

#include <sys/stat.h>

#include <functional>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "tags/media_file.h"

namespace mediidx::tool {

/// A path that is not indexed, and why.
struct Failure {
  std::string path;
  std::string reason;
};

struct FoundFile {
  std::string path;
  Kind kind;
};

/// What a walk found, in its order.
struct Found {
  std::vector<std::string> folders;
  std::vector<FoundFile> files;
  std::vector<Failure> failures;  ///< Folders that cannot be read and names that cannot be stored.
};

/// True for names that hold no media of the user's: dot files, attribute folders, recycle bins,
/// snapshots, lost+found.
bool is_passed_over(const std::string& name);

/// Walks folders. Of each folder first itself, then its files, then its subfolders, each in the
/// byte order of names. Symbolic links come after everything else and are followed: each real file
/// and folder is found once, under its own name where it has one within the walk. Empty files,
/// dangling links, sockets and the like are passed over in silence.
class FileWalk {
 public:
  /// Asked before each folder; true ends the walk with what was found so far.
  using Stop = std::function<bool()>;

  explicit FileWalk(Stop stop) : stop_(std::move(stop)) {}

  /// Whatever is below this folder is passed over.
  void exclude(const std::string& folder);
  /// Walks an absolute folder.
  void add(const std::string& folder);
  /// Follows the links and gives what was found.
  Found finish();

 private:
  using Identity = std::pair<dev_t, ino_t>;

  void walk(const std::string& folder, const struct stat& status);
  void take_file(const std::string& path, const struct stat& status);
  void follow(const std::string& link);
  bool is_new(const struct stat& status);
  bool is_storable(const std::string& path);

  Stop stop_;
  std::set<Identity> seen_;
  std::vector<std::string> links_;
  Found found_;
};

}  // namespace mediidx::tool

#endif
