// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What differs from one music format to the next.
#ifndef MEDIIDX_TOOL_TAGS_MUSIC_FORMAT_H_
#define MEDIIDX_TOOL_TAGS_MUSIC_FORMAT_H_

#include <tfile.h>

#include <map>
#include <string>

namespace mediidx::tool {

/// What the class of an opened file tells.
struct MusicFormat {
  std::string codec;      ///< "mp3", "flac", "alac", "vorbis", "pcm", …
  std::string container;  ///< "mp3", "flac", "mp4", "ogg", "wav", …
  int covers = 0;         ///< Embedded pictures.
  /// Tags under names of their own that the library's property map leaves out, in upper case.
  std::map<std::string, std::string> extra_tags;
};

/// Empty names for a format that is not known.
MusicFormat music_format(TagLib::File* file);

}  // namespace mediidx::tool

#endif
