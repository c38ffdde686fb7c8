// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Adding, removing and moving a folder; clearing what is to be indexed again.
#include <tavocore.h>

#include "api/add_folder.h"
#include "mediidx/database.h"
#include "mediidx/request.h"
#include "support/log.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

constexpr int kAddBadParameter = 510;
constexpr int kNoFolder = 511;
constexpr int kNotSaved = 512;
constexpr int kDeleteBadParameter = 520;
constexpr int kRenameBadParameter = 530;
constexpr int kReindexBadParameter = 540;

int bad_parameter(int line) {
  kRequestLog.colon(line, "Bad parameter.");
  return -1;
}

bool belongs(const char* path) {
  return TAVOMediaIndexIsIndexPath(path, MEDIA_TABLE_DIRECTORY) > 0;
}

int add_folder(const DIR_INFO_REC* folder) {
  if (!folder) {
    kRequestLog.colon(kAddBadParameter, "Bad parameter");
    return -1;
  }
  if (const auto result = result_without_save(*folder)) return *result;
  return save_folder(*folder);
}

// An empty path would name everything: it is refused wherever a tree is deleted.
int delete_tree(const char* path, int bad_parameter_line) {
  if (!path || !*path) return bad_parameter(bad_parameter_line);
  return MediaInfoDBDelete(MEDIA_TABLE_FOLDER, path);
}

/// Callers know a move into the index by its -1, whatever became of the add.
int rename_folder(const DIR_INFO_REC* folder, const char* old_path) {
  if (!folder || !old_path || !*old_path) return bad_parameter(kRenameBadParameter);
  TAVOMediaIndexDirDelete(old_path);
  if (!belongs(folder->path)) return 0;
  TAVOMediaIndexDirAdd(folder);
  return -1;
}

constexpr int zero_unless_negative(int result) { return result < 0 ? -1 : 0; }

}  // namespace

std::optional<int> result_without_save(const DIR_INFO_REC& folder) {
  if (!IsDirExist(folder.path)) {
    kRequestLog.colon(kNoFolder, "Path should be a directory, not a file: %s", folder.path);
    return -1;
  }
  if (!belongs(folder.path)) return 0;
  return std::nullopt;
}

int save_folder(const DIR_INFO_REC& folder) {
  if (DirInfoDBSave(&folder) == 0) return 0;
  kRequestLog.colon(kNotSaved, "Failed to save dir info.");
  return -1;
}

}  // namespace mediidx

using mediidx::kRequestLog;
using mediidx::no_throw;

extern "C" {

int TAVOMediaIndexDirAdd(const DIR_INFO_REC* dirInfo) {
  return no_throw(kRequestLog, -1, [&] { return mediidx::add_folder(dirInfo); });
}

int TAVOMediaIndexDirDelete(const char* path) {
  return no_throw(kRequestLog, -1,
                  [&] { return mediidx::delete_tree(path, mediidx::kDeleteBadParameter); });
}

int TAVOMediaIndexDirRename(const DIR_INFO_REC* dirInfo, const char* oldPath) {
  return no_throw(kRequestLog, -1, [&] { return mediidx::rename_folder(dirInfo, oldPath); });
}

int TAVOMediaIndexPreReindex(const char* path) {
  return no_throw(kRequestLog, -1, [&] {
    return mediidx::zero_unless_negative(mediidx::delete_tree(path, mediidx::kReindexBadParameter));
  });
}

int TAVOMediaIndexPreReindexAll() { return mediidx::zero_unless_negative(MediaInfoDBDeleteAll()); }

int TAVOMediaIndexDBClose() {
  MediaDBConnClose();
  return 0;
}

// The second name of the same function.
[[gnu::alias("TAVOMediaIndexDirAdd")]] int TAVOMediaIndexReindexDirUpdate(
    const DIR_INFO_REC* dirInfo);
}
