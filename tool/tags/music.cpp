// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fileref.h>
#include <tfilestream.h>
#include <tpropertymap.h>

#include <algorithm>
#include <initializer_list>
#include <limits>
#include <map>

#include "tags/file_times.h"
#include "tags/music_format.h"
#include "tags/readers.h"
#include "tags/replay_gain.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

std::string clean(const TagLib::String& text) { return clean_text(text.to8Bit(true)); }

/// The values of the first of these tags that has any, each once, in their order.
std::string joined(const TagLib::PropertyMap& tags, std::initializer_list<const char*> names,
                   const char* separator) {
  for (const char* name : names) {
    std::vector<std::string> values;
    for (const auto& value : tags[name]) {
      const auto text = clean(value);
      if (!text.empty() && std::ranges::find(values, text) == values.end()) values.push_back(text);
    }
    if (values.empty()) continue;
    std::string out = values[0];
    for (std::size_t i = 1; i < values.size(); ++i) out += separator + values[i];
    return out;
  }
  return {};
}

std::string first_of(const TagLib::PropertyMap& tags, std::initializer_list<const char*> names) {
  for (const char* name : names) {
    const auto values = tags[name];
    const auto text = values.isEmpty() ? std::string() : clean(values.front());
    if (!text.empty()) return text;
  }
  return {};
}

void read_tags(const TagLib::PropertyMap& tags, MediaFile& out) {
  out.title = joined(tags, {"TITLE"}, "; ");
  out.album = first_of(tags, {"ALBUM"});
  out.artist = joined(tags, {"ARTIST", "ARTISTS"}, "; ");
  out.album_artist = joined(tags, {"ALBUMARTIST", "ALBUM ARTIST", "ALBUM_ARTIST"}, "; ");
  out.composer = joined(tags, {"COMPOSER"}, "; ");
  out.genre = joined(tags, {"GENRE"}, ";");
  out.comment = first_of(tags, {"COMMENT", "DESCRIPTION"});
  out.year = year_of(first_of(tags, {"DATE", "YEAR"}));
  out.track = leading_number(first_of(tags, {"TRACKNUMBER", "TRACK"}));
  out.disc = leading_number(first_of(tags, {"DISCNUMBER", "DISC"}));
}

/// Files with tags of several kinds: what the first kind lacks, another may have.
void fill_gaps(const TagLib::Tag& tag, MediaFile& out) {
  if (out.title.empty()) out.title = clean(tag.title());
  if (out.album.empty()) out.album = clean(tag.album());
  if (out.artist.empty()) out.artist = clean(tag.artist());
  if (out.genre.empty()) out.genre = clean(tag.genre());
  if (out.comment.empty()) out.comment = clean(tag.comment());
  constexpr unsigned kLastYear = 9999;
  if (out.year == 0 && tag.year() <= kLastYear) out.year = static_cast<int>(tag.year());
  constexpr unsigned kLastTrack = std::numeric_limits<int>::max();
  if (out.track == 0 && tag.track() <= kLastTrack) out.track = static_cast<int>(tag.track());
}

void read_properties(const TagLib::AudioProperties& audio, MediaFile& out) {
  constexpr int kKilo = 1000;
  out.duration = audio.lengthInMilliseconds() / static_cast<double>(kKilo);
  out.bitrate = std::clamp(audio.bitrate(), 0, std::numeric_limits<int>::max() / kKilo) * kKilo;
  out.frequency = std::max(audio.sampleRate(), 0);
  out.channel = std::max(audio.channels(), 0);
}

std::map<std::string, std::string> single_values(const TagLib::PropertyMap& tags) {
  std::map<std::string, std::string> out;
  for (const auto& [name, values] : tags) {
    if (!values.isEmpty()) out[name.upper().to8Bit(true)] = values.front().to8Bit(true);
  }
  return out;
}

}  // namespace

void read_music(MediaFile& file) {
  TagLib::FileStream stream(file.path.c_str(), /*openReadOnly=*/true);
  const TagLib::FileRef opened(&stream);
  const auto* audio = opened.isNull() ? nullptr : opened.audioProperties();
  if (!audio || audio->sampleRate() <= 0) return read_other_music(file);
  const auto tags = opened.file()->properties();
  read_tags(tags, file);
  fill_gaps(*opened.tag(), file);
  read_properties(*audio, file);
  const auto format = music_format(opened.file());
  file.video_codec = format.codec;
  file.container_type = format.container;
  file.covercount = format.covers;
  auto named = format.extra_tags;
  named.merge(single_values(tags));
  file.gain = replay_gain_of(named);
}

}  // namespace mediidx::tool
