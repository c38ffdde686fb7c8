// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A file's tags as they stand in it.
#ifndef MEDIIDX_TOOL_EXPLAIN_RAW_TAGS_H_
#define MEDIIDX_TOOL_EXPLAIN_RAW_TAGS_H_

#include <string>
#include <vector>

#include "tags/media_file.h"

namespace mediidx::tool {

struct RawTag {
  std::string name;   ///< As the library that reads the format calls it.
  std::string value;  ///< Any bytes. A tag of several values stands here several times.
};

/// The tags of a file that read_media_file could read; none of playlists. Pictures and other data
/// are left out.
std::vector<RawTag> raw_tags(const std::string& path, Kind kind);

}  // namespace mediidx::tool

#endif
