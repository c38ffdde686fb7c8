// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Playlist files: lines, their character set, and the resolved entries that they hold.
#ifndef MEDIIDX_PLAYLIST_PLAYLIST_FILE_H_
#define MEDIIDX_PLAYLIST_PLAYLIST_FILE_H_

#include <functional>
#include <optional>
#include <string>

#include "playlist/entry_readers.h"

namespace mediidx {

/// Takes an entry's absolute path, and what an M3U file says of it.
using EntryVisitor = std::function<void(std::string path, ExtendedTags tags)>;

/// Visits the entries of a file that resolve, in file order. Lines that are no UTF-8 are converted
/// from the configured code page. False when the file cannot be opened or read to its end.
bool read_playlist(const std::string& playlist_path, PlaylistFormat format,
                   const EntryVisitor& visit);

/// The number of entries that resolve, in little memory whatever their number; 0 when the file
/// cannot be read.
int count_playlist_entries(const std::string& playlist_path, PlaylistFormat format);

}  // namespace mediidx

#endif
