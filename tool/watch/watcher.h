// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Keeps the index up to date while files change.
#ifndef MEDIIDX_TOOL_WATCH_WATCHER_H_
#define MEDIIDX_TOOL_WATCH_WATCHER_H_

#include <chrono>
#include <cstddef>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "cli/scan_run.h"
#include "watch/folder_events.h"

namespace mediidx::tool {

struct WatchOptions {
  ScanSetting scan;
  /// Between two scans of everything, whatever the kernel told; empty: hours where it tells,
  /// minutes where it cannot.
  std::optional<std::chrono::seconds> interval;
  std::chrono::milliseconds settle{2000};  ///< So long has a folder to be quiet.
  std::size_t most_folders = 0;            ///< 0: as many as the kernel allows.
};

class Watcher {
 public:
  /// `say` is told what the watcher does, `ready` once it has caught up and watches.
  Watcher(const DataFolder& data, Database& database, WatchOptions options,
          std::function<void(const std::string&)> say, std::function<void()> ready);

  /// Until a signal says stop; throws DatabaseLost when the database does not come back.
  void run();

 private:
  using Clock = std::chrono::steady_clock;
  /// Since when a folder is not up to date, and when it last changed.
  struct Unrest {
    Clock::time_point first;
    Clock::time_point last;
  };

  std::size_t count_folders();
  bool can_watch();
  void scan_everything();
  void scan_changed();
  ScanReport scan(const std::vector<std::string>& folders, bool everything);
  void wait();
  void take_news();
  void note(const std::string& folder);
  void tell();
  bool must_stop() const;
  std::chrono::seconds interval() const;

  const DataFolder& data_;
  Database& database_;
  WatchOptions options_;
  std::function<void(const std::string&)> say_;
  std::function<void()> ready_;
  std::string settings_;                  ///< The folder of the configuration.
  std::unique_ptr<FolderEvents> events_;  ///< Null where the kernel cannot watch.
  std::map<std::string, Unrest> unrest_;
  std::vector<std::string> away_;  ///< Roots that the last whole scan missed.
  Clock::time_point next_look_;    ///< For those.
  bool is_overrun_ = false;        ///< News were lost, or the settings have changed.
  int mounts_ = -1;                ///< Becomes urgent when something is mounted.
  Clock::time_point next_full_;
  ScanReport total_;
  std::size_t scans_ = 0;
};

}  // namespace mediidx::tool

#endif
