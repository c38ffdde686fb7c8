// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <sys/stat.h>
#include <tavosdk.h>

#include <map>
#include <optional>
#include <set>
#include <string>

#include "indexfolder/entry.h"
#include "indexfolder/reload_lock.h"
#include "mediidx/index_folder.h"
#include "mediidx/index_folder_action.h"
#include "support/log.h"
#include "support/no_throw.h"
#include "support/share.h"

namespace mediidx {
namespace {

/// What the file says of its shares and paths; the in-memory copy knows absolute folders only.
struct FileForm {
  std::map<std::string, std::string> path_by_folder;   ///< Absolute folder to share-relative path.
  std::map<std::string, std::string> folder_by_share;  ///< Share to its absolute folder.
  std::map<std::string, std::string> share_by_name;    ///< As paths name it, to the share.
};

FileForm read_file_form() {
  FileForm form;
  for (const auto& entry : IndexFolderConfOpen()) {
    if (!is_usable_entry(entry)) continue;
    const auto path = entry["path"].asString();
    const auto name = getShareName(path);
    const auto share = find_share(name.c_str());
    if (!share) continue;
    form.path_by_folder[appendPath(share->path, getFolderPath(path))] = path;
    form.folder_by_share[share->name] = share->path;
    form.share_by_name[name] = share->name;
  }
  return form;
}

/// The share whose folder holds the path; the deepest counts.
std::optional<std::string> find_share_of(const FileForm& form, const std::string& path) {
  std::optional<std::string> found;
  std::size_t deepest = 0;
  for (const auto& [name, folder] : form.folder_by_share) {
    if (!IsEqualOrSubPath(path, folder) || folder.size() <= deepest) continue;
    deepest = folder.size();
    found = name;
  }
  return found;
}

/// The entries of the in-memory copy that are not the folder or below it, in the file's form.
struct Remaining {
  Json::Value entries{Json::arrayValue};
  bool any_removed = false;
};

Remaining collect_remaining(const FileForm& form, const std::string& folder) {
  Remaining remaining;
  std::set<Json::Value> collected;
  for (const auto& entry : gIndexFolderConf) {
    if (IsEqualOrSubPath(entry["path"].asString(), folder)) {
      remaining.any_removed = true;
      continue;
    }
    const auto path = form.path_by_folder.find(entry["path"].asString());
    if (path == form.path_by_folder.end()) continue;  // gone from the file meanwhile
    auto stored = entry;
    stored["path"] = path->second;
    // The in-memory copy repeats entries of equal folders.
    if (collected.insert(stored).second) remaining.entries.append(stored);
  }
  return remaining;
}

bool holds_share(const FileForm& form, const Json::Value& entries, const std::string& share) {
  for (const auto& entry : entries) {
    const auto known = form.share_by_name.find(getShareName(entry["path"].asString()));
    if (known != form.share_by_name.end() && known->second == share) return true;
  }
  return false;
}

int remove_folder(std::string folder) {
  while (folder.size() > 1 && folder.back() == '/') folder.pop_back();
  const ReloadLock lock;
  const auto form = read_file_form();
  const auto remaining = collect_remaining(form, folder);
  if (!remaining.any_removed) return 0;
  if (IndexFolderConfSave(remaining.entries) != 0) {
    kIndexFolderActionLog.colon(601, "IndexFolderConfSave failed.");
    return -1;
  }
  const auto share = find_share_of(form, folder);
  if (share && !holds_share(form, remaining.entries, *share) &&
      ShareIndexStatusClear(share->c_str()) < 0) {
    kIndexFolderActionLog.colon(602, "ShareIndexStatusClear failed: %s", share->c_str());
  }
  return 0;
}

}  // namespace
}  // namespace mediidx

extern "C" int IndexFolderConfDelFolder(const char* path) {
  // An empty path would stand above everything.
  if (!path || !*path) return -1;
  struct stat status;
  if (stat(path, &status) == 0) return 0;
  return mediidx::no_throw(mediidx::kIndexFolderActionLog, -1,
                           [&] { return mediidx::remove_folder(path); });
}
