// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/file_walk.h"

#include <dirent.h>
#include <fcntl.h>
#include <strings.h>
#include <tavosdk.h>

#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <memory>

#include "support/owned.h"
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
using OpenFolder = std::unique_ptr<DIR, CloseFolder>;

bool is_mount_point(const std::string& folder) {
  struct statx status{};
  return statx(AT_FDCWD, folder.c_str(), 0, 0, &status) == 0 &&
         (status.stx_attributes & STATX_ATTR_MOUNT_ROOT) != 0;
}

/// As much of a file as rules may take; empty when there is none.
std::string read_start(const std::string& path) {
  struct stat status{};
  if (stat(path.c_str(), &status) != 0 || !S_ISREG(status.st_mode)) return {};
  std::ifstream in(path, std::ios::binary);
  std::string text(kIgnoreFileSize, '\0');
  in.read(text.data(), static_cast<std::streamsize>(text.size()));
  text.resize(static_cast<std::size_t>(in.gcount()));
  return text;
}

bool is_in(const std::string& path, const std::string& folder) {
  return path.size() > folder.size() && path.starts_with(folder) && path[folder.size()] == '/';
}

}  // namespace

/// The names in a folder, sorted. Files are looked at from the open folder: to find each by its
/// whole path would take longer than to look at it.
struct FileWalk::Listing {
  struct Name {
    std::string text;
    unsigned char type;  ///< As readdir tells it.
  };
  OpenFolder open;
  std::vector<Name> names;
  bool has_rules = false;

  /// False with errno set when they cannot be read to the end.
  bool read(const std::string& folder) {
    open.reset(opendir(folder.c_str()));
    if (!open) return false;
    for (;;) {
      errno = 0;
      const dirent* entry = readdir(open.get());
      if (!entry) break;
      if (is_passed_over(entry->d_name)) {
        has_rules |= std::strcmp(entry->d_name, kIgnoreFile) == 0;
      } else {
        names.push_back({entry->d_name, entry->d_type});
      }
    }
    if (errno != 0) return false;
    std::ranges::sort(names, {}, &Name::text);
    return true;
  }
};

FileStatus::FileStatus(const struct stat& status)
    : size(status.st_size),
      modified(std::int64_t{status.st_mtim.tv_sec} * 1'000'000'000 + status.st_mtim.tv_nsec),
      device(static_cast<std::int64_t>(status.st_dev)),
      inode(static_cast<std::int64_t>(status.st_ino)) {}

bool is_passed_over(const std::string& name) {
  return name.starts_with('.') || std::ranges::any_of(kPassedOver, [&name](const char* other) {
           return strcasecmp(other, name.c_str()) == 0;
         });
}

bool is_empty_folder(const std::string& folder) {
  const OpenFolder open(opendir(folder.c_str()));
  if (!open) return false;
  for (;;) {
    errno = 0;
    const dirent* entry = readdir(open.get());
    if (!entry) return errno == 0;
    if (!is_passed_over(entry->d_name)) return false;
  }
}

std::string real_path(const std::string& path) {
  const OwnedText real(realpath(path.c_str(), nullptr));
  return real ? real.get() : "";
}

bool is_ignored(const std::string& root, const std::string& path, bool is_folder) {
  IgnoreRules rules(root);
  for (auto at = root.size(); at < path.size() && path.starts_with(root + "/");) {
    const auto folder = path.substr(0, at);
    const auto text = read_start(folder + "/" + kIgnoreFile);
    if (!text.empty()) rules.add(folder, text);
    at = std::min(path.find('/', at + 1), path.size());
    if (rules.ignores(path.substr(0, at), at < path.size() || is_folder)) return true;
  }
  return false;
}

FileWalk::FileWalk(std::vector<std::string> roots, Visit visit, Skip skip)
    : roots_(std::move(roots)), visit_(std::move(visit)), skip_(std::move(skip)), rules_("/") {}

void FileWalk::exclude(const std::string& folder) {
  struct stat status{};
  if (stat(folder.c_str(), &status) == 0) excluded_.insert({status.st_dev, status.st_ino});
}

bool FileWalk::is_storable(const std::string& path) {
  if (!is_utf8(path)) {
    skip_({path, "its name is not valid UTF-8", true});
    return false;
  }
  if (path.size() >= MEDIIDX_PATH_SIZE) {
    skip_({path, "its path is too long", true});
    return false;
  }
  return true;
}

bool FileWalk::lies_in_root(const std::string& real) const {
  return std::ranges::any_of(roots_, [&real](const auto& root) {
    if (!is_in(real, root)) return real == root;
    // A hidden file is walked under no name but the link's.
    std::size_t at = root.size() + 1;
    while (at < real.size()) {
      const auto end = std::min(real.find('/', at), real.size());
      if (is_passed_over(real.substr(at, end - at))) return false;
      at = end + 1;
    }
    return true;
  });
}

void FileWalk::read_rules(const std::string& folder) {
  const auto text = read_start(folder + "/" + kIgnoreFile);
  if (!text.empty()) rules_.add(folder, text);
}

bool FileWalk::is_left_out(const std::string& root, const std::string& folder) {
  rules_ = IgnoreRules(root);
  for (auto at = root.size(); at < folder.size();) {
    const auto parent = folder.substr(0, at);
    const auto end = std::min(folder.find('/', at + 1), folder.size());
    read_rules(parent);
    if (is_passed_over(folder.substr(at + 1, end - at - 1))) return true;
    if (!rules_.is_empty() && rules_.ignores(folder.substr(0, end), true)) return true;
    at = end;
  }
  return false;
}

bool FileWalk::walk(const std::string& root, const std::string& folder) {
  struct stat status{};
  if (is_left_out(root, folder)) return true;
  if (stat(folder.c_str(), &status) != 0) {
    skip_({folder, std::strerror(errno), false});
    return true;
  }
  return enter(folder, status, /*through_link=*/false);
}

bool FileWalk::enter(const std::string& path, const struct stat& status, bool through_link) {
  const Identity identity{status.st_dev, status.st_ino};
  if (excluded_.contains(identity) || !is_storable(path)) return true;
  if (!folders_.insert(identity).second) return true;
  FoundFolder folder;
  folder.path = path;
  folder.status = FileStatus(status);
  folder.is_mounted = is_mount_point(path);
  before_(path);
  Listing listing;
  folder.is_readable = listing.read(path);
  if (!folder.is_readable) {
    skip_({path, std::strerror(errno), false});
    listing = {};
  }
  if (listing.has_rules) read_rules(path);
  in_linked_ = through_link;
  list(folder, listing, status);
  listing = {};
  const auto links = std::exchange(links_, {});
  const auto subfolders = folder.subfolders;
  if (!visit_(folder)) return false;
  for (const auto& name : subfolders) {
    const auto subfolder = path + "/" + name;
    if (!descend_(subfolder)) continue;
    struct stat entry{};
    const bool is_link = links.contains(name);
    if ((is_link ? stat : lstat)(subfolder.c_str(), &entry) != 0) continue;
    if (S_ISDIR(entry.st_mode) && !enter(subfolder, entry, through_link || is_link)) return false;
  }
  // What was found through a link stays known, so that a second link does not find it again.
  if (!through_link) folders_.erase(identity);
  return true;
}

void FileWalk::list(FoundFolder& folder, const Listing& listing, const struct stat& own) {
  for (const auto& [name, type] : listing.names) {
    const bool may_be_folder = type == DT_DIR || type == DT_LNK || type == DT_UNKNOWN;
    if (!may_be_folder && (type != DT_REG || !kind_of(name))) continue;
    struct stat status{};
    if (fstatat(dirfd(listing.open.get()), name.c_str(), &status, AT_SYMLINK_NOFOLLOW) != 0) {
      if (errno == ENOENT) continue;
      skip_({folder.path + "/" + name, std::strerror(errno), false});
      folder.unreadable.push_back(name);
    } else if (S_ISLNK(status.st_mode)) {
      follow(folder, name, own);
    } else if (S_ISDIR(status.st_mode)) {
      take_subfolder(folder, name, own, status, /*through_link=*/false);
    } else if (S_ISREG(status.st_mode)) {
      take_file(folder, name, status, /*through_link=*/false);
    }
  }
}

void FileWalk::take_file(FoundFolder& folder, const std::string& name, const struct stat& status,
                         bool through_link) {
  const auto path = folder.path + "/" + name;
  const auto kind = kind_of(path);
  if (!kind || status.st_size == 0 || !is_storable(path)) return;
  if (!rules_.is_empty() && rules_.ignores(path, false)) return;
  const bool has_more_names = through_link || in_linked_ || status.st_nlink > 1;
  if (has_more_names && !linked_.insert({status.st_dev, status.st_ino}).second) return;
  folder.files.push_back({name, *kind, FileStatus(status)});
}

void FileWalk::take_subfolder(FoundFolder& folder, const std::string& name, const struct stat& own,
                              const struct stat& status, bool through_link) {
  const auto path = folder.path + "/" + name;
  const Identity identity{status.st_dev, status.st_ino};
  if (excluded_.contains(identity) || folders_.contains(identity) || !is_storable(path)) return;
  if (!rules_.is_empty() && rules_.ignores(path, true)) return;
  if (status.st_dev != own.st_dev && IndexIsPathRemoteMount(path.c_str()) > 0) {
    skip_({path, "on a network mount, which is never indexed", true});
    return;
  }
  folder.subfolders.push_back(name);
  if (through_link) links_.insert(name);
}

void FileWalk::follow(FoundFolder& folder, const std::string& name, const struct stat& own) {
  const auto path = folder.path + "/" + name;
  struct stat status{};
  if (stat(path.c_str(), &status) != 0) {
    if (errno == ENOENT || errno == ELOOP || errno == ENOTDIR) return;
    skip_({path, std::strerror(errno), false});
    folder.unreadable.push_back(name);
    return;
  }
  const auto real = real_path(path);
  if (real.empty() || lies_in_root(real)) return;
  if (S_ISDIR(status.st_mode)) take_subfolder(folder, name, own, status, /*through_link=*/true);
  if (S_ISREG(status.st_mode)) take_file(folder, name, status, /*through_link=*/true);
}

}  // namespace mediidx::tool
