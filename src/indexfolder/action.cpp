// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <sys/stat.h>
#include <tavocore.h>
#include <unistd.h>

#include <string>
#include <string_view>
#include <unordered_map>

#include "indexfolder/entry.h"
#include "mediidx/index_folder.h"
#include "mediidx/index_folder_action.h"
#include "support/log.h"
#include "support/no_throw.h"
#include "support/root.h"
#include "support/share.h"

namespace mediidx {
namespace {

bool is_folder(const std::string& path) {
  struct stat status;
  return stat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
}

/// The first usable entry of each path of a list, which has to outlive this.
class EntriesByPath {
 public:
  explicit EntriesByPath(const Json::Value& list) {
    for (const auto& entry : list) {
      if (is_usable_entry(entry)) entries_.try_emplace(*find_entry_path(entry), &entry);
    }
  }
  /// The one with the path of `entry`, which is usable; null when there is none.
  const Json::Value* find(const Json::Value& entry) const {
    const auto found = entries_.find(*find_entry_path(entry));
    return found == entries_.end() ? nullptr : found->second;
  }

 private:
  std::unordered_map<std::string_view, const Json::Value*> entries_;
};

/// Null when the entry is no object, or has no such member.
Json::Value member_of(const Json::Value& entry, const char* member) {
  return entry.isObject() ? entry[member] : Json::Value();
}

void set_indexed_bit(TAVOSHARE& share, bool on) {
  if (on) {
    share.status |= TAVOSHARE_STATUS_INDEXED;
  } else {
    share.status &= ~static_cast<std::uint32_t>(TAVOSHARE_STATUS_INDEXED);
  }
}

}  // namespace
}  // namespace mediidx

using mediidx::absolute_folder;
using mediidx::below_root;
using mediidx::EntriesByPath;
using mediidx::is_usable_entry;
using mediidx::kIndexFolderActionLog;
using mediidx::no_throw;

IndexFolderAction::IndexFolderAction() = default;
IndexFolderAction::~IndexFolderAction() = default;

int IndexFolderAction::onApply(const Json::Value& newConf, const Json::Value& comparison) {
  return no_throw(kIndexFolderActionLog, 1, [&] {
    Prepare(newConf, comparison);
    if (newConf_.empty()) {
      unlink(below_root(mediidx::kIndexFolderConfPath).c_str());
    } else if (!Save()) {
      return 1;
    }
    Reindex();
    return 0;
  });
}

int IndexFolderAction::onApply(const Json::Value& newConf) {
  return no_throw(kIndexFolderActionLog, 0, [&] {
    Prepare(newConf, newConf);
    if (!Save()) return 0;
    Reindex();
    return 1;
  });
}

void IndexFolderAction::Prepare(const Json::Value& newConf, const Json::Value& comparison) {
  newConf_ = newConf;
  comparison_ = comparison;
  currentConf_ = IndexFolderConfOpen();
  checkFoldersExist(newConf_);
  checkFoldersExist(comparison_);
  setUpdatedIndexFolders();
  setDeletedIndexFolders();
}

bool IndexFolderAction::Save() {
  if (IndexFolderConfSave(newConf_) == 0) return true;
  kIndexFolderActionLog.colon(501, "IndexFolderActionConfSave failed.");
  return false;
}

void IndexFolderAction::Reindex() {
  // Changed flags alone are left to whoever edits the configuration.
  if (added_.empty() && deleted_.empty()) return;
  ReindexFolders(deleted_);
  ModifyShareStatus();
  ReindexFolders(added_);
  ReindexFolders(changed_);
}

bool IndexFolderAction::compareFolder(const Json::Value& first, const Json::Value& second) {
  for (const char* member : {"photo", "music", "video", "path"}) {
    if (mediidx::member_of(first, member) != mediidx::member_of(second, member)) return false;
  }
  return true;
}

void IndexFolderAction::checkFoldersExist(Json::Value& conf) {
  Json::Value kept(Json::arrayValue);
  std::string folder;  // of the last entry whose share was found
  for (const auto& entry : conf) {
    if (!is_usable_entry(entry)) continue;
    if (auto found = absolute_folder(entry["path"].asString())) folder = std::move(*found);
    if (mediidx::is_folder(folder)) kept.append(entry);
  }
  conf.swap(kept);
}

void IndexFolderAction::setUpdatedIndexFolders() {
  added_ = Json::Value(Json::arrayValue);
  changed_ = Json::Value(Json::arrayValue);
  const EntriesByPath current_entries(currentConf_);
  for (const auto& entry : comparison_) {
    if (!is_usable_entry(entry)) continue;
    const auto* current = current_entries.find(entry);
    if (!current) {
      added_.append(entry);
    } else if (!compareFolder(entry, *current)) {
      changed_.append(entry);
    }
  }
}

void IndexFolderAction::setDeletedIndexFolders() {
  deleted_ = Json::Value(Json::arrayValue);
  const EntriesByPath new_entries(newConf_);
  for (const auto& entry : currentConf_) {
    if (is_usable_entry(entry) && !new_entries.find(entry)) deleted_.append(entry);
  }
}

void IndexFolderAction::ReindexFolders(const Json::Value& list) {
  const auto indexer = below_root(mediidx::kIndexerPath);
  for (const auto& entry : list) {
    if (!is_usable_entry(entry)) continue;
    const auto folder = absolute_folder(entry["path"].asString());
    if (!folder) continue;
    TLIBCExec(indexer.c_str(), "-D", folder->c_str(), "-P", "MediaIndex");
    TLIBCExec(indexer.c_str(), "-A", folder->c_str(), "-P", "MediaIndex");
  }
}

void IndexFolderAction::ModifyShareStatus() {
  const auto manager = below_root(mediidx::kIndexManagerPath);
  if (TLIBCExec(manager.c_str(), "--check-indexbit", nullptr, nullptr, nullptr) != 0) {
    kIndexFolderActionLog.colon(502, "ModifyShareStatus failed");
  }
}

void SetShareIndexed(tlib_szlist* shares, bool on) {
  if (!shares) return;
  const int count = TLIBCSzListCount(shares);
  for (int i = 0; i < count; ++i) {
    const auto share = mediidx::find_share(TLIBCSzListGet(shares, i));
    if (!share) {
      kIndexFolderActionLog.colon(503, "TAVOShareGet failed [%X]",
                                  static_cast<unsigned>(TLIBCErrGet()));
      return;
    }
    mediidx::set_indexed_bit(*share, on);
    if (TLIBShareUpdate(share.get()) < 0) {
      kIndexFolderActionLog.colon(504, "TLIBShareUpdate failed [%X]",
                                  static_cast<unsigned>(TLIBCErrGet()));
      return;
    }
  }
}
