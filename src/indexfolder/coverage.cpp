// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Which entries hold a path. The in-memory copy is sorted, longest path first: the first entry that
// holds a path is the deepest.
#include <strings.h>
#include <sys/stat.h>

#include <algorithm>
#include <stdexcept>
#include <string>
#include <string_view>

#include "indexfolder/entry.h"
#include "indexfolder/folder_index.h"
#include "indexfolder/reload_lock.h"
#include "mediidx/index_folder.h"
#include "support/log.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

constexpr int kNoPath = 201;
constexpr int kWrongKind = 202;

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

/// Not a question of each file: a walk does.
bool is_any_in_share(std::string_view share) {
  return gIndexFolderConf.isArray() &&
         std::ranges::any_of(gIndexFolderConf, [&](const Json::Value& entry) {
           const auto path = find_entry_path(entry);
           return path && is_in_share(*path, share);
         });
}

int one_or_minus_one(bool answer) { return answer ? 1 : -1; }

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
using mediidx::Reach;
using mediidx::ReloadLock;

extern "C" int IndexFolderIsPathIndexed(const char* path, int kind) {
  if (!mediidx::is_answerable(path, kind)) {
    // Never locked; but a reload that waits is done now.
    mediidx::let_reloads_through();
    return -1;
  }
  const ReloadLock lock;
  const auto* entry = mediidx::find_holder(path, Reach::kItselfOrAbove);
  return entry ? mediidx::flag_for(*entry, kind) : 0;
}

extern "C" int IndexFolderIsFolderIndexed(const char* path) {
  if (!path) return -1;
  const ReloadLock lock;
  return one_or_minus_one(mediidx::find_holder(path, Reach::kItselfOrAbove));
}

extern "C" int IndexFolderIsFolderHasParent(const char* path) {
  if (!path) return -1;
  const ReloadLock lock;
  return one_or_minus_one(mediidx::find_holder(path, Reach::kAbove));
}

extern "C" int IndexFolderIsCoveredByShare(const char* sharePath) {
  if (!sharePath) return -1;
  const std::string_view share = sharePath;
  if (share.empty()) throw std::out_of_range("share without a path");
  const ReloadLock lock;
  return one_or_minus_one(mediidx::is_any_in_share(share));
}

extern "C" int IndexFolderPositionGet(const char* path) {
  if (!path) return -1;
  const ReloadLock lock;
  return mediidx::find_position(path);
}

int FindIndexFolderByPath(const Json::Value& conf, const char* path, const Json::Value** out) {
  if (!path || !out) return -1;
  return mediidx::no_throw(mediidx::kIndexFolderLog, -1,
                           [&] { return mediidx::find_index_folder(conf, path, out); });
}
