// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Which entries hold a path. The in-memory copy is sorted, longest path first: the first entry that
// holds a path is the deepest.
#include <strings.h>
#include <sys/stat.h>

#include <cstring>
#include <stdexcept>
#include <string>
#include <string_view>

#include "indexfolder/entry.h"
#include "indexfolder/reload_lock.h"
#include "mediidx/index_folder.h"
#include "support/log.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

constexpr int kNoPath = 201;
constexpr int kWrongKind = 202;

/// True when `path` lies below `folder`, which may end with a slash. Throws std::out_of_range for
/// an empty folder.
bool lies_below(std::string_view path, std::string_view folder) {
  if (folder.empty()) throw std::out_of_range("index folder without a path");
  if (!path.starts_with(folder)) return false;
  return folder.back() == '/' || path.substr(folder.size()).starts_with('/');
}

/// The first entry of the in-memory copy whose path satisfies `holds`; null when none does.
template <class Predicate>
const Json::Value* find_entry_if(Predicate&& holds) {
  if (!gIndexFolderConf.isArray()) return nullptr;
  for (const auto& entry : gIndexFolderConf) {
    const auto path = find_entry_path(entry);
    if (path && holds(*path)) return &entry;
  }
  return nullptr;
}

template <class Predicate>
int one_or_minus_one(Predicate&& holds) {
  const ReloadLock lock;
  return find_entry_if(holds) ? 1 : -1;
}

bool is_or_holds(std::string_view folder, std::string_view path) {
  return folder == path || (folder.size() <= path.size() && lies_below(path, folder));
}

/// A playlist is indexed where music is.
int flag_for(const Json::Value& entry, int kind) {
  return entry_flag(entry, flag_of_kind(kind == MEDIA_TABLE_PLAYLIST ? MEDIA_TABLE_MUSIC : kind));
}

/// False, and logged where it is, when the question has no answer.
bool is_answerable(const char* path, int kind) {
  if (!path) {
    kIndexFolderLog.colon(kNoPath, "szPath is null!");
    return false;
  }
  if (gIndexFolderConf.empty()) return false;
  if (kind != MEDIA_TABLE_DIRECTORY && kind != MEDIA_TABLE_VIDEO_CONVERT) return true;
  // The message shows the path, not the type.
  kIndexFolderLog.colon(kWrongKind, "Wrong media table type: %s", path);
  return false;
}

/// The folder or, as its beginning with a slash behind it, one above the entry; without regard to
/// case.
bool is_in_share(std::string_view entry, std::string_view share) {
  if (entry.size() == share.size() && strncasecmp(entry.data(), share.data(), share.size()) == 0) {
    return true;
  }
  const bool has_slash = share.back() == '/';
  if (entry.size() < share.size() + (has_slash ? 0 : 1)) return false;
  return strncasecmp(entry.data(), share.data(), share.size()) == 0 &&
         (has_slash || entry[share.size()] == '/');
}

bool is_folder(const std::string& path) {
  struct stat status;
  return stat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
}

/// Null when no entry holds the path; of entries of one length the first counts.
const Json::Value* find_deepest(const Json::Value& conf, const std::string& path) {
  const Json::Value* deepest = nullptr;
  std::size_t length = 0;
  if (!conf.isArray()) return nullptr;
  for (const auto& entry : conf) {
    const auto parent = find_entry_path(entry);
    if (!parent || parent->size() <= length) continue;
    if (!IsEqualOrSubPath(path, std::string(*parent))) continue;
    length = parent->size();
    deepest = &entry;
  }
  return deepest;
}

int find_index_folder(const Json::Value& conf, const std::string& path, const Json::Value** out) {
  if (path.empty()) return -1;
  const auto folder = absolute_folder(path);
  if (!folder || !is_folder(*folder)) return -1;
  const auto* found = find_deepest(conf, path);
  if (!found) return 0;
  *out = found;
  return 1;
}

}  // namespace
}  // namespace mediidx

using mediidx::one_or_minus_one;

extern "C" int IndexFolderIsPathIndexed(const char* path, int kind) {
  if (!mediidx::is_answerable(path, kind)) {
    // Never locked; but a reload that waits is done now.
    IndexFolderConfUnLock();
    return -1;
  }
  const mediidx::ReloadLock lock;
  const auto* entry = mediidx::find_entry_if(
      [&](std::string_view folder) { return mediidx::is_or_holds(folder, path); });
  return entry ? mediidx::flag_for(*entry, kind) : 0;
}

extern "C" int IndexFolderIsFolderIndexed(const char* path) {
  if (!path) return -1;
  return one_or_minus_one(
      [&](std::string_view folder) { return mediidx::is_or_holds(folder, path); });
}

extern "C" int IndexFolderIsFolderHasParent(const char* path) {
  if (!path) return -1;
  const std::string_view child = path;
  return one_or_minus_one([&](std::string_view folder) {
    return folder.size() < child.size() && mediidx::lies_below(child, folder);
  });
}

extern "C" int IndexFolderIsCoveredByShare(const char* sharePath) {
  if (!sharePath) return -1;
  const std::string_view share = sharePath;
  if (share.empty()) throw std::out_of_range("share without a path");
  return one_or_minus_one(
      [&](std::string_view folder) { return mediidx::is_in_share(folder, share); });
}

extern "C" int IndexFolderPositionGet(const char* path) {
  if (!path) return -1;
  const mediidx::ReloadLock lock;
  const std::string_view wanted = path;
  int position = 0;
  for (const auto& entry : gIndexFolderConf) {
    if (mediidx::find_entry_path(entry) == wanted) return position;
    ++position;
  }
  return -1;
}

int FindIndexFolderByPath(const Json::Value& conf, const char* path, const Json::Value** out) {
  if (!path || !out) return -1;
  return mediidx::no_throw(mediidx::kIndexFolderLog, -1,
                           [&] { return mediidx::find_index_folder(conf, path, out); });
}
