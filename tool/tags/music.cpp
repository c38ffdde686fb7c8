// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fileref.h>
#include <tfilestream.h>

#include <algorithm>
#include <limits>

#include "tags/music_format.h"
#include "tags/named_tags.h"
#include "tags/readers.h"
#include "tags/tag_table.h"

namespace mediidx::tool {
namespace {

constexpr int kKilo = 1000;

struct Sound {
  const TagLib::AudioProperties& audio;
  const MusicFormat& format;
};

struct SoundColumn {
  ColumnText text;
  void (*store)(const Sound& sound, MediaFile& file);
};

constexpr SoundColumn kSoundColumns[] = {
    {{"duration", "the sound's length", "seconds with a fraction; the row holds whole ones"},
     [](const Sound& sound, MediaFile& file) {
       file.duration = std::max(sound.audio.lengthInMilliseconds(), 0) / static_cast<double>(kKilo);
     }},
    {{"bitrate", "the sound's mean rate", "bits a second, to the thousand"},
     [](const Sound& sound, MediaFile& file) {
       constexpr int kMost = std::numeric_limits<int>::max() / kKilo;
       file.bitrate = std::clamp(sound.audio.bitrate(), 0, kMost) * kKilo;
     }},
    {{"frequency", "the stream's header", "samples a second; of Opus always 48000"},
     [](const Sound& sound, MediaFile& file) {
       file.frequency = std::max(sound.audio.sampleRate(), 0);
     }},
    {{"channel", "the stream's header", "count"},
     [](const Sound& sound, MediaFile& file) {
       file.channel = std::max(sound.audio.channels(), 0);
     }},
    {{"codec", "the format, else the stream's header", "\"mp3\", \"flac\", \"alac\", \"pcm\", …"},
     [](const Sound& sound, MediaFile& file) { file.video_codec = sound.format.codec; }},
    {{"container", "the format", "\"mp3\", \"flac\", \"mp4\", \"ogg\", \"wav\", …"},
     [](const Sound& sound, MediaFile& file) { file.container_type = sound.format.container; }},
    {{"covercount",
      "APIC; METADATA_BLOCK_PICTURE, COVERART and FLAC's picture blocks; covr; Cover Art (…); "
      "WM/Picture; attached pictures of other containers",
      "count"},
     [](const Sound& sound, MediaFile& file) { file.covercount = sound.format.covers; }},
};

}  // namespace

std::vector<ColumnText> sound_columns() {
  std::vector<ColumnText> out;
  for (const auto& column : kSoundColumns) out.push_back(column.text);
  return out;
}

void read_music(MediaFile& file) {
  prepare_taglib();
  TagLib::FileStream stream(file.path.c_str(), /*openReadOnly=*/true);
  if (is_matroska(stream)) return read_other_music(file);
  const TagLib::FileRef opened(&stream);
  const auto* audio = opened.isNull() ? nullptr : opened.audioProperties();
  if (!audio || audio->sampleRate() <= 0) return read_other_music(file);
  const auto format = music_format(opened.file());
  store_tags(format.tags, file);
  for (const auto& column : kSoundColumns) column.store({*audio, format}, file);
}

}  // namespace mediidx::tool
