// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "folders/folder_edit.h"

#include <algorithm>
#include <filesystem>
#include <stdexcept>

#include "mediidx/index_folder.h"
#include "mediidx/index_folder_action.h"
#include "scan/known_folders.h"
#include "store/pid_file.h"
#include "store/query.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;
using What = FolderChange::What;

const ConfiguredFolder* find_entry(const std::vector<ConfiguredFolder>& list,
                                   const Json::Value& entry) {
  const auto found = std::ranges::find_if(
      list, [&entry](const auto& other) { return other.entry["path"] == entry["path"]; });
  return found == list.end() ? nullptr : &*found;
}

bool holds(const std::vector<ConfiguredFolder>& list, const std::string& folder) {
  return std::ranges::find(list, folder, &ConfiguredFolder::folder) != list.end();
}

void check_all_there(const std::vector<ConfiguredFolder>& folders) {
  for (const auto& configured : folders) {
    if (configured.is_there()) continue;
    throw std::runtime_error(configured.shown() +
                             " is not there: a change now would empty its index. Bring it back, or "
                             "give it up with --drop-missing");
  }
}

/// Nobody else changes the settings between reading and writing them.
ShareFile read_locked(FileLock& lock, const DataFolder& data) {
  lock.own();
  check_configuration(data.root());
  return ShareFile(data.root());
}

bool is_same(const Json::Value& first, const Json::Value& second) {
  return IndexFolderAction().compareFolder(first, second);
}

}  // namespace

FolderEdit::FolderEdit(const DataFolder& data, bool drop_missing)
    : data_(data),
      lock_(data.path() / "lock"),
      share_file_(read_locked(lock_, data)),
      before_(configured_folders()),
      after_(before_) {
  if (!drop_missing) check_all_there(before_);
  std::erase_if(after_, [](const auto& configured) { return !configured.is_there(); });
}

std::string FolderEdit::find(const std::string& named) const {
  const auto path = stored_path(named);
  if (holds(before_, path)) return path;
  std::error_code error;
  const auto real = fs::canonical(named, error).string();
  if (!error && holds(before_, real)) return real;
  throw std::runtime_error(escape_for_display(named) +
                           " is not chosen for indexing: see mediidx folder list");
}

void FolderEdit::add(const std::string& folder, const std::string& name, const KindFlags& kinds) {
  if (holds(after_, folder)) {
    throw std::runtime_error(escape_for_display(folder) +
                             " is chosen already: change it with mediidx folder set");
  }
  const auto is_on = [&kinds](const char* kind) {
    const auto found = kinds.find(kind);
    return found != kinds.end() && found->second;
  };
  after_.push_back({createRule(name, share_file_.path_of(folder), is_on("photo"), is_on("music"),
                               is_on("video"), false),
                    folder});
}

void FolderEdit::set(const std::string& named, const KindFlags& kinds) {
  const auto folder = find(named);
  for (auto& configured : after_) {
    if (configured.folder != folder) continue;
    for (const auto& [kind, on] : kinds) configured.entry[kind] = on;
  }
}

void FolderEdit::remove(const std::string& named) {
  const auto folder = find(named);
  std::erase_if(after_, [&folder](const auto& configured) { return configured.folder == folder; });
}

std::vector<FolderChange> FolderEdit::changes() const {
  std::vector<FolderChange> removed;
  std::vector<FolderChange> added;
  std::vector<FolderChange> changed;
  for (const auto& configured : before_) {
    if (find_entry(after_, configured.entry)) continue;
    removed.push_back({What::kRemoved, configured.entry, configured.folder});
  }
  for (const auto& configured : after_) {
    const auto* known = find_entry(before_, configured.entry);
    if (!known) {
      added.push_back({What::kAdded, configured.entry, configured.folder});
    } else if (!is_same(configured.entry, known->entry)) {
      changed.push_back({What::kChanged, configured.entry, configured.folder});
    }
  }
  for (const auto* list : {&added, &changed}) {
    removed.insert(removed.end(), list->begin(), list->end());
  }
  return removed;
}

Json::Value FolderEdit::new_entries() const {
  Json::Value entries(Json::arrayValue);
  for (const auto& configured : after_) entries.append(configured.entry);
  return entries;
}

void FolderEdit::apply() {
  const auto list = changes();
  share_file_.save();
  PidFile::remove_stale(data_);
  const auto entries = new_entries();
  IndexFolderAction action;
  if (action.onApply(entries, entries) != 0) {
    throw std::runtime_error("the index-folder configuration cannot be written");
  }
  IndexFolderUpdate();
  // The action runs nothing where only kinds were switched.
  const bool only_kinds =
      std::ranges::all_of(list, [](const auto& change) { return change.what == What::kChanged; });
  if (!only_kinds) return;
  Json::Value changed(Json::arrayValue);
  for (const auto& change : list) changed.append(change.entry);
  action.ReindexFolders(changed);
}

}  // namespace mediidx::tool
