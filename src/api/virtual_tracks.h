// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The tracks that a cue sheet brings with it.
#ifndef MEDIIDX_API_VIRTUAL_TRACKS_H_
#define MEDIIDX_API_VIRTUAL_TRACKS_H_

#include "mediidx/record.h"

namespace mediidx {

/// Stores the virtual tracks of a cue sheet whose row was saved; nothing to do for any other file.
/// 0, or -1, logged, when the sheet cannot be parsed or its tracks stored; its row stays all the
/// same.
int add_virtual_tracks(__tag_TAVO_MEDIA_INFO& info, MEDIA_TABLE_TYPE type);

}  // namespace mediidx

#endif
