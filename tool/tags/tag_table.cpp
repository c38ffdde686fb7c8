// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/tag_table.h"

#include <algorithm>

#include "tags/file_times.h"
#include "tags/replay_gain.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

/// Longer than any field of the record; beyond it nothing is gathered.
constexpr std::size_t kLongestText = 4096;

std::string join(const TagValues& values, std::string_view separator) {
  std::string out;
  TagValues seen;
  for (const auto& value : values) {
    if (out.size() > kLongestText) break;
    if (std::ranges::find(seen, value) != seen.end()) continue;
    if (!seen.empty()) out += separator;
    out += value;
    seen.push_back(value);
  }
  return out;
}

template <std::string MediaFile::* kField>
bool all(const TagValues& values, MediaFile& file) {
  file.*kField = join(values, "; ");
  return true;
}

bool genres(const TagValues& values, MediaFile& file) {
  file.genre = join(values, ";");
  return true;
}

template <std::string MediaFile::* kField>
bool first(const TagValues& values, MediaFile& file) {
  file.*kField = values.front();
  return true;
}

template <int MediaFile::* kField, int (*kParse)(std::string_view)>
bool number(const TagValues& values, MediaFile& file) {
  file.*kField = kParse(values.front());
  return file.*kField > 0;
}

/// Of two rows for one column the later fills what the earlier left.
template <std::optional<double> ReplayGain::* kField,
          std::optional<double> (*kParse)(std::string_view)>
bool gain(const TagValues& values, MediaFile& file) {
  auto& field = file.gain.*kField;
  if (!field) field = kParse(values.front());
  return field.has_value();
}

constexpr std::string_view kAll = "all values, each once, joined by \"; \"";
constexpr std::string_view kAllGenres = "all values, each once, joined by \";\"";
constexpr std::string_view kFirst = "the first value";
constexpr std::string_view kNumber = "the number that it begins with: 3 of \"3/12\"";
constexpr std::string_view kYear = "the year that it begins with: 2004 of \"2004-05\"";
constexpr std::string_view kGain = "decibels";
constexpr std::string_view kPeak = "a share of full scale";
constexpr std::string_view kR128 =
    "1/256 dB against -23 LUFS: 5 dB are added; for want of the above";

// The families in their order: ID3v2, ID3v1, Vorbis comments, MP4, APE, ASF, RIFF INFO, others.
const MusicColumn kMusicColumns[] = {
    {"title",
     kAll,
     all<&MediaFile::title>,
     {"TIT2", "title", "TITLE", "©nam", "Title", "Title", "INAM", "title"}},
    {"album",
     kFirst,
     first<&MediaFile::album>,
     {"TALB", "album", "ALBUM", "©alb", "Album", "WM/AlbumTitle", "IPRD", "album"}},
    {"artist",
     kAll,
     all<&MediaFile::artist>,
     {"TPE1, TXXX:ARTISTS", "artist", "ARTIST, ARTISTS", "©ART, ----:ARTISTS", "Artist, Artists",
      "Author, WM/ARTISTS", "IART", "artist, author"}},
    {"album_artist",
     kAll,
     all<&MediaFile::album_artist>,
     {"TPE2, TXXX:ALBUMARTIST, TXXX:ALBUM ARTIST, TXXX:ALBUM_ARTIST, TXXX:BAND", "",
      "ALBUMARTIST, ALBUM ARTIST, ALBUM_ARTIST, BAND",
      "aART, ----:ALBUMARTIST, ----:ALBUM ARTIST, ----:BAND",
      "Album Artist, AlbumArtist, Album_Artist, Band",
      "WM/AlbumArtist, AlbumArtist, Album Artist, Band", "IAAR",
      "album_artist, albumartist, album artist, band"}},
    {"genre",
     kAllGenres,
     genres,
     {"TCON", "genre", "GENRE", "©gen", "Genre", "WM/Genre", "IGNR", "genre"}},
    {"composer",
     kAll,
     all<&MediaFile::composer>,
     {"TCOM", "", "COMPOSER", "©wrt", "Composer", "WM/Composer", "IMUS", "composer"}},
    {"comment",
     kFirst,
     first<&MediaFile::comment>,
     {"COMM, COMM:ID3v1 Comment, TXXX:COMMENT", "comment", "COMMENT, DESCRIPTION", "©cmt",
      "Comment", "Description", "ICMT", "comment, description"}},
    {"year",
     kYear,
     number<&MediaFile::year, year_of>,
     {"TDRC, TDRL, TXXX:DATE, TXXX:YEAR", "year", "DATE, YEAR", "©day", "Year, Date", "WM/Year",
      "ICRD", "date, year"}},
    {"track",
     kNumber,
     number<&MediaFile::track, leading_number>,
     {"TRCK", "track", "TRACKNUMBER, TRACK", "trkn", "Track", "WM/TrackNumber", "IPRT, ITRK",
      "track"}},
    {"disc",
     kNumber,
     number<&MediaFile::disc, leading_number>,
     {"TPOS", "", "DISCNUMBER, DISC", "disk", "Disc, Discnumber", "WM/PartOfSet", "", "disc"}},
    {"rg_track_gain",
     kGain,
     gain<&ReplayGain::track_gain, parse_gain>,
     {"TXXX:REPLAYGAIN_TRACK_GAIN, RVA2:track gain", "", "REPLAYGAIN_TRACK_GAIN",
      "----:REPLAYGAIN_TRACK_GAIN", "REPLAYGAIN_TRACK_GAIN, (Musepack header) track gain",
      "REPLAYGAIN_TRACK_GAIN", "", "REPLAYGAIN_TRACK_GAIN"}},
    {"rg_track_peak",
     kPeak,
     gain<&ReplayGain::track_peak, parse_peak>,
     {"TXXX:REPLAYGAIN_TRACK_PEAK, RVA2:track peak", "", "REPLAYGAIN_TRACK_PEAK",
      "----:REPLAYGAIN_TRACK_PEAK", "REPLAYGAIN_TRACK_PEAK, (Musepack header) track peak",
      "REPLAYGAIN_TRACK_PEAK", "", "REPLAYGAIN_TRACK_PEAK"}},
    {"rg_album_gain",
     kGain,
     gain<&ReplayGain::album_gain, parse_gain>,
     {"TXXX:REPLAYGAIN_ALBUM_GAIN, RVA2:album gain", "", "REPLAYGAIN_ALBUM_GAIN",
      "----:REPLAYGAIN_ALBUM_GAIN", "REPLAYGAIN_ALBUM_GAIN, (Musepack header) album gain",
      "REPLAYGAIN_ALBUM_GAIN", "", "REPLAYGAIN_ALBUM_GAIN"}},
    {"rg_album_peak",
     kPeak,
     gain<&ReplayGain::album_peak, parse_peak>,
     {"TXXX:REPLAYGAIN_ALBUM_PEAK, RVA2:album peak", "", "REPLAYGAIN_ALBUM_PEAK",
      "----:REPLAYGAIN_ALBUM_PEAK", "REPLAYGAIN_ALBUM_PEAK, (Musepack header) album peak",
      "REPLAYGAIN_ALBUM_PEAK", "", "REPLAYGAIN_ALBUM_PEAK"}},
    {"rg_track_gain",
     kR128,
     gain<&ReplayGain::track_gain, parse_r128_gain>,
     {"", "", "R128_TRACK_GAIN", "", "", "", "", "R128_TRACK_GAIN"}},
    {"rg_album_gain",
     kR128,
     gain<&ReplayGain::album_gain, parse_r128_gain>,
     {"", "", "R128_ALBUM_GAIN", "", "", "", "", "R128_ALBUM_GAIN"}},
};

const MusicFormatTags kMusicFormats[] = {
    {"MP3 and other MPEG audio", {TagFamily::kId3v2, TagFamily::kApe, TagFamily::kId3v1}},
    {"FLAC", {TagFamily::kVorbis, TagFamily::kId3v2, TagFamily::kId3v1}},
    {"MP4", {TagFamily::kMp4}},
    {"ASF (WMA)", {TagFamily::kAsf}},
    {"WAV", {TagFamily::kId3v2, TagFamily::kRiffInfo}},
    {"AIFF", {TagFamily::kId3v2}},
    {"Ogg Vorbis", {TagFamily::kVorbis}},
    {"Ogg Opus", {TagFamily::kVorbis}},
    {"Ogg FLAC", {TagFamily::kVorbis}},
    {"Speex", {TagFamily::kVorbis}},
    {"Monkey's Audio", {TagFamily::kApe, TagFamily::kId3v1}},
    {"WavPack", {TagFamily::kApe, TagFamily::kId3v1}},
    {"Musepack", {TagFamily::kApe, TagFamily::kId3v1}},
    {"True Audio", {TagFamily::kId3v2, TagFamily::kId3v1}},
    {"DSF, AAC and others with ID3v2", {TagFamily::kId3v2}},
};

std::string upper(std::string_view text) {
  std::string out(text);
  std::ranges::transform(out, out.begin(), [](unsigned char c) {
    return static_cast<char>(c >= 'a' && c <= 'z' ? c - 'a' + 'A' : c);
  });
  return out;
}

TagValues clean_values(const TagValues& values) {
  TagValues out;
  for (const auto& value : values) {
    auto text = clean_text(value);
    if (!text.empty()) out.push_back(std::move(text));
  }
  return out;
}

bool store_from(const NamedTags& source, const MusicColumn& column, MediaFile& file) {
  bool stored = false;
  for_each_name(column.tags[static_cast<std::size_t>(source.family)], [&](std::string_view name) {
    const auto found = stored ? source.values.end() : source.values.find(upper(name));
    if (found == source.values.end()) return;
    const auto values = clean_values(found->second);
    stored = !values.empty() && column.store(values, file);
  });
  return stored;
}

}  // namespace

std::string_view family_name(TagFamily family) {
  static constexpr std::array<std::string_view, kTagFamilies> kNames{
      "ID3v2", "ID3v1", "Vorbis comments", "MP4", "APE", "ASF", "RIFF INFO", "others"};
  return kNames[static_cast<std::size_t>(family)];
}

void NamedTags::add(std::string_view name, std::string value) {
  values[upper(name)].push_back(std::move(value));
}

std::span<const MusicColumn> music_columns() { return kMusicColumns; }
std::span<const MusicFormatTags> music_formats() { return kMusicFormats; }

void store_tags(const std::vector<NamedTags>& sources, MediaFile& file) {
  for (const auto& column : kMusicColumns) {
    for (const auto& source : sources) {
      if (store_from(source, column, file)) break;
    }
  }
}

}  // namespace mediidx::tool
