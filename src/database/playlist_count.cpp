// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/playlist_count.h"

#include "mediidx/playlist.h"

namespace mediidx {

int playlist_song_count(const char* path) {
  constexpr int kEveryEntry = MEDIIDX_KEEP_KNOWN | MEDIIDX_KEEP_UNKNOWN | MEDIIDX_KEEP_STREAMS;
  static_assert(kEveryEntry == 7);
  constexpr int kCountOnly = -1;
  int count = 0;
  ParsePlayListByFieldGivenPath(path, &count, 0, kCountOnly, "id, path", kEveryEntry);
  return count;
}

}  // namespace mediidx
