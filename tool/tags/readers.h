// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The readers of each kind of file. Each fills what the file's content tells, throws ReadError
/// for a file that is not what its name says, and may let out what its library throws.
#ifndef MEDIIDX_TOOL_TAGS_READERS_H_
#define MEDIIDX_TOOL_TAGS_READERS_H_

#include "tags/media_file.h"

namespace mediidx::tool {

void read_music(MediaFile& file);
void read_photo(MediaFile& file);
void read_video(MediaFile& file);
/// Music in containers that the tag library does not know.
void read_other_music(MediaFile& file);

}  // namespace mediidx::tool

#endif
