// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Playlist entries as media records: looked up in the index in one batch, filtered and paged.
#ifndef MEDIIDX_PLAYLIST_PLAYLIST_RECORDS_H_
#define MEDIIDX_PLAYLIST_PLAYLIST_RECORDS_H_

#include <optional>
#include <string>

#include "mediidx/playlist.h"
#include "support/owned.h"

namespace mediidx {

using OwnedRecords = Owned<_PLAYLIST_REC, TAVOPlaylistRecFree>;

/// Which kept entries become records, and with which columns.
struct PlaylistPage {
  int offset = 0;  ///< Kept entries that are passed over.
  int limit = 0;   ///< Most records; 0 all, negative none.
  const char* fields = nullptr;
  int flags = 0;  ///< MEDIIDX_KEEP_…
};

struct PlaylistRecords {
  OwnedRecords head;
  int kept = 0;  ///< Entries kept by the flags, whatever the page.
};

/// Reads a playlist file; nothing and 0 when it cannot be read or looked up.
PlaylistRecords read_playlist_records(const std::string& playlist_path, const PlaylistPage& page);

}  // namespace mediidx

#endif
