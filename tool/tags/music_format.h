// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What differs from one music format to the next.
#ifndef MEDIIDX_TOOL_TAGS_MUSIC_FORMAT_H_
#define MEDIIDX_TOOL_TAGS_MUSIC_FORMAT_H_

#include <tfile.h>

#include <string>
#include <vector>

#include "tags/tag_table.h"

namespace mediidx::tool {

/// What the class of an opened file tells.
struct MusicFormat {
  std::string codec;            ///< "mp3", "flac", "alac", "vorbis", "pcm", …
  std::string container;        ///< "mp3", "flac", "mp4", "ogg", "wav", …
  int covers = 0;               ///< Embedded pictures.
  std::vector<NamedTags> tags;  ///< In the order in which they count.
};

/// Whether it is for libavformat alone: TagLib takes what stands further on in such a file for the
/// beginning of another format.
bool is_matroska(TagLib::IOStream& stream);

/// Empty names for a format that is not known.
MusicFormat music_format(TagLib::File* file);

}  // namespace mediidx::tool

#endif
