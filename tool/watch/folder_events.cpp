// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "watch/folder_events.h"

#include <sys/inotify.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <system_error>

namespace mediidx::tool {
namespace {

constexpr std::uint32_t kOwnEnd = IN_DELETE_SELF | IN_MOVE_SELF | IN_UNMOUNT;
// A file is told of when it is made, for a link is there at once, and when it has been written.
constexpr std::uint32_t kNews = IN_CREATE | IN_CLOSE_WRITE | IN_MOVED_FROM | IN_MOVED_TO |
                                IN_DELETE | IN_ATTRIB | IN_DELETE_SELF | IN_MOVE_SELF | IN_ONLYDIR |
                                IN_EXCL_UNLINK;

}  // namespace

FolderEvents::FolderEvents() : descriptor_(inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {
  if (descriptor_ < 0) throw std::system_error(errno, std::generic_category(), "inotify");
}

FolderEvents::~FolderEvents() { close(descriptor_); }

bool FolderEvents::watch(const std::string& folder) {
  const int number = inotify_add_watch(descriptor_, folder.c_str(), kNews);
  if (number < 0) return errno != ENOSPC && errno != ENOMEM;
  // The kernel tells apart folders, not names: a folder that was moved keeps its number.
  if (const auto before = folders_.find(number); before != folders_.end()) {
    numbers_.erase(before->second);
  }
  folders_[number] = folder;
  numbers_[folder] = number;
  return true;
}

void FolderEvents::clear() {
  for (const auto& [number, folder] : folders_) inotify_rm_watch(descriptor_, number);
  folders_.clear();
  numbers_.clear();
}

/// A folder that moved away, with all below: its names are no longer those that are known.
void FolderEvents::forget(const std::string& folder) {
  for (auto at = numbers_.lower_bound(folder); at != numbers_.end();) {
    if (!at->first.starts_with(folder)) break;
    const auto& name = at->first;
    if (name.size() > folder.size() && name[folder.size()] != '/') {
      ++at;
      continue;
    }
    inotify_rm_watch(descriptor_, at->second);
    folders_.erase(at->second);
    at = numbers_.erase(at);
  }
}

bool FolderEvents::take(const Changed& changed) {
  alignas(inotify_event) std::array<char, 65536> buffer;
  bool has_all = true;
  for (;;) {
    const auto length = read(descriptor_, buffer.data(), buffer.size());
    if (length <= 0) return has_all;
    for (std::size_t at = 0; at < static_cast<std::size_t>(length);) {
      const auto* event = reinterpret_cast<const inotify_event*>(&buffer[at]);
      at += sizeof(inotify_event) + event->len;
      has_all &= take_one(*event, changed);
    }
  }
}

bool FolderEvents::take_one(const inotify_event& event, const Changed& changed) {
  if (event.mask & IN_Q_OVERFLOW) return false;
  const auto known = folders_.find(event.wd);
  if (known == folders_.end()) return true;
  const auto folder = known->second;
  const std::string name = event.len > 0 ? event.name : "";
  if (event.mask & IN_IGNORED) {
    folders_.erase(known);
    const auto own = numbers_.find(folder);
    if (own != numbers_.end() && own->second == event.wd) numbers_.erase(own);
  } else if (event.mask & kOwnEnd) {
    if (!is_watched(folder.substr(0, folder.rfind('/')))) changed(folder, "");
  } else if (!name.empty()) {
    const bool is_folder = (event.mask & IN_ISDIR) != 0;
    if (is_folder && (event.mask & (IN_MOVED_FROM | IN_DELETE))) forget(folder + "/" + name);
    changed(folder, name);
  }
  return true;
}

}  // namespace mediidx::tool
