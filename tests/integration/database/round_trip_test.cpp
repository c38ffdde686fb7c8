// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// A record in, a row, a record out.
#include <string_view>
#include <type_traits>

#include "media_test.h"

namespace mediidx::test {
namespace {

template <auto Field>
bool is_same(const Info& a, const Info& b) {
  if constexpr (std::is_array_v<std::remove_reference_t<decltype(a.*Field)>>) {
    return std::string_view(a.*Field) == std::string_view(b.*Field);
  } else {
    return a.*Field == b.*Field;
  }
}

struct Field {
  const char* name;
  bool (*is_same)(const Info&, const Info&);
};

/// Every field but the id, which the row gives, and the reserved words.
constexpr Field kFields[] = {
    {"path", is_same<&Info::path>},
    {"track", is_same<&Info::track>},
    {"disc", is_same<&Info::disc>},
    {"year", is_same<&Info::year>},
    {"title", is_same<&Info::title>},
    {"album", is_same<&Info::album>},
    {"artist", is_same<&Info::artist>},
    {"album_artist", is_same<&Info::album_artist>},
    {"genre", is_same<&Info::genre>},
    {"composer", is_same<&Info::composer>},
    {"comment", is_same<&Info::comment>},
    {"camera_make", is_same<&Info::camera_make>},
    {"camera_model", is_same<&Info::camera_model>},
    {"exposure", is_same<&Info::exposure>},
    {"aperture", is_same<&Info::aperture>},
    {"timetaken", is_same<&Info::timetaken>},
    {"date", is_same<&Info::date>},
    {"mdate", is_same<&Info::mdate>},
    {"duration", is_same<&Info::duration>},
    {"bitrate", is_same<&Info::bitrate>},
    {"frame_bitrate", is_same<&Info::frame_bitrate>},
    {"video_bitrate", is_same<&Info::video_bitrate>},
    {"frame_rate_num", is_same<&Info::frame_rate_num>},
    {"frame_rate_den", is_same<&Info::frame_rate_den>},
    {"frequency", is_same<&Info::frequency>},
    {"channel", is_same<&Info::channel>},
    {"resolutionX", is_same<&Info::resolutionX>},
    {"resolutionY", is_same<&Info::resolutionY>},
    {"filesize", is_same<&Info::filesize>},
    {"covercount", is_same<&Info::covercount>},
    {"iso", is_same<&Info::iso>},
    {"video_codec", is_same<&Info::video_codec>},
    {"container_type", is_same<&Info::container_type>},
    {"video_profile", is_same<&Info::video_profile>},
    {"video_level", is_same<&Info::video_level>},
    {"audio_codec", is_same<&Info::audio_codec>},
    {"fs_uuid", is_same<&Info::fs_uuid>},
};

/// A record whose every field has a value of its own.
Info full_record(const std::string& path) {
  auto info = record(path);
  info.track = 1;
  info.disc = 2;
  info.year = 3;
  set(info.title, "It's a title");
  set(info.album, "An album \\ 100%");
  set(info.artist, "Ärtist");
  set(info.album_artist, "アーティスト");
  set(info.genre, "Rock;Pop");
  set(info.composer, "Композитор");
  set(info.comment, "line\nline");
  set(info.camera_make, "maker");
  set(info.camera_model, "model");
  set(info.exposure, "1/60");
  set(info.aperture, "f/2.8");
  set(info.timetaken, "2019-01-02 03:04:05");
  set(info.date, "2020-01-02 03:04:05");
  set(info.mdate, "2021-01-02 03:04:05");
  info.duration = 215;
  info.bitrate = 4;
  info.frame_bitrate = 5;
  info.video_bitrate = 6;
  info.frame_rate_num = 7;
  info.frame_rate_den = 8;
  info.frequency = 9;
  info.channel = 10;
  info.resolutionX = 11;
  info.resolutionY = 12;
  info.filesize = 5'000'000'000;
  info.covercount = 13;
  info.iso = 14;
  set(info.video_codec, "vc");
  set(info.container_type, "ct");
  info.video_profile = 15;
  info.video_level = 16;
  set(info.audio_codec, "ac");
  set(info.fs_uuid, "uuid");
  return info;
}

class RoundTrip : public MediaTest {
 protected:
  /// The names of the fields that a save and a look-up lose.
  std::vector<std::string> lost(MEDIA_TABLE_TYPE type) {
    auto in = full_record(shared("x"));
    EXPECT_EQ(MediaInfoDBSave(type, &in), 0);
    Info out;
    EXPECT_EQ(MediaInfoDBGetOne(type, in.path, &out, 0), 0);
    std::vector<std::string> names;
    for (const auto& field : kFields) {
      if (!field.is_same(in, out)) names.emplace_back(field.name);
    }
    return names;
  }
};

TEST_F(RoundTrip, OfMusicKeepsWhatItsRowHolds) {
  EXPECT_THAT(lost(MEDIA_TABLE_MUSIC),
              ElementsAre("camera_make", "camera_model", "exposure", "aperture", "timetaken",
                          "frame_bitrate", "video_bitrate", "frame_rate_num", "frame_rate_den",
                          "resolutionX", "resolutionY", "iso", "video_codec", "container_type",
                          "video_profile", "video_level", "audio_codec", "fs_uuid"));
}

TEST_F(RoundTrip, OfAVideoKeepsWhatItsRowHolds) {
  EXPECT_THAT(lost(MEDIA_TABLE_VIDEO),
              ElementsAre("track", "disc", "year", "artist", "album_artist", "genre", "composer",
                          "comment", "camera_make", "camera_model", "exposure", "aperture",
                          "timetaken", "covercount", "iso", "fs_uuid"));
}

TEST_F(RoundTrip, OfAPhotoKeepsWhatIsReadOfItsRow) {
  EXPECT_THAT(
      lost(MEDIA_TABLE_PHOTO),
      ElementsAre("track", "disc", "year", "artist", "album_artist", "genre", "composer", "comment",
                  "camera_make", "camera_model", "exposure", "aperture", "duration", "bitrate",
                  "frame_bitrate", "video_bitrate", "frame_rate_num", "frame_rate_den", "frequency",
                  "channel", "covercount", "iso", "video_codec", "container_type", "video_profile",
                  "video_level", "audio_codec", "fs_uuid"));
}

TEST_F(RoundTrip, OfAPlaylistKeepsWhatItsRowHolds) {
  EXPECT_THAT(lost(MEDIA_TABLE_PLAYLIST),
              ElementsAre("track", "disc", "year", "artist", "album_artist", "genre", "composer",
                          "comment", "camera_make", "camera_model", "exposure", "aperture",
                          "timetaken", "duration", "bitrate", "frame_bitrate", "video_bitrate",
                          "frame_rate_num", "frame_rate_den", "frequency", "channel", "resolutionX",
                          "resolutionY", "covercount", "iso", "video_codec", "container_type",
                          "video_profile", "video_level", "audio_codec", "fs_uuid"));
}

TEST_F(RoundTrip, OfAFolderKeepsPathTitleAndDates) {
  auto dir = folder("/d");
  set(dir.title, "ti");
  set(dir.date, "2020-01-02 03:04:05");
  set(dir.mdate, "2021-01-02 03:04:05");
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  Info out;
  ASSERT_EQ(MediaInfoDBGetOne(MEDIA_TABLE_DIRECTORY, "/d", &out, 0), 0);
  EXPECT_STREQ(out.path, dir.path);
  EXPECT_STREQ(out.title, dir.title);
  EXPECT_STREQ(out.date, dir.date);
  EXPECT_STREQ(out.mdate, dir.mdate);
}

TEST_F(RoundTrip, OfMusicReadsItsCodecAndContainer) {
  auto in = full_record(shared("x"));
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_MUSIC, &in), 0);
  rows("UPDATE music SET codec = 'flac', container = 'ogg'");
  Info out;
  ASSERT_EQ(MediaInfoDBGetOne(MEDIA_TABLE_MUSIC, in.path, &out, 0), 0);
  EXPECT_STREQ(out.video_codec, "flac");
  EXPECT_STREQ(out.container_type, "ogg");
}

TEST_F(RoundTrip, TruncatesADuration) {
  auto in = full_record(shared("x"));
  in.duration = 59.9F;
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_MUSIC, &in), 0);
  Info out;
  ASSERT_EQ(MediaInfoDBGetOne(MEDIA_TABLE_MUSIC, in.path, &out, 0), 0);
  EXPECT_EQ(out.duration, 59.0F);
}

}  // namespace
}  // namespace mediidx::test
