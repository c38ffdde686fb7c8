// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The playlist formats, line by line; no files, no look-ups.
#ifndef MEDIIDX_PLAYLIST_ENTRY_READERS_H_
#define MEDIIDX_PLAYLIST_ENTRY_READERS_H_

#include <optional>
#include <string>
#include <string_view>

#include "playlist/extended_tags.h"

namespace mediidx {

enum class PlaylistFormat { kM3u, kPls, kWpl };

/// The format that a path's extension names, by its first three characters; empty for another one.
/// The path must hold a ".".
std::optional<PlaylistFormat> playlist_format(std::string_view path);

/// Removes the line's end, and from an M3U line its byte-order mark, which comes before any
/// conversion.
std::string_view clean_line(std::string_view line, PlaylistFormat format);

/// The entry of a "File…=" line; empty for any other line.
std::optional<std::string> read_pls_line(std::string_view line);

/// The value of a line's "media src", entities resolved; empty when there is none or it has no end.
std::optional<std::string> read_wpl_line(std::string_view line);

/// Reads M3U lines in order: tag lines collect until the entry that they belong to.
class M3uReader {
 public:
  /// The entry of a line; empty for a tag, comment or blank line.
  std::optional<std::string> read_line(std::string_view line);
  /// What the tag lines since the last call said; forgotten with the call.
  ExtendedTags take_tags();

 private:
  ExtendedTags tags_;
};

}  // namespace mediidx

#endif
