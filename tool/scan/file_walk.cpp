// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/file_walk.h"

#include <dirent.h>
#include <strings.h>
#include <tavosdk.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <memory>
#include <optional>

#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr const char* kPassedOver[] = {"@eaDir",       "#recycle",  "@Recycle",
                                       "$RECYCLE.BIN", "RECYCLER",  "Recycled",
                                       "#snapshot",    "@snapshot", "System Volume Information",
                                       "lost+found"};

struct CloseFolder {
  void operator()(DIR* folder) const { closedir(folder); }
};

/// The names in a folder, sorted; empty with errno set when they cannot be read to the end.
std::optional<std::vector<std::string>> read_names(const std::string& folder) {
  const std::unique_ptr<DIR, CloseFolder> open(opendir(folder.c_str()));
  if (!open) return std::nullopt;
  std::vector<std::string> names;
  for (;;) {
    errno = 0;
    const dirent* entry = readdir(open.get());
    if (!entry && errno != 0) return std::nullopt;
    if (!entry) break;
    if (!is_passed_over(entry->d_name)) names.emplace_back(entry->d_name);
  }
  std::ranges::sort(names);
  return names;
}

}  // namespace

bool is_passed_over(const std::string& name) {
  return name.starts_with('.') || std::ranges::any_of(kPassedOver, [&name](const char* other) {
           return strcasecmp(other, name.c_str()) == 0;
         });
}

bool FileWalk::is_new(const struct stat& status) {
  return seen_.insert({status.st_dev, status.st_ino}).second;
}

void FileWalk::exclude(const std::string& folder) {
  struct stat status{};
  if (stat(folder.c_str(), &status) == 0) is_new(status);
}

bool FileWalk::is_storable(const std::string& path) {
  if (!is_utf8(path)) {
    found_.failures.push_back({path, "its name is not valid UTF-8"});
    return false;
  }
  if (path.size() >= MEDIIDX_PATH_SIZE) {
    found_.failures.push_back({path, "its path is too long"});
    return false;
  }
  return true;
}

void FileWalk::take_file(const std::string& path, const struct stat& status) {
  const auto kind = kind_of(path);
  if (!kind || status.st_size == 0 || !is_new(status) || !is_storable(path)) return;
  found_.files.push_back({path, *kind});
}

void FileWalk::walk(const std::string& folder, const struct stat& status) {
  if (stop_() || !is_new(status) || !is_storable(folder)) return;
  const auto names = read_names(folder);
  if (!names) {
    found_.failures.push_back({folder, std::strerror(errno)});
    return;
  }
  found_.folders.push_back(folder);
  std::vector<std::pair<std::string, struct stat>> subfolders;
  for (const auto& name : *names) {
    const auto path = folder + "/" + name;
    struct stat entry{};
    if (lstat(path.c_str(), &entry) != 0) {
      if (errno != ENOENT) found_.failures.push_back({path, std::strerror(errno)});
    } else if (S_ISLNK(entry.st_mode)) {
      links_.push_back(path);
    } else if (S_ISDIR(entry.st_mode)) {
      subfolders.emplace_back(path, entry);
    } else if (S_ISREG(entry.st_mode)) {
      take_file(path, entry);
    }
  }
  for (const auto& [path, entry] : subfolders) {
    if (entry.st_dev != status.st_dev && IndexIsPathRemoteMount(path.c_str()) > 0) {
      found_.failures.push_back({path, "on a network mount, which is never indexed"});
    } else {
      walk(path, entry);
    }
  }
}

void FileWalk::add(const std::string& folder) {
  struct stat status{};
  if (stat(folder.c_str(), &status) != 0) {
    found_.failures.push_back({folder, std::strerror(errno)});
    return;
  }
  walk(folder, status);
}

void FileWalk::follow(const std::string& link) {
  struct stat status{};
  if (stat(link.c_str(), &status) != 0) return;
  if (S_ISDIR(status.st_mode)) walk(link, status);
  if (S_ISREG(status.st_mode)) take_file(link, status);
}

Found FileWalk::finish() {
  // NOLINTNEXTLINE(modernize-loop-convert): a followed folder may bring more links.
  for (std::size_t i = 0; i < links_.size(); ++i) follow(std::string(links_[i]));
  return std::move(found_);
}

}  // namespace mediidx::tool
