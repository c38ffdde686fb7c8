// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What both ways of saving files have in common.
#ifndef MEDIIDX_DATABASE_MEDIA_SAVE_H_
#define MEDIIDX_DATABASE_MEDIA_SAVE_H_

namespace mediidx {

/// Logs that a song is not in the catalogue as a whole.
void log_song_not_related();

}  // namespace mediidx

#endif
