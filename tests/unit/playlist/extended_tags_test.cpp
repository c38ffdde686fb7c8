// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/extended_tags.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>

#include "log_recorder.h"
#include "mediidx/playlist.h"

namespace {

struct M3uTagLine : testing::Test {
  std::unique_ptr<__tag_TAVO_MEDIA_INFO> info = std::make_unique<__tag_TAVO_MEDIA_INFO>();
  int read(const std::string& line) { return GetExtInfoM3U(line.c_str(), info.get()); }
  M3uTagLine() { mediidx::test::clear_log(); }
};

TEST_F(M3uTagLine, GivesDurationAndTitle) {
  EXPECT_EQ(read("#EXTINF:215,Artist - Song, live"), 1);
  EXPECT_EQ(info->duration, 215.0F);
  EXPECT_STREQ(info->title, "Artist - Song, live");
}

TEST_F(M3uTagLine, GivesOnlyTheDurationWithoutAComma) {
  std::strcpy(info->title, "before");
  EXPECT_EQ(read("#EXTINF:-1"), 1);
  EXPECT_EQ(info->duration, -1.0F);
  EXPECT_STREQ(info->title, "before");
}

TEST_F(M3uTagLine, GivesAnEmptyTitleAfterABareComma) {
  EXPECT_EQ(read("#EXTINF:5,"), 1);
  EXPECT_STREQ(info->title, "");
}

TEST_F(M3uTagLine, GivesArtistAlbumAndGenre) {
  EXPECT_EQ(read("#EXTINFARTIST:A"), 1);
  EXPECT_EQ(read("#EXTINFALBUM:B"), 1);
  EXPECT_EQ(read("#EXTINFGENRE:C"), 1);
  EXPECT_STREQ(info->artist, "A");
  EXPECT_STREQ(info->album, "B");
  EXPECT_STREQ(info->genre, "C");
}

TEST_F(M3uTagLine, GivesYearDiscAndTrack) {
  EXPECT_EQ(read("#EXTINFYEAR:1999"), 1);
  EXPECT_EQ(read("#EXTINFDISC:2x"), 1);
  EXPECT_EQ(read("#EXTINFTRACK:abc"), 1);
  EXPECT_EQ(info->year, 1999);
  EXPECT_EQ(info->disc, 2);
  EXPECT_EQ(info->track, 0);
}

TEST_F(M3uTagLine, HoldsNumbersWithinTheirRange) {
  EXPECT_EQ(read("#EXTINFYEAR:99999999999999999999"), 1);
  EXPECT_EQ(info->year, 2147483647);
  EXPECT_EQ(read("#EXTINFYEAR:-99999999999999999999"), 1);
  EXPECT_EQ(info->year, -2147483647 - 1);
}

TEST_F(M3uTagLine, LeavesTheRecordAloneForAComment) {
  EXPECT_EQ(read("#EXTM3U"), 1);
  EXPECT_EQ(read("# anything"), 1);
  EXPECT_EQ(read("#"), 1);
  const __tag_TAVO_MEDIA_INFO untouched{};
  EXPECT_EQ(std::memcmp(info.get(), &untouched, sizeof(untouched)), 0);
}

TEST_F(M3uTagLine, IsNoneForAnEntry) {
  EXPECT_EQ(read("a.mp3"), 0);
  EXPECT_EQ(read(""), 0);
  EXPECT_EQ(read(" #EXTINF:5,x"), 0);
}

TEST_F(M3uTagLine, CutsATitleAtTheBorderOfACharacter) {
  EXPECT_EQ(read("#EXTINF:5," + std::string(253, 'a') + "\xC3\xA9"), 1);
  EXPECT_EQ(std::string(info->title), std::string(253, 'a'));
  EXPECT_EQ(read("#EXTINF:5," + std::string(252, 'a') + "\xC3\xA9z"), 1);
  EXPECT_EQ(std::string(info->title), std::string(252, 'a') + "\xC3\xA9");
}

TEST_F(M3uTagLine, OfNothingIsABadParameter) {
  EXPECT_EQ(GetExtInfoM3U(nullptr, info.get()), 1);
  EXPECT_EQ(GetExtInfoM3U("#", nullptr), 1);
  EXPECT_EQ(mediidx::test::logged_messages(),
            (std::vector<std::string>{"Bad parameters.", "Bad parameters."}));
  EXPECT_EQ(mediidx::test::logged()[0].priority, 3);
  EXPECT_TRUE(mediidx::test::logged()[0].text.starts_with("mediidx_playlist_parse:"));
}

}  // namespace
