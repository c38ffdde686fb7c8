// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Adding, removing and moving a file.
#include <tavocore.h>
#include <tavoindex.h>

#include <memory>
#include <optional>

#include "api/add_file.h"
#include "api/file_path.h"
#include "api/replay_gain.h"
#include "mediidx/database.h"
#include "mediidx/request.h"
#include "support/log.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

using Record = __tag_TAVO_MEDIA_INFO;

constexpr int kStillThere = 120;
constexpr int kNotRemoved = 121;
constexpr int kRenameBadParameter = 130;

bool belongs(const char* path, MEDIA_TABLE_TYPE type) {
  return TAVOMediaIndexIsIndexPath(path, type) > 0;
}

int add(Record* info, MEDIA_TABLE_TYPE type) {
  if (!info) return add_bad_parameter();
  if (const auto result = result_without_save(info->path, type)) return *result;
  return save_file(*info, type);
}

int add(const Json::Value& json, MEDIA_TABLE_TYPE type) {
  const char* path = find_path(json);
  if (!path) return add_bad_parameter();
  if (const auto result = result_without_save(path, type)) return *result;
  const auto info = std::make_unique<Record>();
  if (MediaInfoJson2Object(json, info.get()) != 0) return file_not_saved();
  return save_file(*info, type, find_replay_gain(json));
}

/// What a file of this extension is; nothing when it is no medium.
std::optional<MEDIA_TABLE_TYPE> type_of(const char* extension) {
  if (BlTAVOIndexIsMusic(extension)) return MEDIA_TABLE_MUSIC;
  if (BlTAVOIndexIsPlaylist(extension)) return MEDIA_TABLE_PLAYLIST;
  if (BlTAVOIndexIsPhoto(extension)) return MEDIA_TABLE_PHOTO;
  if (BlTAVOIndexIsVideo(extension)) return MEDIA_TABLE_VIDEO;
  return std::nullopt;
}

int remove(const char* path) {
  if (IsFileExist(path, 0)) {
    kRequestLog.note(kStillThere, "File exists. Skip remove it from database.");
    return -1;
  }
  const char* extension = TAVOIndexExtGet(path);
  if (!extension) return 0;
  const auto type = type_of(extension);
  if (!type || MediaInfoDBDelete(*type, path) == 0) return 0;
  kRequestLog.colon(kNotRemoved, "Failed to remove [%s] from database", path);
  return -1;
}

/// Callers know a move into the index by its -1, whatever became of the add.
template <class Media>
int rename(Media&& media, const char* new_path, MEDIA_TABLE_TYPE type, const char* old_path) {
  if (!new_path || !old_path || !*old_path) {
    kRequestLog.colon(kRenameBadParameter, "Bad parameter.");
    return -1;
  }
  if (!is_no_folder(new_path)) return -1;
  TAVOMediaIndexDelete(old_path);
  if (!belongs(new_path, type)) return 0;
  add(media, type);
  return -1;
}

}  // namespace
}  // namespace mediidx

using mediidx::kRequestLog;
using mediidx::no_throw;

extern "C" {

int TAVOMediaIndexAdd(__tag_TAVO_MEDIA_INFO* info, MEDIA_TABLE_TYPE type) {
  return no_throw(kRequestLog, -1, [&] { return mediidx::add(info, type); });
}

int TAVOMediaIndexAdd_Json(const Json::Value& json, MEDIA_TABLE_TYPE type) {
  return no_throw(kRequestLog, -1, [&] { return mediidx::add(json, type); });
}

int TAVOMediaIndexDelete(const char* path) {
  return no_throw(kRequestLog, -1, [&] { return mediidx::remove(path); });
}

int TAVOMediaIndexRename(__tag_TAVO_MEDIA_INFO* info, MEDIA_TABLE_TYPE type, const char* oldPath) {
  return no_throw(kRequestLog, -1, [&] {
    return mediidx::rename(info, info ? info->path : nullptr, type, oldPath);
  });
}

int TAVOMediaIndexRename_Json(const Json::Value& json, MEDIA_TABLE_TYPE type, const char* oldPath) {
  return no_throw(kRequestLog, -1,
                  [&] { return mediidx::rename(json, mediidx::find_path(json), type, oldPath); });
}

// Second names of the same functions.
[[gnu::alias("TAVOMediaIndexAdd")]] int TAVOMediaIndexReindexUpdate(__tag_TAVO_MEDIA_INFO* info,
                                                                    MEDIA_TABLE_TYPE type);
[[gnu::alias("TAVOMediaIndexAdd_Json")]] int TAVOMediaIndexReindexUpdate_Json(
    const Json::Value& json, MEDIA_TABLE_TYPE type);
}
