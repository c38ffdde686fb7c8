// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the command keeps between scans: the tables of the database's schema "scan".
#ifndef MEDIIDX_TOOL_SCAN_SCAN_STATE_H_
#define MEDIIDX_TOOL_SCAN_SCAN_STATE_H_

#include <array>
#include <cstdint>
#include <map>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "scan/coverage.h"
#include "scan/file_walk.h"
#include "store/database.h"
#include "store/pid_file.h"

namespace mediidx::tool {

/// A folder of a walk, and what the library wants of it.
struct ListedFolder {
  FoundFolder found;
  Coverage coverage;
};

/// A root as it was last seen.
struct KnownRoot {
  int id = 0;
  std::string volume;  ///< Empty before the first scan.
  bool away = false;
};

struct KnownFile {
  std::string name;
  Kind kind = Kind::kMusic;
  std::int64_t size = 0;  ///< Below 0: to be read again, see the schema.
  std::int64_t modified = 0;
  bool has_failed = false;
};

struct KnownFolder {
  int id = 0;
  bool mounted = false;
  bool away = false;
  std::optional<std::int64_t> modified;  ///< Empty while it is not in the index.
  std::vector<KnownFile> files;
  std::vector<std::string> subfolders;  ///< Paths.
};

/// What is to be done with a path. The numbers stand in the database, but for one scan only.
enum class What {
  kNew = 0,
  kChanged = 1,
  kAgain = 2,       ///< Unchanged, but what it draws on has changed.
  kMoved = 3,       ///< New under this name; `source` is its old one.
  kGone = 4,        ///< No longer on the disk.
  kLeftOut = 5,     ///< There, but no longer to be indexed.
  kGoneWith = 6,    ///< A file below a folder of the next two.
  kGoneFolder = 7,  ///< With everything below.
  kLeftOutFolder = 8,
  kMovedAway = 9,  ///< The old name of one that moved.
};

/// In the order in which they are taken.
enum class Step { kRemovals = 0, kFolders = 1, kMedia = 2, kPlaylists = 3, kCueSheets = 4 };

struct Change {
  std::int64_t id = 0;
  What what = What::kNew;
  int root = 0;
  int folder = 0;  ///< The folder that it lies in, or for a folder itself; 0: not known.
  std::string path;
  bool is_folder = false;
  Kind kind = Kind::kMusic;  ///< Of files.
  std::int64_t known = -1;   ///< The size before; below 0 as in the schema.
  FileStatus status;
  std::string source;
};

/// A file as it is now in the index, or why it is not.
struct FileState {
  int folder;
  std::string name;
  Kind kind;
  FileStatus status;
  std::string failure;
};

/// A folder as it is now in the index.
struct FolderState {
  int id;
  std::int64_t modified;
};

/// The scan cannot go on with this connection: what it had planned is lost, or may be.
struct DatabaseLost : NoDatabase {
  using NoDatabase::NoDatabase;
};

/// Every call throws std::runtime_error with the server's message.
class ScanState {
 public:
  explicit ScanState(Database& database) : database_(database) {}

  /// Takes the right to scan this database, which another machine may have, and forgets what an
  /// earlier scan had planned. Throws AlreadyRunning, or waits.
  void begin(bool wait);
  /// Gives it up.
  void end();
  /// False when the connection was lost since then, also when there is another one by now.
  bool is_same_connection();

  KnownRoot root(const std::string& path);
  void set_root(int id, const std::string& volume, bool away);
  /// Files in the index below a folder.
  std::int64_t count_files(const std::string& folder);
  /// What is in the index at and below a folder; of files, by kind.
  struct Holding {
    std::array<std::int64_t, kKinds> files{};
    std::int64_t folders = 0;
    std::int64_t left_alone = 0;  ///< Files that are not, because they failed.
  };
  Holding holding(const std::string& folder);
  /// Whether the index holds a file or a folder below a folder.
  bool holds_anything(const std::string& folder);

  /// Marks what the index no longer holds, and takes up what it holds without being known here.
  void reconcile(const std::string& folder);

  /// What is known of these folders, by path; the others get an id.
  std::map<std::string, KnownFolder> look_up(std::span<const ListedFolder> folders);
  void set_folder(int id, bool mounted, bool away, std::optional<std::int64_t> modified);

  /* The plan */

  void add(std::span<const Change> changes);
  /// The files below folders that are gone or left out.
  void add_files_of_lost_folders();
  /// Pairs files that went with files that came.
  void find_moves();
  struct Removal {
    std::int64_t removed = 0;
    std::int64_t known = 0;
  };
  /// Files in the index that the plan would remove from a root.
  Removal removal_of(int root, const std::string& path);
  void withdraw_removals(int root);
  void withdraw(int root);
  /// Adds the unchanged cue sheets whose audio changes, and notes what deletes may leave behind.
  void find_consequences();
  std::int64_t count_changes();
  /// The next changes of a step behind the one with this id.
  std::vector<Change> next(Step step, std::int64_t after, int limit);
  std::vector<Change> moves(std::int64_t after, int limit);

  /* What was done */

  void save(std::span<const FileState> files);
  void save_folders(std::span<const FolderState> folders);
  void forget_file(int folder, const std::string& name);
  void forget_path(const std::string& path);
  void forget_folder(const std::string& path);
  /// Whatever happens to the file in hand, it will be read again.
  void mark_unsure(int folder, const std::string& name);
  /// Notes how many tracks the sheets that were saved have by now, to miss them when they are gone.
  void count_tracks();

  /* Settling */

  /// Notes what a delete of all at and below a folder may leave behind; before it is done.
  void unsettle_below(const std::string& folder);
  bool has_unsettled();
  /// Albums that deletes may have left in another state than a fresh scan.
  std::vector<std::string> unsettled_albums();
  /// Plans to save again: audio files that are marked for virtual tracks that are gone.
  void plan_unmarked_audio();
  /// Plans to save again all files of these albums, each of which is then not known to be in the
  /// index.
  void plan_albums(std::span<const std::string> albums);
  void settled();

 private:
  void add_unknown(std::span<const ListedFolder> folders, std::map<std::string, KnownFolder>& out);
  bool agrees(const std::string& folder);
  void mark_poorer_sheets(const std::string& folder);
  void mark_lost(const std::string& folder);
  void take_up(const std::string& folder);
  void take_right(bool wait);
  std::vector<Change> changes(const std::string& condition, int limit);

  Database& database_;
  std::string token_;
};

}  // namespace mediidx::tool

#endif
