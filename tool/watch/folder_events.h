// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The kernel's news of folders.
#ifndef MEDIIDX_TOOL_WATCH_FOLDER_EVENTS_H_
#define MEDIIDX_TOOL_WATCH_FOLDER_EVENTS_H_

#include <cstddef>
#include <functional>
#include <map>
#include <string>

struct inotify_event;

namespace mediidx::tool {

/// inotify over many folders.
class FolderEvents {
 public:
  /// Throws std::system_error when the kernel allows no more of it.
  FolderEvents();
  ~FolderEvents();
  FolderEvents(const FolderEvents&) = delete;
  FolderEvents& operator=(const FolderEvents&) = delete;

  /// False when the kernel allows no more folders; a folder that is gone or closed is no failure.
  bool watch(const std::string& folder);
  bool is_watched(const std::string& folder) const { return numbers_.contains(folder); }
  std::size_t count() const { return numbers_.size(); }
  void clear();

  /// Becomes readable with news.
  int descriptor() const { return descriptor_; }
  /// Told of a folder and the name in it to which something happened; without a name the folder
  /// itself went, and nobody watches the one that held it.
  using Changed = std::function<void(const std::string& folder, const std::string& name)>;
  /// Takes the news there are. False when the kernel had to drop some.
  bool take(const Changed& changed);

 private:
  bool take_one(const inotify_event& event, const Changed& changed);
  void forget(const std::string& folder);

  int descriptor_;
  std::map<int, std::string> folders_;
  std::map<std::string, int> numbers_;
};

}  // namespace mediidx::tool

#endif
