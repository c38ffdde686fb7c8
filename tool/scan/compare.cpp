// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/compare.h"

#include <sys/stat.h>
#include <sys/vfs.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <map>
#include <set>
#include <string_view>

namespace mediidx::tool {
namespace {

constexpr long kFat = 0x4d44;
constexpr long kExFat = 0x2011BAB0;
constexpr std::int64_t kTwoSeconds = 2'000'000'000;

class FolderComparison {
 public:
  FolderComparison(const ListedFolder& listed, const KnownFolder& known,
                   const CompareOptions& options, Comparison& out)
      : listed_(listed), known_(known), options_(options), out_(out) {}

  void run() {
    compare_folder();
    std::map<std::string_view, const KnownFile*> known;
    for (const auto& file : known_.files) known[file.name] = &file;
    for (const auto& file : listed_.found.files) {
      const auto before = known.find(file.name);
      compare_file(file, before == known.end() ? nullptr : before->second);
      if (before != known.end()) known.erase(before);
    }
    for (const auto& [name, file] : known) miss_file(*file);
    miss_subfolders();
  }

 private:
  Change change(What what, const std::string& path) const {
    Change out;
    out.what = what;
    out.folder = known_.id;
    out.path = path;
    return out;
  }
  std::string path_of(const std::string& name) const { return listed_.found.path + "/" + name; }
  bool is_unreadable(const std::string& name) const {
    const auto& names = listed_.found.unreadable;
    return std::ranges::find(names, name) != names.end();
  }

  void compare_folder() {
    const auto& now = listed_.found.status;
    const bool is_known = known_.modified.has_value();
    if (!listed_.coverage.folder) {
      if (is_known) add_folder(What::kLeftOut);
    } else if (!is_known) {
      add_folder(What::kNew);
    } else if (options_.full || *known_.modified != now.modified) {
      add_folder(What::kChanged);
    }
  }
  void add_folder(What what) {
    auto folder = change(what, listed_.found.path);
    folder.is_folder = true;
    folder.status = listed_.found.status;
    out_.changes.push_back(folder);
  }

  bool is_unchanged(const FileStatus& now, const KnownFile& before) const {
    return !options_.full && before.size == now.size &&
           std::abs(before.modified - now.modified) <= options_.tolerance;
  }

  void compare_file(const FoundFile& file, const KnownFile* before) {
    if (!listed_.coverage.wants(file.kind)) {
      ++out_.switched_off;
      if (before) remove_file(*before, What::kLeftOut);
      return;
    }
    if (before && is_unchanged(file.status, *before)) {
      if (before->has_failed) ++out_.left_alone;
      return;
    }
    auto found = change(before ? What::kChanged : What::kNew, path_of(file.name));
    found.kind = file.kind;
    found.status = file.status;
    if (before) found.known = before->has_failed ? -1 : before->size;
    out_.changes.push_back(found);
  }

  void remove_file(const KnownFile& file, What what) {
    auto lost = change(what, path_of(file.name));
    lost.kind = file.kind;
    lost.known = file.has_failed ? -1 : file.size;
    out_.changes.push_back(lost);
  }

  void miss_file(const KnownFile& file) {
    if (is_unreadable(file.name)) return;
    switch (options_.look(path_of(file.name))) {
      case Presence::kGone:
        return remove_file(file, What::kGone);
      case Presence::kFolder:
      case Presence::kOther:
        return remove_file(file, What::kLeftOut);
      case Presence::kUnknown:
        return;
    }
  }

  void miss_subfolders() {
    const std::set<std::string_view> there(listed_.found.subfolders.begin(),
                                           listed_.found.subfolders.end());
    for (const auto& path : known_.subfolders) {
      const auto name = path.substr(path.rfind('/') + 1);
      if (there.contains(name) || is_unreadable(name)) continue;
      switch (options_.look(path)) {
        case Presence::kGone:
        case Presence::kOther:
          add_lost_folder(path, What::kGoneFolder);
          break;
        case Presence::kFolder:
          add_lost_folder(path, What::kLeftOutFolder);
          break;
        case Presence::kUnknown:
          break;
      }
    }
  }
  void add_lost_folder(const std::string& path, What what) {
    auto lost = change(what, path);
    lost.folder = 0;
    lost.is_folder = true;
    out_.changes.push_back(lost);
  }

  const ListedFolder& listed_;
  const KnownFolder& known_;
  const CompareOptions& options_;
  Comparison& out_;
};

}  // namespace

Presence look_at(const std::string& path) {
  struct stat status{};
  if (lstat(path.c_str(), &status) == 0) {
    return S_ISDIR(status.st_mode) ? Presence::kFolder : Presence::kOther;
  }
  return errno == ENOENT || errno == ENOTDIR ? Presence::kGone : Presence::kUnknown;
}

std::int64_t time_tolerance(const std::string& folder) {
  struct statfs status{};
  if (statfs(folder.c_str(), &status) != 0) return 0;
  const auto type = static_cast<long>(status.f_type);
  return type == kFat || type == kExFat ? kTwoSeconds : 0;
}

void compare(const ListedFolder& listed, const KnownFolder& known, const CompareOptions& options,
             Comparison& out) {
  FolderComparison(listed, known, options, out).run();
}

}  // namespace mediidx::tool
