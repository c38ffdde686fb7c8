// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "api/virtual_tracks.h"

#include <strings.h>
#include <tavoindex.h>

#include "mediidx/cue_sheet.h"
#include "mediidx/database.h"
#include "support/log.h"

namespace mediidx {
namespace {

constexpr int kNotParsed = 140;
constexpr int kNotSaved = 141;

}  // namespace

bool is_cue_sheet(const char* path) {
  const char* extension = TAVOIndexExtGet(path);
  return extension && strcasecmp(extension, "cue") == 0;
}

std::optional<OwnedTracks> parse_virtual_tracks(const char* path) {
  OwnedTracks tracks;
  const int result = TAVOParseCueByPath(out(tracks), path);
  if (result == 0) return tracks;
  kRequestLog.colon(kNotParsed, "Failed to parse cue file");
  return std::nullopt;
}

int virtual_tracks_not_saved() {
  kRequestLog.colon(kNotSaved, "Failed to save shared virtual files");
  return -1;
}

int add_virtual_tracks(__tag_TAVO_MEDIA_INFO& info, MEDIA_TABLE_TYPE type) {
  if (type != MEDIA_TABLE_PLAYLIST || !is_cue_sheet(info.path)) return 0;
  const auto tracks = parse_virtual_tracks(info.path);
  if (!tracks) return -1;
  return MediaInfoVirtualDBSave(tracks->get(), &info) >= 0 ? 0 : virtual_tracks_not_saved();
}

}  // namespace mediidx
