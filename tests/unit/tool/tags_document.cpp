// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags_document.h"

#include "tags/tag_table.h"

namespace mediidx::test {
namespace {

using tool::ColumnText;

constexpr SampledFormat kMusic[] = {
    {"MP3 and other MPEG audio", "ffmpeg, mutagen", false},
    {"FLAC", "flac, metaflac, mutagen", false},
    {"MP4", "ffmpeg (AAC, ALAC), mutagen", false},
    {"ASF (WMA)", "ffmpeg, mutagen", false},
    {"WAV", "ffmpeg, mutagen", false},
    {"AIFF", "ffmpeg, mutagen", false},
    {"Ogg Vorbis", "oggenc, mutagen", false},
    {"Ogg Opus", "opusenc, mutagen", false},
    {"Ogg FLAC", "flac, mutagen", false},
    {"Speex", "ffmpeg, mutagen", false},
    {"Monkey's Audio", "our own writer, without sound; mutagen", true},
    {"WavPack", "wavpack, wvtag, mutagen", false},
    {"Musepack", "mpcenc, mpcgain, mutagen (version 8; version 7 never tried)", false},
    {"True Audio", "ffmpeg, mutagen", false},
    {"DSF, AAC and others with ID3v2", "our own writer (DSF), ffmpeg (AAC); mutagen", true},
    {"Matroska audio", "ffmpeg", false},
    {"AC-3, AU, DTS, RealAudio", "ffmpeg", false},
    {"AMR, DFF, TAK", "never tried", true},
};

constexpr SampledFormat kPhotos[] = {
    {"JPEG", "ffmpeg, exiv2", false},
    {"PNG", "ffmpeg, exiv2", false},
    {"TIFF", "ffmpeg, exiv2", false},
    {"WebP", "ffmpeg, exiv2", false},
    {"GIF, BMP, AVIF", "ffmpeg; of these the size only", false},
    {"HEIC", "heif-enc, for the size; our own writer, for the settings", true},
    {"DNG, NEF", "a TIFF of ffmpeg's, with settings of exiv2's", true},
    {"CR2, ORF", "our own writer, for the settings", true},
    {"other raw files", "never tried", true},
};

constexpr SampledFormat kVideos[] = {
    {"MP4, QuickTime, Matroska, WebM, AVI, ASF (WMV), FLV, MPEG, MPEG-TS", "ffmpeg", false},
    {"other containers", "never tried", true},
};

constexpr std::string_view kBeginning = R"(# Tags

Which tag of which format feeds which column. This file is printed from the tables by which
`mediidx` reads, in `tool/tags`; a test fails when they differ. After a change of a table:
`ninja -C build-test tags_document`.

Names of tags match whatever their case. Where a cell names several, the first that tells something
counts. Values lose control characters and white space at both ends, and are cut to the 254 bytes
(19 of exposure and aperture, 99 of the camera) that a record holds.

## Music

)";

constexpr std::string_view kMusicNotes = R"(
A song without a title is named after its file. `mediidx inspect` shows a song's tags under the names
that TagLib has for those of all formats (`ALBUMARTIST` for `TPE2`).

Gains: without a track gain none is stored. The gain of an Opus header is no part of them: players
apply it in any case, and the R128 tags count from there. Of ASF, several values stand in the order
in which the file has them, which need not be the order in which they were written. The slash that
some programs put between several values of ID3v2.3 is left as it is, for it stands in names too.

### Character sets

ID3 text that claims to be Latin-1, ID3v1, RIFF INFO, and tags of video containers that are not
valid UTF-8 are read as

1. UTF-8, where they are valid UTF-8;
2. else the code page that is set (`mediidx doctor` tells which), where there is one and the text is
   valid in it, unless it is plainly Latin-1: under a code page of another script than Latin, a text
   with accented letters among ASCII letters and no word of several accented letters alone;
3. else Latin-1.

### What the sound tells

)";

constexpr std::string_view kFormatsHead = R"(
### Formats

What the first tags do not tell, the next may. Column by column, not tag by tag: the title may come
from the first and the artist from the next.

)";

constexpr std::string_view kDevices = R"(
No camera, phone or recorder has made any of the samples. Formats marked † are those whose samples
were not made by a program of the format either, or that have none: never tried on a device's own
file.
)";

constexpr std::string_view kPhotosHead = R"(
## Photos

)";

constexpr std::string_view kPhotoNotes = R"(
The album is the folder's name.

Width and height are those of the picture as people see it: where its orientation is a quarter turn
(5 to 8), they change places, for nothing else in a row tells the orientation. The time taken is the
clock of the camera, as it stands, also where a zone is given (OffsetTimeOriginal): the column has
no zone, and photos of one day stay in one day. `mediidx inspect` shows the zone among the tags.

)";

constexpr std::string_view kVideosHead = R"(
## Videos

What FFmpeg's libavformat tells of the container and of two streams: the picture that a player would
choose, and the first sound. A cover is no picture.

)";

constexpr std::string_view kVideoNotes = R"(
What is not known is 0 or empty. A video's width and height are those of its stream, beside its
codec, profile and level: of a film that is to be turned too.

)";

std::string row(std::initializer_list<std::string_view> cells) {
  std::string out = "|";
  for (const auto cell : cells) out += " " + std::string(cell) + " |";
  return out + "\n";
}

std::string rule(std::size_t cells) {
  std::string out = "|";
  for (std::size_t i = 0; i < cells; ++i) out += "---|";
  return out + "\n";
}

/// Each name as code.
std::string names_text(std::string_view names) {
  std::string out;
  tool::for_each_name(names, [&out](std::string_view name) {
    out += out.empty() ? "`" : ", `";
    out += name;
    out += '`';
  });
  return out;
}

std::string music_matrix() {
  std::string out = "| Column |";
  for (std::size_t i = 0; i < tool::kTagFamilies; ++i) {
    out += " " + std::string(family_name(static_cast<tool::TagFamily>(i))) + " |";
  }
  out += "\n" + rule(tool::kTagFamilies + 1);
  for (const auto& column : tool::music_columns()) {
    out += "| " + std::string(column.column) + " |";
    for (const auto names : column.tags) out += " " + names_text(names) + " |";
    out += "\n";
  }
  out += "\n" + row({"Column", "What is stored"}) + rule(2);
  for (const auto& column : tool::music_columns()) out += row({column.column, column.reading});
  return out;
}

std::string columns(std::span<const ColumnText> texts) {
  auto out = row({"Column", "From", "What is stored"}) + rule(3);
  for (const auto& text : texts) out += row({text.column, text.source, text.reading});
  return out;
}

std::string marked(const SampledFormat& format) {
  return std::string(format.name) + (format.is_foreign ? " †" : "");
}

std::string music_formats() {
  auto out = row({"Format", "Tags, in their order", "Samples made by"}) + rule(3);
  const auto formats = tool::music_formats();
  for (std::size_t i = 0; i < std::size(kMusic); ++i) {
    std::string families;
    if (i < formats.size()) {
      for (const auto family : formats[i].families) {
        families += (families.empty() ? "" : ", ") + std::string(family_name(family));
      }
    } else {
      families = family_name(tool::TagFamily::kOther);
    }
    out += row({marked(kMusic[i]), families, kMusic[i].samples});
  }
  return out;
}

std::string sampled(std::span<const SampledFormat> formats) {
  auto out = row({"Format", "Samples made by"}) + rule(2);
  for (const auto& format : formats) out += row({marked(format), format.samples});
  return out;
}

}  // namespace

std::span<const SampledFormat> sampled_music() { return kMusic; }

std::string tags_document() {
  std::string out(kBeginning);
  out += music_matrix();
  out += kMusicNotes;
  out += columns(tool::sound_columns());
  out += kFormatsHead;
  out += music_formats();
  out += kDevices;
  out += kPhotosHead;
  out += columns(tool::photo_columns());
  out += kPhotoNotes;
  out += sampled(kPhotos);
  out += kVideosHead;
  out += columns(tool::video_columns());
  out += kVideoNotes;
  return out + sampled(kVideos);
}

}  // namespace mediidx::test
