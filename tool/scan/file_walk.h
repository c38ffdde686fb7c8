// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What there is to index below some folders.
#ifndef MEDIIDX_TOOL_SCAN_FILE_WALK_H_
#define MEDIIDX_TOOL_SCAN_FILE_WALK_H_

#include <sys/stat.h>

#include <cstdint>
#include <functional>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "scan/ignore_rules.h"
#include "tags/media_file.h"

namespace mediidx::tool {

/// A path that is not indexed, and why.
struct Failure {
  std::string path;
  std::string reason;
  bool is_by_name = false;  ///< Left out for its name or place, not for what happened.
};

/// What tells a file from another one of its name.
struct FileStatus {
  std::int64_t size = 0;
  std::int64_t modified = 0;  ///< Nanoseconds since 1970.
  std::int64_t device = 0;
  std::int64_t inode = 0;

  explicit FileStatus(const struct stat& status);
  FileStatus() = default;
};

struct FoundFile {
  std::string name;
  Kind kind;
  FileStatus status;
};

/// One folder: what is to be indexed in it, each list in the byte order of names.
struct FoundFolder {
  std::string path;
  FileStatus status;
  bool is_mounted = false;  ///< A file system is mounted here.
  bool is_readable = true;  ///< Otherwise nothing is known of what it holds.
  std::vector<FoundFile> files;
  std::vector<std::string> subfolders;  ///< Names; walked next, links among them.
  std::vector<std::string> unreadable;  ///< Names that could not be looked at.
};

/// True for names that hold no media of the user's: dot files, attribute folders, recycle bins,
/// snapshots, lost+found.
bool is_passed_over(const std::string& name);

/// True for a folder in which there is nothing but names that are passed over; false when it cannot
/// be read, with errno set.
bool is_empty_folder(const std::string& folder);

/// True when the ignore files from the root on leave a path below it out.
bool is_ignored(const std::string& root, const std::string& path, bool is_folder);

/// A path, or nothing: through links, as realpath gives it.
std::string real_path(const std::string& path);

/// Walks folders. Each folder comes before its subfolders, those in the byte order of names.
/// Symbolic links are followed, but not into the known roots, where what they lead to has a name of
/// its own; each real file is found once. Passed over in silence: empty files, dangling links,
/// sockets and the like, and what `.mediidxignore` files leave out.
class FileWalk {
 public:
  /// Told of each folder; false ends the walk.
  using Visit = std::function<bool(FoundFolder& folder)>;
  /// Told of paths that cannot be read or stored.
  using Skip = std::function<void(const Failure& failure)>;

  /// Told of each folder before it is listed.
  using Before = std::function<void(const std::string& folder)>;
  /// Asked whether to walk a subfolder.
  using Descend = std::function<bool(const std::string& folder)>;

  /// `roots` are real paths of folders that are walked now or at other times.
  FileWalk(std::vector<std::string> roots, Visit visit, Skip skip);

  /// Whatever is below this folder is passed over.
  void exclude(const std::string& folder);
  void before_each(Before before) { before_ = std::move(before); }
  void descend_where(Descend descend) { descend_ = std::move(descend); }
  /// Walks a folder that is one of the roots or lies in one; false when the walk was ended.
  bool walk(const std::string& root, const std::string& folder);
  /// True when what stands between root and folder leaves the folder out.
  bool is_left_out(const std::string& root, const std::string& folder);

 private:
  using Identity = std::pair<dev_t, ino_t>;
  struct Listing;

  bool enter(const std::string& folder, const struct stat& status, bool through_link);
  void list(FoundFolder& folder, const Listing& names, const struct stat& status);
  void take_file(FoundFolder& folder, const std::string& name, const struct stat& status,
                 bool through_link);
  void take_subfolder(FoundFolder& folder, const std::string& name, const struct stat& own,
                      const struct stat& status, bool through_link);
  void follow(FoundFolder& folder, const std::string& name, const struct stat& own);
  void read_rules(const std::string& folder);
  bool is_storable(const std::string& path);
  bool lies_in_root(const std::string& real) const;

  std::vector<std::string> roots_;
  Visit visit_;
  Skip skip_;
  Before before_ = [](const std::string&) {};
  Descend descend_ = [](const std::string&) { return true; };
  std::set<Identity> excluded_;
  std::set<Identity> folders_;   ///< Entered on the way here or through a link.
  std::set<Identity> linked_;    ///< Files with several names or found through links.
  bool in_linked_ = false;       ///< The folder in hand was reached through a link.
  std::set<std::string> links_;  ///< Subfolders of the folder in hand that are links.
  IgnoreRules rules_;
};

}  // namespace mediidx::tool

#endif
