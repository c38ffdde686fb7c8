// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The song count of a playlist row.
#ifndef MEDIIDX_DATABASE_PLAYLIST_COUNT_H_
#define MEDIIDX_DATABASE_PLAYLIST_COUNT_H_

namespace mediidx {

/// The entries of the playlist file that resolve; 0 when it cannot be read.
int playlist_song_count(const char* path);

}  // namespace mediidx

#endif
