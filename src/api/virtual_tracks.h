// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The tracks that a cue sheet brings with it.
#ifndef MEDIIDX_API_VIRTUAL_TRACKS_H_
#define MEDIIDX_API_VIRTUAL_TRACKS_H_

#include <optional>

#include "mediidx/playlist.h"
#include "mediidx/record.h"
#include "support/owned.h"

namespace mediidx {

/// The tracks of one sheet; null for a sheet without any.
using OwnedTracks = Owned<_PLAYLIST_REC, TAVOPlaylistRecFree>;

/// Playlists by this name have virtual tracks.
bool is_cue_sheet(const char* path);
/// Empty, and logged, when the sheet cannot be parsed.
std::optional<OwnedTracks> parse_virtual_tracks(const char* path);
/// -1, logged.
int virtual_tracks_not_saved();

/// Stores the virtual tracks of a cue sheet whose row was saved; nothing to do for any other file.
/// 0, or -1, logged, when the sheet cannot be parsed or its tracks stored; its row stays all the
/// same.
int add_virtual_tracks(__tag_TAVO_MEDIA_INFO& info, MEDIA_TABLE_TYPE type);

}  // namespace mediidx

#endif
