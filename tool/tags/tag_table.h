// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Which tag of which format feeds which column: the tables by which files are read, and from which
/// docs/tags.md is made.
#ifndef MEDIIDX_TOOL_TAGS_TAG_TABLE_H_
#define MEDIIDX_TOOL_TAGS_TAG_TABLE_H_

#include <algorithm>
#include <array>
#include <map>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "tags/media_file.h"

namespace mediidx::tool {

/// Kinds of tags that have names of their own.
enum class TagFamily { kId3v2, kId3v1, kVorbis, kMp4, kApe, kAsf, kRiffInfo, kOther };
inline constexpr std::size_t kTagFamilies = 8;
std::string_view family_name(TagFamily family);

using TagValues = std::vector<std::string>;

/// A file's tags of one family.
struct NamedTags {
  TagFamily family;
  std::map<std::string, TagValues> values;  ///< By name in upper case; any bytes.
  int covers = 0;                           ///< Embedded pictures.

  void add(std::string_view name, std::string value);
};

/// Calls `visit` with each of the names in a text of them: "TPE2, TXXX:BAND".
template <class Visit>
void for_each_name(std::string_view names, Visit visit) {
  constexpr std::string_view kBetween = ", ";
  while (!names.empty()) {
    const auto end = std::min(names.find(kBetween), names.size());
    visit(names.substr(0, end));
    names.remove_prefix(std::min(end + kBetween.size(), names.size()));
  }
}

/// A column of music, and the tags that feed it.
struct MusicColumn {
  std::string_view column;
  std::string_view reading;  ///< What becomes of the values, in words.
  /// Stores clean values that are not empty; false when they tell nothing.
  bool (*store)(const TagValues& values, MediaFile& file);
  /// Names in the order in which they are looked for, separated by ", "; one text for each family.
  std::array<std::string_view, kTagFamilies> tags;
};
std::span<const MusicColumn> music_columns();

/// The music formats whose tags TagLib reads.
enum class MusicFormatId {
  kMpeg,
  kFlac,
  kMp4,
  kAsf,
  kWav,
  kAiff,
  kVorbis,
  kOpus,
  kOggFlac,
  kSpeex,
  kMonkey,
  kWavPack,
  kMusepack,
  kTrueAudio,
  kOtherId3,
};
struct MusicFormatTags {
  std::string_view name;
  /// In their order: what the first do not tell, the next may.
  std::vector<TagFamily> families;
};
/// In the order of MusicFormatId.
std::span<const MusicFormatTags> music_formats();

/// Fills the columns of music: of several sources, the first that has something to tell.
void store_tags(const std::vector<NamedTags>& sources, MediaFile& file);

/// A column as the documents describe it.
struct ColumnText {
  std::string_view column;
  std::string_view source;
  std::string_view reading;
};
/// In photo.cpp and video.cpp.
std::vector<ColumnText> photo_columns();
std::vector<ColumnText> video_columns();
/// In music.cpp: what the sound itself tells.
std::vector<ColumnText> sound_columns();

}  // namespace mediidx::tool

#endif
