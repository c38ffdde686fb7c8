// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/extended_tags.h"

#include <algorithm>
#include <cstdlib>
#include <limits>

#include "support/text.h"

namespace mediidx {
namespace {

/// Takes `prefix` off the line when it begins with it.
bool take(std::string_view& line, std::string_view prefix) {
  if (!line.starts_with(prefix)) return false;
  line.remove_prefix(prefix.size());
  return true;
}

std::int32_t number(std::string_view text) {
  const long value = std::strtol(std::string(text).c_str(), nullptr, 10);
  using Range = std::numeric_limits<std::int32_t>;
  return static_cast<std::int32_t>(
      std::clamp(value, static_cast<long>(Range::min()), static_cast<long>(Range::max())));
}

}  // namespace

bool ExtendedTags::read_line(std::string_view line) {
  if (take(line, "#EXTINF:")) {
    duration_s = static_cast<float>(number(line));
    const auto comma = line.find(',');
    if (comma != line.npos) title = line.substr(comma + 1);
    return true;
  }
  if (take(line, "#EXTINFARTIST:")) return artist = line, true;
  if (take(line, "#EXTINFALBUM:")) return album = line, true;
  if (take(line, "#EXTINFGENRE:")) return genre = line, true;
  if (take(line, "#EXTINFYEAR:")) return year = number(line), true;
  if (take(line, "#EXTINFDISC:")) return disc = number(line), true;
  if (take(line, "#EXTINFTRACK:")) return track = number(line), true;
  return line.starts_with('#');
}

void ExtendedTags::fill(__tag_TAVO_MEDIA_INFO& info) const {
  info.duration = duration_s;
  info.year = year;
  info.disc = disc;
  info.track = track;
  copy_text(info.title, title);
  copy_text(info.artist, artist);
  copy_text(info.album, album);
  copy_text(info.genre, genre);
}

}  // namespace mediidx
