// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What an M3U file itself says of an entry, in its "#EXTINF" lines.
#ifndef MEDIIDX_PLAYLIST_EXTENDED_TAGS_H_
#define MEDIIDX_PLAYLIST_EXTENDED_TAGS_H_

#include <cstdint>
#include <string>
#include <string_view>

#include "mediidx/record.h"

namespace mediidx {

/// A whole record takes 12 KB; a long playlist's tags are kept as the few texts that they hold.
struct ExtendedTags {
  float duration_s = 0;
  std::int32_t year = 0;
  std::int32_t disc = 0;
  std::int32_t track = 0;
  std::string title;
  std::string artist;
  std::string album;
  std::string genre;

  /// Reads one line. True for a tag or comment line, false for an entry.
  bool read_line(std::string_view line);
  /// Writes what is set into a record, texts cut to their fields.
  void fill(__tag_TAVO_MEDIA_INFO& info) const;
};

}  // namespace mediidx

#endif
