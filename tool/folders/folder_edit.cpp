// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "folders/folder_edit.h"

#include <algorithm>
#include <filesystem>
#include <stdexcept>

#include "mediidx/index_folder.h"
#include "mediidx/index_folder_action.h"
#include "mediidx/request.h"
#include "scan/known_folders.h"
#include "store/pid_file.h"
#include "store/query.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;
using What = FolderChange::What;

/// The first of each path.
using FoldersByPath = std::map<std::string, const ConfiguredFolder*>;

FoldersByPath by_path(const std::vector<ConfiguredFolder>& list) {
  FoldersByPath out;
  for (const auto& configured : list) {
    out.try_emplace(configured.entry["path"].asString(), &configured);
  }
  return out;
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

ShareFile read_shares(const DataFolder& data) {
  check_configuration(data.root());
  return ShareFile(data.root());
}

/// The indexer keeps what a parent may still want; but what was given up leaves no row.
void forget_given_up(const std::vector<FolderChange>& list) {
  for (const auto& change : list) {
    std::error_code ignored;
    if (change.what != What::kRemoved || change.folder.empty() ||
        fs::exists(change.folder, ignored) ||
        IndexFolderIsFolderIndexed(change.folder.c_str()) <= 0) {
      continue;
    }
    if (TAVOMediaIndexDirDelete(change.folder.c_str()) >= 0) continue;
    throw std::runtime_error(escape_for_display(change.folder) +
                             " could not be taken out of the index");
  }
}

bool is_same(const Json::Value& first, const Json::Value& second) {
  return IndexFolderAction().compareFolder(first, second);
}

}  // namespace

FolderEdit::FolderEdit(const DataFolder& data, bool drop_missing)
    : data_(data),
      lock_(data),
      share_file_(read_shares(data)),
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
  const auto kept = by_path(after_);
  const auto known = by_path(before_);
  for (const auto& configured : before_) {
    if (kept.contains(configured.entry["path"].asString())) continue;
    removed.push_back({What::kRemoved, configured.entry, configured.folder});
  }
  for (const auto& configured : after_) {
    const auto before = known.find(configured.entry["path"].asString());
    if (before == known.end()) {
      added.push_back({What::kAdded, configured.entry, configured.folder});
    } else if (!is_same(configured.entry, before->second->entry)) {
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
  forget_given_up(list);
  // The action runs nothing where only kinds were switched.
  const bool only_kinds =
      std::ranges::all_of(list, [](const auto& change) { return change.what == What::kChanged; });
  if (!only_kinds) return;
  Json::Value changed(Json::arrayValue);
  for (const auto& change : list) changed.append(change.entry);
  action.ReindexFolders(changed);
}

}  // namespace mediidx::tool
