// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Brings the index up to date with what is on the disks.
///
/// A scan first looks: it walks the folders, compares each with what is known of it, and notes what
/// has to be done in the database. Then it does that: removals, folders, media, playlists, cue
/// sheets. Files go in batches, each with what is known of them in one transaction, so that a kill
/// at any point loses both or neither. At the end it settles what removals have left to history.
#ifndef MEDIIDX_TOOL_SCAN_SCANNER_H_
#define MEDIIDX_TOOL_SCAN_SCANNER_H_

#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>
#include <set>
#include <span>
#include <string>
#include <vector>

#include "scan/compare.h"
#include "scan/file_walk.h"
#include "scan/scan_state.h"
#include "scan/timings.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "workers/tag_workers.h"

namespace mediidx::tool {

struct ScanOptions {
  bool full = false;               ///< Read every file's tags again.
  bool dry_run = false;            ///< Only count.
  bool allow_mass_delete = false;  ///< Remove however much is gone.
  bool accept_volumes = false;     ///< Take what is mounted now as right.
  bool trust_index = false;        ///< Nobody else has changed the index since the last scan.
  bool wait = false;               ///< For another scan of the same database.
  bool pass_over_open = false;     ///< Leave files for later that somebody is writing now.
  FileWalk::Before before;         ///< Told of each folder before it is listed; may be empty.
  FileWalk::Descend descend;       ///< Asked whether to walk a subfolder; may be empty.
};

/// What a scan did. Files are counted, not folders, but where it says so.
struct ScanReport {
  std::array<std::size_t, kKinds> saved{};  ///< By kind.
  std::size_t folders = 0;                  ///< Folders saved.
  std::size_t added = 0;
  std::size_t changed = 0;
  std::size_t moved = 0;
  std::size_t removed = 0;
  std::size_t offline = 0;
  std::size_t skipped = 0;       ///< Left out by name, configuration or an earlier failure.
  std::size_t switched_off = 0;  ///< Those of them that the configuration leaves out.
  std::size_t failed = 0;
  std::size_t unstorable = 0;  ///< Paths that were told of because of their names or places.
  bool is_away = false;        ///< A volume was not there.
  std::vector<std::string> away_roots;  ///< Those that were not.
  bool is_refused = false;              ///< A mass removal was.
  bool is_stopped = false;
  Timings::Seconds timings{};
};

/// The outside world's side of a scan.
struct ScanHooks {
  std::function<bool()> must_stop;
  std::function<bool()> reload;  ///< Called between files: true when the configuration changed.
  std::function<void(const Failure&)> fail;     ///< A path that is not indexed.
  std::function<void(const std::string&)> say;  ///< What happens to more than a file.
  std::function<void(std::size_t files, std::size_t folders)> look;  ///< Found so far.
  std::function<void(std::size_t total)> start;                      ///< So much is to be done.
  std::function<void(const std::string& path)> step;                 ///< One less.
};

class Scanner {
 public:
  Scanner(Database& database, const DataFolder& data, TagWorkers& workers, ScanOptions options,
          ScanHooks hooks);

  /// Scans folders, absolute and real: index folders or what lies in them. A database that goes
  /// away is waited for; throws DatabaseLost when it does not come back, std::runtime_error when it
  /// refuses the scan's own statements.
  ScanReport run(const std::vector<std::string>& folders);

 private:
  struct Root {
    std::string path;
    KnownRoot known;
    bool has_rows = false;
    bool is_away = false;
  };
  struct Start {
    std::string root;
    std::string folder;
  };

  void run_once(const std::vector<std::string>& folders);
  void wait_for_database();
  bool stops();
  void check_configuration();

  // Looking.
  std::vector<Start> starts_for(const std::vector<std::string>& folders);
  void plan(const std::vector<Start>& starts);
  void look_at_root(Root& root);
  bool is_away(const Root& root);
  void give_up(Root& root);
  void plan_start(Root& root, const Start& start);
  void plan_missing(const Root& root, const std::string& folder);
  void take_offline(const std::string& folder);
  void bring_online(const std::string& folder);
  bool has_offline_rows(const std::string& folder);
  void plan_folders(const Root& root, std::vector<ListedFolder>& folders);
  bool is_unmounted(const ListedFolder& listed, const KnownFolder& known);
  void check_removals(const Root& root);
  void count_plan();

  // Doing.
  /// A file that was read, or could not be.
  struct Ready {
    Change change;
    TagAnswer answer;
  };
  void apply();
  using Take = std::function<bool(std::span<const Change>)>;
  /// Calls `take` for the changes of a step, many in a transaction; where it fails, for each on its
  /// own.
  void apply_step(Step step, const Take& take, const std::function<void(const Change&)>& count);
  void roll_back();
  void check_connection();
  void move_attributes();
  bool remove(const Change& change);
  bool save_folders(std::span<const Change> changes);
  void save_files(Step step);
  void submit(Change change);
  void receive(Ready ready);
  void write_batch();
  void write(std::span<const Ready> files);
  bool write_together(std::span<const Ready> files);
  void write_alone(const Ready& ready);
  bool save(std::span<const Ready> files);
  bool move(const Ready& ready);
  bool drop(const Ready& ready);
  FileState state_of(const Ready& ready) const;
  bool is_in_index(const Change& change);
  void count_saved(const Ready& ready);
  void fail(const std::string& path, const std::string& reason);
  std::string fail_in_database(const Change& change);
  void settle();
  bool can_be_read_again();
  void remove_before_saving();

  Database& database_;
  const DataFolder& data_;
  TagWorkers& workers_;
  ScanOptions options_;
  ScanHooks hooks_;
  ScanState state_;
  Timings timings_;
  ScanReport report_;
  std::map<std::string, Root> roots_;        ///< Of this scan, by path.
  std::vector<std::string> away_;            ///< Folders whose file systems are not mounted.
  std::map<std::uint64_t, Change> in_hand_;  ///< With the workers, by ticket.
  std::uint64_t last_ticket_ = 0;
  std::vector<Ready> batch_;
  std::set<std::string> told_;  ///< Failures that a repeated look would tell again.
  bool is_settling_ = false;
  bool is_reconfigured_ = false;  ///< Since the plan was made.
};

}  // namespace mediidx::tool

#endif
