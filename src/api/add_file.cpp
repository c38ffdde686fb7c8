// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "api/add_file.h"

#include "api/file_path.h"
#include "api/virtual_tracks.h"
#include "mediidx/database.h"
#include "mediidx/request.h"
#include "support/log.h"

namespace mediidx {
namespace {

constexpr int kAddBadParameter = 110;
constexpr int kNotSaved = 111;
constexpr int kGainNotSaved = 112;

int save_replay_gain(const std::optional<std::array<float, 4>>& gains, std::uint32_t id) {
  if (!gains || MediaInfoAudioRGMetadataDBSave(gains->data(), id) == 0) return 0;
  kRequestLog.colon(kGainNotSaved, "Failed to save replayGain metadata.");
  return -1;
}

}  // namespace

int add_bad_parameter() {
  kRequestLog.colon(kAddBadParameter, "Bad parameter");
  return -1;
}

int file_not_saved() {
  kRequestLog.colon(kNotSaved, "Failed to save media info.");
  return -1;
}

std::optional<int> result_without_save(const char* path, MEDIA_TABLE_TYPE type) {
  if (!is_no_folder(path)) return -1;
  if (TAVOMediaIndexIsIndexPath(path, type) <= 0) return 0;
  return std::nullopt;
}

int save_file(__tag_TAVO_MEDIA_INFO& info, MEDIA_TABLE_TYPE type,
              const std::optional<std::array<float, 4>>& gains) {
  if (MediaInfoDBSave(type, &info) != 0) return file_not_saved();
  if (type == MEDIA_TABLE_MUSIC) return save_replay_gain(gains, info.id);
  return add_virtual_tracks(info, type);
}

}  // namespace mediidx
