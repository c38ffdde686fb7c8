// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "watch/watcher.h"

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <fstream>
#include <system_error>

#include "cli/interrupt.h"
#include "mediidx/index_folder.h"
#include "scan/coverage.h"
#include "store/pid_file.h"

namespace mediidx::tool {
namespace {

constexpr auto kHours = std::chrono::hours(6);
constexpr auto kMinutes = std::chrono::minutes(10);
constexpr auto kBetweenLooks = std::chrono::seconds(30);
constexpr auto kTick = std::chrono::milliseconds(250);
// A folder that never comes to rest is looked at all the same.
constexpr int kRestlessTimes = 15;

std::size_t kernel_limit(const char* name) {
  std::size_t limit = 0;
  std::ifstream(std::string("/proc/sys/fs/inotify/") + name) >> limit;
  return limit;
}

bool is_there(const std::string& folder) {
  return look_at(folder) == Presence::kFolder && !is_empty_folder(folder);
}

}  // namespace

Watcher::Watcher(const DataFolder& data, Database& database, WatchOptions options,
                 std::function<void(const std::string&)> say, std::function<void()> ready)
    : data_(data),
      database_(database),
      options_(std::move(options)),
      say_(std::move(say)),
      ready_(std::move(ready)),
      settings_(data.root() / "usr/tavo/etc"),
      mounts_(open("/proc/self/mountinfo", O_RDONLY | O_CLOEXEC)) {}

bool Watcher::must_stop() const { return noted_signal() != 0; }

std::chrono::seconds Watcher::interval() const {
  if (options_.interval) return *options_.interval;
  return events_ ? std::chrono::seconds(kHours) : std::chrono::seconds(kMinutes);
}

std::size_t Watcher::count_folders() {
  std::size_t folders = 0;
  std::vector<std::string> roots;
  for (const auto& root : outermost_index_folders()) roots.push_back(real_path(root));
  FileWalk walk(
      roots,
      [&](FoundFolder&) {
        ++folders;
        return !must_stop();
      },
      [](const Failure&) {});
  walk.exclude(data_.path());
  for (const auto& root : outermost_index_folders()) walk.walk(root, root);
  return folders;
}

bool Watcher::can_watch() {
  const auto folders = count_folders();
  auto limit = kernel_limit("max_user_watches");
  if (options_.most_folders > 0) limit = std::min(limit, options_.most_folders);
  // One more for the settings.
  if (folders + 1 <= limit) return true;
  say_("there are " + std::to_string(folders) + " folders, but no more than " +
       std::to_string(limit) +
       " can be watched (sysctl fs.inotify.max_user_watches): scanning every " +
       std::to_string((options_.interval ? *options_.interval : kMinutes).count()) +
       " seconds instead");
  return false;
}

void Watcher::run() {
  scan_everything();
  if (must_stop()) return;
  ready_();
  while (!must_stop()) {
    wait();
    if (must_stop()) return;
    if (is_overrun_ || Clock::now() >= next_full_) {
      scan_everything();
    } else {
      scan_changed();
    }
  }
}

/// The folders are watched before they are listed, so that nothing happens between.
void Watcher::scan_everything() {
  is_overrun_ = false;
  unrest_.clear();
  events_.reset();
  if (can_watch()) {
    try {
      events_ = std::make_unique<FolderEvents>();
      events_->watch(settings_);
    } catch (const std::system_error& error) {
      say_(std::string("no folder can be watched: ") + error.what());
    }
  }
  const bool was_away = !away_.empty();
  away_ = scan({}, /*everything=*/true).away_roots;
  next_full_ = Clock::now() + interval();
  // One that is there and yet away, on another file system, is not asked for all the time.
  next_look_ = Clock::now() + (was_away ? kBetweenLooks : Clock::duration::zero());
}

void Watcher::scan_changed() {
  const auto now = Clock::now();
  std::vector<std::string> folders;
  for (auto at = unrest_.begin(); at != unrest_.end();) {
    const auto& [folder, unrest] = *at;
    const bool is_settled = now - unrest.last >= options_.settle ||
                            now - unrest.first >= kRestlessTimes * options_.settle;
    // One that is gone by now is missed where it was.
    if (is_settled && events_ && events_->is_watched(folder)) folders.push_back(folder);
    at = is_settled ? unrest_.erase(at) : std::next(at);
  }
  if (!folders.empty()) scan(folders, /*everything=*/false);
}

ScanReport Watcher::scan(const std::vector<std::string>& folders, bool everything) {
  auto setting = options_.scan;
  setting.options.pass_over_open = true;
  setting.options.wait = true;
  bool has_room = true;
  setting.options.before = [&](const std::string& folder) {
    if (events_ && !events_->watch(folder)) has_room = false;
  };
  if (!everything) {
    setting.options.trust_index = true;
    // What is watched tells of itself; what is new is walked as a whole.
    setting.options.descend = [this](const std::string& folder) {
      return !events_ || !events_->is_watched(folder);
    };
  }
  const ScanLock lock(data_, ScanLock::IfTaken::kWait);
  const auto report = run_scanner(data_, database_, folders, setting);
  ++scans_;
  total_.added += report.added;
  total_.changed += report.changed;
  total_.moved += report.moved;
  total_.removed += report.removed;
  total_.failed += report.failed;
  if (!has_room) {
    say_("the kernel watches no more than " + std::to_string(events_->count()) +
         " folders now (sysctl fs.inotify.max_user_watches): scanning every " +
         std::to_string((options_.interval ? *options_.interval : kMinutes).count()) +
         " seconds instead");
    events_.reset();
  }
  return report;
}

void Watcher::wait() {
  for (;;) {
    pollfd polled[] = {{events_ ? events_->descriptor() : -1, POLLIN, 0}, {mounts_, POLLPRI, 0}};
    poll(polled, std::size(polled), static_cast<int>(kTick.count()));
    if (must_stop()) return;
    if (take_hangup()) {
      IndexFolderUpdate();
      is_overrun_ = true;
    }
    if (take_user_signal()) tell();
    // A disk that came or went. The kernel tells once a look.
    if (polled[1].revents & POLLPRI) is_overrun_ = true;
    take_news();
    const auto now = Clock::now();
    if (now >= next_look_ && std::ranges::any_of(away_, is_there)) is_overrun_ = true;
    if (is_overrun_ || now >= next_full_) return;
    for (const auto& [folder, unrest] : unrest_) {
      if (now - unrest.last >= options_.settle) return;
      if (now - unrest.first >= kRestlessTimes * options_.settle) return;
    }
  }
}

void Watcher::take_news() {
  if (!events_) return;
  const bool has_all = events_->take([this](const std::string& folder, const std::string& name) {
    if (folder == settings_) {
      IndexFolderUpdate();
      is_overrun_ = true;
    } else if (name.empty() || name == kIgnoreFile) {
      is_overrun_ = true;
    } else {
      note(folder);
    }
  });
  if (has_all) return;
  say_("more happened than the kernel could tell: scanning everything");
  is_overrun_ = true;
}

void Watcher::note(const std::string& folder) {
  const auto now = Clock::now();
  const auto [at, is_new] = unrest_.try_emplace(folder, Unrest{now, now});
  if (!is_new) at->second.last = now;
}

void Watcher::tell() {
  say_("watching " + std::to_string(events_ ? events_->count() : 0) + " folders, " +
       std::to_string(unrest_.size()) + " not yet settled; " + std::to_string(scans_) +
       " scans: added " + std::to_string(total_.added) + ", changed " +
       std::to_string(total_.changed) + ", moved " + std::to_string(total_.moved) + ", removed " +
       std::to_string(total_.removed) + ", failed " + std::to_string(total_.failed));
}

}  // namespace mediidx::tool
