// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What both ways of saving virtual tracks have in common.
#ifndef MEDIIDX_DATABASE_VIRTUAL_TRACKS_H_
#define MEDIIDX_DATABASE_VIRTUAL_TRACKS_H_

#include <string>

#include "mediidx/record.h"

namespace mediidx {

/// Where the track begins and its cue sheet, by whose path the row is found again.
std::string virtual_comment(const __tag_TAVO_MEDIA_INFO& info, const __tag_TAVO_MEDIA_INFO& cue);
/// Logs that a cue sheet has no tracks, which is no failure.
void log_no_virtual_tracks();
/// Logs that a track is not in the catalogue as a whole.
void log_virtual_track_not_related();

}  // namespace mediidx

#endif
