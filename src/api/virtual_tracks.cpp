// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "api/virtual_tracks.h"

#include <strings.h>
#include <tavoindex.h>

#include "mediidx/cue_sheet.h"
#include "mediidx/database.h"
#include "mediidx/playlist.h"
#include "support/log.h"
#include "support/owned.h"

namespace mediidx {
namespace {

constexpr int kNotParsed = 140;
constexpr int kNotSaved = 141;

bool is_cue_sheet(const char* path) {
  const char* extension = TAVOIndexExtGet(path);
  return extension && strcasecmp(extension, "cue") == 0;
}

}  // namespace

int add_virtual_tracks(__tag_TAVO_MEDIA_INFO& info, MEDIA_TABLE_TYPE type) {
  if (type != MEDIA_TABLE_PLAYLIST || !is_cue_sheet(info.path)) return 0;
  Owned<_PLAYLIST_REC, TAVOPlaylistRecFree> tracks;
  if (TAVOParseCueByPath(out(tracks), info.path) != 0) {
    kRequestLog.colon(kNotParsed, "Failed to parse cue file");
    return -1;
  }
  if (MediaInfoVirtualDBSave(tracks.get(), &info) >= 0) return 0;
  kRequestLog.colon(kNotSaved, "Failed to save shared virtual files");
  return -1;
}

}  // namespace mediidx
