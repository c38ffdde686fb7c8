// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "tag_samples.h"

namespace mediidx::test {
namespace {

const Fields kFilm{
    {"title", "Cast Off"},     {"album", "Ferry Tales"},  {"duration", "1"},
    {"frame_bitrate", "some"}, {"video_bitrate", "some"}, {"bitrate", "some"},
    {"frequency", "44100"},    {"channel", "1"},          {"resolutionX", "64"},
    {"resolutionY", "48"},     {"frame_rate_num", "25"},  {"frame_rate_den", "1"},
};

Fields film(const std::string& container, const std::string& video, const std::string& audio,
            const Fields& others) {
  return with(
      with(kFilm, {{"container_type", container}, {"video_codec", video}, {"audio_codec", audio}}),
      others);
}

/// Of formats that have no place for a title.
const Fields kUntitled{{"title", "film"}, {"album", "videos"}};

const Fields kMain{{"video_profile", "77"}, {"video_level", "31"}};

TEST(AllOfAVideo, IsReadFromAMov) {
  EXPECT_EQ(fields_of("videos/film.mov"), film("mov", "h264", "aac", kMain));
}

TEST(AllOfAVideo, IsReadFromATransportStream) {
  EXPECT_EQ(fields_of("videos/film.ts"), with(film("mpegts", "h264", "mp2", kMain), kUntitled));
}

TEST(AllOfAVideo, IsReadFromAFlv) {
  EXPECT_EQ(fields_of("videos/film.flv"), film("flv", "h264", "mp3", kMain));
}

TEST(AllOfAVideo, IsReadFromAMatroskaFile) {
  EXPECT_EQ(fields_of("videos/film.mkv"), film("matroska", "hevc", "ac3",
                                               {{"video_profile", "1"},
                                                {"video_level", "30"},
                                                {"frame_rate_num", "24000"},
                                                {"frame_rate_den", "1001"}}));
}

/// Its streams tell no rates.
TEST(AllOfAVideo, IsReadFromAWebm) {
  EXPECT_EQ(fields_of("videos/film.webm"),
            film("webm", "vp9", "opus",
                 {{"frequency", "48000"}, {"bitrate", ""}, {"video_bitrate", ""}}));
}

TEST(AllOfAVideo, IsReadFromAnAvi) {
  EXPECT_EQ(fields_of("videos/film.avi"),
            film("avi", "mpeg4", "mp3", {{"album", "videos"}, {"video_level", "1"}}));
}

TEST(AllOfAVideo, IsReadFromAWmv) {
  EXPECT_EQ(fields_of("videos/film.wmv"), film("asf", "wmv2", "wmav2", {}));
}

TEST(AllOfAVideo, IsReadFromAnMpeg) {
  EXPECT_EQ(fields_of("videos/film.mpg"),
            with(film("mpeg", "mpeg2video", "mp2", {{"video_profile", "4"}, {"video_level", "8"}}),
                 kUntitled));
}

TEST(TheAudioOfAVideo, IsThatOfItsFirstStream) {
  EXPECT_EQ(fields_of("videos/two-sounds.mp4"), film("mp4", "h264", "aac", kMain));
}

TEST(AVideo, MayBeSilent) {
  EXPECT_EQ(
      fields_of("videos/silent.mp4"),
      with(film("mp4", "h264", "", kMain), {{"bitrate", ""}, {"frequency", ""}, {"channel", ""}}));
}

}  // namespace
}  // namespace mediidx::test
