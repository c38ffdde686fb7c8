// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "command.h"
#include "database.h"

namespace mediidx::test {
namespace {

/// The rows of the sample library: indexed once, read by every test.
class TagsOf : public testing::Test {
 protected:
  static void SetUpTestSuite() {
    TestServer::get().fresh_database();
    folder_ = new OpenFolder;
    samples_ = folder_->take_sample("", "samples");
    const auto run = run_mediidx({"index", "--data-dir", folder_->at("d"), samples_});
    ASSERT_TRUE(run.status == 0 || run.status == 3) << run.err;
  }
  static void TearDownTestSuite() { delete folder_; }

  /// The values of these columns for one file.
  static Row row(const std::string& columns, const std::string& tables, const std::string& file) {
    const auto found = TestServer::get().rows("SELECT " + columns + " FROM " + tables +
                                              " WHERE path = " + quoted(samples_ + "/" + file));
    return found.size() == 1 ? found[0] : Row{std::to_string(found.size()) + " rows"};
  }
  static Row names(const std::string& file) {
    return row("title, artist, album, album_artist, genre, composer, comment", "music", file);
  }
  static Row numbers(const std::string& file) {
    return row("year, track, disc, covercount, frequency, channel, duration", "music", file);
  }
  static Row gains(const std::string& file) {
    return row("rg_track_gain, rg_track_peak, rg_album_gain, rg_album_peak",
               "replaygain_track r JOIN track t ON t.id = r.track", file);
  }

  static inline OpenFolder* folder_ = nullptr;
  static inline std::string samples_;
};

TEST_F(TagsOf, Flac) {
  const auto file = "music/Harbour Lights/Low Tide/03 - A Long Ebb.flac";
  EXPECT_EQ(names(file), (Row{"A Long Ebb", "Harbour Lights", "Low Tide", "Harbour Lights",
                              "Folk;Sea Songs", "Ada Brandt", "recorded at the quay"}));
  EXPECT_EQ(numbers(file), (Row{"2019", "3", "2", "1", "22050", "1", "2"}));
  EXPECT_EQ(gains(file), (Row{"-3.500000", "0.912000", "-2.250000", "0.950000"}));
}

TEST_F(TagsOf, Mp3) {
  const auto file = "music/Quay Sessions/02 - Bo Lindqvist.mp3";
  EXPECT_EQ(names(file), (Row{"Session 2", "Bo Lindqvist", "Quay Sessions", "", "Live", "", ""}));
  EXPECT_EQ(numbers(file), (Row{"2020", "2", "0", "1", "22050", "1", "1"}));
  EXPECT_EQ(gains(file), (Row{"-4.200000", "0.880000", "-3.900000", "0.970000"}));
}

TEST_F(TagsOf, Mp3WithSeveralValues) {
  const auto file = "music/Confluence/01 Two Rivers.mp3";
  EXPECT_EQ(names(file),
            (Row{"Two Rivers", "Ada Brandt; Bo Lindqvist", "Confluence", "The Ferrymen",
                 "Jazz;Folk;Field Recording", "Ada Brandt; Mina Okafor", ""}));
  EXPECT_EQ(numbers(file), (Row{"2018", "1", "0", "0", "22050", "1", "2"}));
}

TEST_F(TagsOf, M4aWithAac) {
  const auto file = "music/Mina Okafor/Tide Tables/01 High Water.m4a";
  EXPECT_EQ(names(file), (Row{"High Water", "Mina Okafor", "Tide Tables", "Mina Okafor",
                              "Electronic;Ambient", "Mina Okafor", ""}));
  EXPECT_EQ(row("year, track, disc, covercount, frequency", "music", file),
            (Row{"2022", "1", "1", "1", "22050"}));
}

TEST_F(TagsOf, OggVorbis) {
  const auto file = "music/Confluence/02 Weir.ogg";
  EXPECT_EQ(names(file), (Row{"Weir", "Ada Brandt; Mina Okafor", "Confluence", "The Ferrymen",
                              "Jazz;Folk", "", ""}));
  EXPECT_EQ(gains(file), (Row{"1.300000", "0.500000", "-0.700000", "0.900000"}));
}

TEST_F(TagsOf, OpusWithItsOwnGains) {
  const auto file = "music/Confluence/03 Lock.opus";
  EXPECT_EQ(names(file),
            (Row{"Lock", "Bo Lindqvist", "Confluence", "The Ferrymen", "Jazz;Ambient", "", ""}));
  EXPECT_EQ(numbers(file), (Row{"2018", "3", "0", "1", "48000", "1", "2"}));
  EXPECT_EQ(gains(file), (Row{"0.000000", "0.000000", "2.500000", "0.000000"}));
}

TEST_F(TagsOf, WavWithoutTagsAreItsFilesName) {
  const auto file = "music/Untagged/tape side B.wav";
  EXPECT_EQ(names(file), (Row{"tape side B", "", "", "", "", "", ""}));
  EXPECT_EQ(row("bitrate, frequency, channel, duration", "music", file),
            (Row{"353000", "22050", "1", "1"}));
}

struct FormatCase {
  const char* file;
  const char* codec;
  const char* container;
};

TEST_F(TagsOf, EveryFormatNameCodecAndContainer) {
  constexpr FormatCase kCases[] = {
      {"music/Quay Sessions/01 - Ada Brandt.mp3", "mp3", "mp3"},
      {"music/Harbour Lights/Low Tide/01 - Slack Water.flac", "flac", "flac"},
      {"music/Mina Okafor/Tide Tables/01 High Water.m4a", "aac", "mp4"},
      {"music/Mina Okafor/Tide Tables/02 Low Water.m4a", "alac", "mp4"},
      {"music/Confluence/02 Weir.ogg", "vorbis", "ogg"},
      {"music/Confluence/03 Lock.opus", "opus", "ogg"},
      {"music/Untagged/tape side B.wav", "pcm", "wav"},
  };
  for (const auto& one : kCases) {
    EXPECT_EQ(row("codec, container", "track", one.file), (Row{one.codec, one.container}))
        << one.file;
  }
}

TEST_F(TagsOf, APhoto) {
  EXPECT_EQ(row("title, album, camera_make, camera_model, exposure, aperture, iso, timetaken, "
                "resolutionx, resolutiony",
                "photo", "photos/2021 Harbour/IMG_0001.jpg"),
            (Row{"IMG_0001", "2021 Harbour", "Lumen", "L-1", "1/125", "f/2.8", "200",
                 "2021-06-12 10:30:00", "64", "64"}));
}

TEST_F(TagsOf, APhotoWithAnImpossibleDateHaveNone) {
  EXPECT_EQ(row("timetaken, resolutionx", "photo", "photos/2021 Harbour/Impossible date.jpg"),
            (Row{"1970-01-01 00:00:00", "64"}));
}

TEST_F(TagsOf, AnMp4) {
  EXPECT_EQ(row("title, album, duration, resolutionx, resolutiony, frequency, channel, "
                "video_codec, audio_codec, container_type, frame_rate_num, frame_rate_den, "
                "video_profile, video_level",
                "video", "videos/harbour.mp4"),
            (Row{"A Day at the Harbour", "videos", "1", "64", "64", "22050", "1", "h264", "aac",
                 "mp4", "10", "1", "578", "10"}));
  EXPECT_EQ(
      row("frame_bitrate > 0, audio_bitrate > 0, video_bitrate > 0", "video", "videos/harbour.mp4"),
      (Row{"t", "t", "t"}));
}

TEST_F(TagsOf, AMatroskaFile) {
  EXPECT_EQ(row("title, album, video_codec, audio_codec, container_type", "video",
                "videos/Ferry Tales/S01E01 - Cast Off.mkv"),
            (Row{"Cast Off", "Ferry Tales", "h264", "aac", "matroska"}));
}

TEST_F(TagsOf, EveryFileHaveItsTimesSizeAndVolume) {
  const auto found = TestServer::get().rows(
      "SELECT count(*) FROM music WHERE mdate <> '1970-01-01' AND date <> '1970-01-01' "
      "AND filesize > 0 AND fs_uuid <> ''");
  EXPECT_EQ(found, TestServer::get().rows("SELECT count(*) FROM music"));
  EXPECT_NE(found, (std::vector<Row>{{"0"}}));
}

TEST_F(TagsOf, ADamagedFileDoNotEndTheRun) {
  EXPECT_EQ(row("codec", "track", "damaged/truncated.mp3"), Row{"mp3"});
  EXPECT_EQ(row("path", "photo", "damaged/not a picture.jpg"), Row{"0 rows"});
}

}  // namespace
}  // namespace mediidx::test
