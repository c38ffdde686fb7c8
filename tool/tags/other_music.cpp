// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tfilestream.h>

#include "tags/av_input.h"
#include "tags/id3_file.h"
#include "tags/music_format.h"
#include "tags/readers.h"
#include "tags/tag_table.h"

namespace mediidx::tool {
namespace {

/// What libavformat reads of ID3v2 is a part of it. False when there is none.
bool read_id3(MediaFile& file) {
  TagLib::FileStream stream(file.path.c_str(), /*openReadOnly=*/true);
  Id3File id3(&stream);
  const auto format = music_format(&id3);
  store_tags(format.tags, file);
  file.covercount = format.covers;
  return !format.tags.empty();
}

}  // namespace

void read_other_music(MediaFile& file) {
  const AvInput input(file.path);
  const auto* audio = input.first_stream(AVMEDIA_TYPE_AUDIO);
  if (!audio || audio->codecpar->sample_rate <= 0) throw ReadError("it has no sound");
  file.duration = input.duration_s();
  file.bitrate = bit_rate_of(audio);
  if (file.bitrate == 0) file.bitrate = input.bit_rate();
  file.frequency = to_int(audio->codecpar->sample_rate);
  file.channel = to_int(audio->codecpar->ch_layout.nb_channels);
  file.video_codec = codec_of(audio);
  file.container_type = input.container(file.path);
  if (read_id3(file)) return;
  const auto tags = input.tags();
  store_tags({tags}, file);
  file.covercount = tags.covers;
}

}  // namespace mediidx::tool
