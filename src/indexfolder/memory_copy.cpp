// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The in-memory copy of the configuration: absolute folders, longest first.
#include <algorithm>
#include <map>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "indexfolder/entry.h"
#include "indexfolder/folder_index.h"
#include "indexfolder/reload_lock.h"
#include "mediidx/index_folder.h"
#include "support/log.h"
#include "support/no_throw.h"
#include "support/text.h"

Json::Value gIndexFolderConf(Json::arrayValue);
char gIsDirty = 0;
char gIsBlockUpdate = 0;

namespace mediidx {
namespace {

constexpr int kIndexOutOfRange = 101;
constexpr int kNoPathBuffer = 102;
constexpr int kTypeIndexOutOfRange = 103;
constexpr int kDumpedPath = 104;
constexpr int kDumpedFlags = 105;
constexpr int kTooManyRepeats = 106;

/// Repeated entries that are held at most: a small file could ask for more than memory holds.
constexpr std::size_t kMostRepeats = 250'000;

/// The usable entries whose share is known, in the order of the file, with absolute paths.
std::vector<Json::Value> read_entries() {
  std::vector<Json::Value> entries;
  for (const auto& stored : IndexFolderConfOpen()) {
    if (!is_usable_entry(stored)) continue;
    const auto folder = absolute_folder(stored["path"].asString());
    if (!folder) continue;
    entries.push_back(stored);
    entries.back()["path"] = *folder;
  }
  return entries;
}

using EntriesByPath = std::map<std::string_view, std::vector<const Json::Value*>>;

bool repeats_too_much(const EntriesByPath& entries_by_path) {
  std::size_t repeats = 0;
  for (const auto& [path, entries] : entries_by_path) {
    repeats += entries.size() * (entries.size() - 1);
  }
  if (repeats <= kMostRepeats) return false;
  kIndexFolderLog.colon(kTooManyRepeats, "Too many entries of one folder: each is held once");
  return true;
}

/// Longest path first. Every entry is appended once for each entry of its path: two of one folder
/// give four.
Json::Value sorted_by_length(const std::vector<Json::Value>& entries) {
  EntriesByPath entries_by_path;
  std::vector<std::string_view> paths;
  for (const auto& entry : entries) {
    paths.push_back(*find_entry_path(entry));
    entries_by_path[paths.back()].push_back(&entry);
  }
  std::ranges::stable_sort(paths, std::greater(), &std::string_view::size);
  const bool once = repeats_too_much(entries_by_path);
  Json::Value sorted(Json::arrayValue);
  for (const auto path : paths) {
    auto& group = entries_by_path[path];
    for (const auto* entry : group) sorted.append(*entry);
    if (once) group.clear();
  }
  return sorted;
}

int load() {
  gIndexFolderConf = Json::Value(Json::arrayValue);
  gIndexFolderConf = sorted_by_length(read_entries());
  return 0;
}

/// Null past the end.
const Json::Value* find_entry(unsigned index) {
  if (!gIndexFolderConf.isArray() || index >= gIndexFolderConf.size()) return nullptr;
  const auto& conf = gIndexFolderConf;
  return &conf[index];
}

int copy_to(char* buffer, int size, std::string_view text) {
  copy_text({buffer, static_cast<std::size_t>(size)}, text);
  return 1;
}

int path_at(unsigned index, char* buffer, int size) {
  const auto* entry = find_entry(index);
  if (!entry) {
    kIndexFolderLog.colon(kIndexOutOfRange, "Bad parameter: index %d out of range",
                          static_cast<int>(index));
    return -1;
  }
  if (!buffer || size < 0) {
    kIndexFolderLog.colon(kNoPathBuffer, "Bad parameter: szPath");
    return -1;
  }
  return copy_to(buffer, size, find_entry_path(*entry).value_or(""));
}

void print_entry(const Json::Value& entry) {
  const std::string path(find_entry_path(entry).value_or(""));
  kIndexFolderLog.colon(kDumpedPath, "path: %s", path.c_str());
  kIndexFolderLog.colon(kDumpedFlags, "index:%5d %5d %5d", entry_flag(entry, "photo"),
                        entry_flag(entry, "music"), entry_flag(entry, "video"));
}

}  // namespace
}  // namespace mediidx

using mediidx::kIndexFolderLog;
using mediidx::no_throw;

int loadConf() { return no_throw(kIndexFolderLog, 0, mediidx::load); }

void printIndexFolderConf() {
  no_throw(kIndexFolderLog, 0, [] {
    for (const auto& entry : gIndexFolderConf) mediidx::print_entry(entry);
    return 0;
  });
}

extern "C" int IndexFolderInit() { return loadConf(); }

extern "C" void IndexFolderUpdate() {
  if (gIsBlockUpdate) {
    gIsDirty = 1;
  } else {
    loadConf();
  }
}

extern "C" void IndexFolderConfLock() { gIsBlockUpdate = 1; }

extern "C" void IndexFolderConfUnLock() {
  mediidx::forget_folder_index();
  mediidx::let_reloads_through();
}

namespace mediidx {

void let_reloads_through() {
  gIsBlockUpdate = 0;
  if (!gIsDirty) return;
  gIsDirty = 0;
  IndexFolderUpdate();
}

}  // namespace mediidx

extern "C" void IndexFolderFree() {
  no_throw(kIndexFolderLog, 0, [] {
    if (gIndexFolderConf.isArray()) gIndexFolderConf.clear();
    return 0;
  });
}

extern "C" int IndexFolderSizeGet() {
  return gIndexFolderConf.isNull() ? 0 : static_cast<int>(gIndexFolderConf.size());
}

extern "C" int IndexFolderPathAt(unsigned index, char* buffer, int size) {
  return no_throw(kIndexFolderLog, -1, [&] { return mediidx::path_at(index, buffer, size); });
}

extern "C" int IndexFolderIsIndexTypeAt(unsigned index, int kind) {
  return no_throw(kIndexFolderLog, 0, [&] {
    const auto* entry = mediidx::find_entry(index);
    if (entry) return mediidx::entry_flag(*entry, mediidx::flag_of_kind(kind)) ? 1 : 0;
    kIndexFolderLog.colon(mediidx::kTypeIndexOutOfRange, "Bad parameter: index of out range");
    return 0;
  });
}

extern "C" int IndexFolderShareNameGet(const char* path, char* buffer, int size) {
  return no_throw(kIndexFolderLog, -1, [&] {
    if (!path || !*path || !buffer || size < 0) return -1;
    return mediidx::copy_to(buffer, size, getShareName(path));
  });
}
