// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Rewriting the row of a file.
#include <climits>

#include "media_test.h"

namespace mediidx::test {
namespace {

using testing::StartsWith;

class UpdatingAFile : public MediaTest {
 protected:
  /// Stores a record of this path and gives it its row's id.
  Info stored(MEDIA_TABLE_TYPE type, const std::string& table, const std::string& path) {
    auto info = record(path);
    EXPECT_EQ(MediaInfoDBSave(type, &info), 0);
    if (type != MEDIA_TABLE_MUSIC) {
      info.id = static_cast<uint32_t>(
          std::stoul(value("SELECT id FROM " + table + " WHERE path = " + quoted(path))));
    }
    return info;
  }
};

TEST_F(UpdatingAFile, RefusesNull) {
  EXPECT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PHOTO, nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter")));
}

TEST_F(UpdatingAFile, RefusesATypeThatIsNoFile) {
  auto info = record("/d");
  for (const MEDIA_TABLE_TYPE type : {4U, 5U, 6U, 0xFFFFFFFFU}) {
    clear_log();
    EXPECT_EQ(MediaInfoDBUpdate(type, &info), -1);
    EXPECT_THAT(log_lines(), ElementsAre(parens("Bad table type.")));
  }
}

TEST_F(UpdatingAFile, RewritesAPhotoByItsId) {
  stored(MEDIA_TABLE_PHOTO, "photo", "/other");
  auto info = stored(MEDIA_TABLE_PHOTO, "photo", "/old");
  set(info.path, "/new");
  info.filesize = 5'000'000'000;
  set(info.title, " it's ");
  set(info.album, "al");
  set(info.date, "2020-01-02 03:04:05");
  ASSERT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PHOTO, &info), 0);
  EXPECT_EQ(
      rows("SELECT path, filesize, title, album, date, mdate, timetaken FROM photo ORDER BY path"),
      (std::vector<Row>{{"/new", "5000000000", "it's", "al", "2020-01-02 03:04:05",
                         "1970-01-01 00:00:00", "1970-01-01 00:00:00"},
                        {"/other", "0", "", "", "1970-01-01 00:00:00", "1970-01-01 00:00:00",
                         "1970-01-01 00:00:00"}}));
}

TEST_F(UpdatingAFile, RewritesAVideoByItsId) {
  auto info = stored(MEDIA_TABLE_VIDEO, "video", "/old");
  set(info.path, "/new");
  info.filesize = 1;
  set(info.title, "ti");
  set(info.album, "al");
  info.frame_bitrate = 2;
  info.duration = 3.9F;
  info.resolutionX = 4;
  info.resolutionY = 5;
  info.bitrate = 6;
  info.frequency = 7;
  info.channel = 8;
  ASSERT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_VIDEO, &info), 0);
  EXPECT_EQ(rows("SELECT path, filesize, title, album, frame_bitrate, duration, resolutionx, "
                 "resolutiony, audio_bitrate, frequency, channel FROM video"),
            (std::vector<Row>{{"/new", "1", "ti", "al", "2", "3", "4", "5", "6", "7", "8"}}));
}

TEST_F(UpdatingAFile, RewritesAPlaylistAndCountsItsSongsAnew) {
  auto info = stored(MEDIA_TABLE_PLAYLIST, "playlist", shared("list.m3u"));
  root.write("volume1/media/list.m3u", "a.mp3\nb.mp3\nc.mp3\n");
  set(info.title, "ti");
  ASSERT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PLAYLIST, &info), 0);
  EXPECT_EQ(rows("SELECT title, song_count FROM playlist"), (std::vector<Row>{{"ti", "3"}}));
}

TEST_F(UpdatingAFile, RewritesMusicByItsPathAndItsTrackById) {
  auto info = stored(MEDIA_TABLE_MUSIC, "music", shared("m.mp3"));
  info.filesize = 1;
  set(info.title, "ti");
  set(info.album, "al");
  set(info.artist, "ar");
  set(info.album_artist, "aa");
  set(info.composer, "co");
  set(info.comment, "cm");
  info.year = 2;
  set(info.genre, "ge");
  info.channel = 3;
  info.frequency = 4;
  info.bitrate = 5;
  info.duration = 59.9F;
  info.track = 6;
  info.disc = 7;
  info.covercount = 8;
  ASSERT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_MUSIC, &info), 0);
  EXPECT_EQ(rows("SELECT filesize, title, album, artist, album_artist, composer, comment, year, "
                 "genre, channel, frequency, bitrate, duration, track, disc, covercount "
                 "FROM music"),
            (std::vector<Row>{{"1", "ti", "al", "ar", "aa", "co", "cm", "2", "ge", "3", "4", "5",
                               "59", "6", "7", "8"}}));
  EXPECT_EQ(rows("SELECT title, title_search FROM track"), (std::vector<Row>{{"ti", "TI"}}));
  EXPECT_EQ(value("SELECT artist FROM artist_track"), "ar");
}

TEST_F(UpdatingAFile, LeavesOtherMusicAlone) {
  stored(MEDIA_TABLE_MUSIC, "music", shared("other.mp3"));
  auto info = stored(MEDIA_TABLE_MUSIC, "music", shared("m.mp3"));
  set(info.title, "ti");
  ASSERT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_MUSIC, &info), 0);
  EXPECT_EQ(count("music", "title = 'ti'"), 1);
  EXPECT_EQ(count("track", "title = 'ti'"), 1);
}

TEST_F(UpdatingAFile, FailsBeforeTheRowWhenTheCatalogueDoes) {
  auto info = stored(MEDIA_TABLE_MUSIC, "music", shared("m.mp3"));
  take_away("track");
  set(info.title, "ti");
  EXPECT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_MUSIC, &info), -1);
  EXPECT_EQ(value("SELECT title FROM music"), "");
}

/// The longest values that each kind of record can hold fit the statement.
class UpdatingWithTheLongestValues : public UpdatingAFile,
                                     public testing::WithParamInterface<MEDIA_TABLE_TYPE> {};

TEST_P(UpdatingWithTheLongestValues, CutsNothingOff) {
  const char* const tables[] = {"music", "video", "photo", "playlist"};
  const std::string table = tables[GetParam()];
  const auto start = shared("");
  auto info = stored(GetParam(), table, start + std::string(4000 - start.size(), '\''));
  for (char* text : {info.title, info.album, info.artist, info.album_artist, info.genre,
                     info.composer, info.comment}) {
    std::snprintf(text, MEDIIDX_TEXT_SIZE, "%s", std::string(254, '\'').c_str());
  }
  info.filesize = LLONG_MIN;
  for (int32_t* number :
       {&info.year, &info.track, &info.disc, &info.covercount, &info.channel, &info.frequency,
        &info.bitrate, &info.frame_bitrate, &info.resolutionX, &info.resolutionY}) {
    *number = INT_MIN;
  }
  info.duration = -1e20F;
  clear_sent_statements();
  ASSERT_EQ(MediaInfoDBUpdate(GetParam(), &info), 0);
  EXPECT_THAT(last_statement(), StartsWith("UPDATE " + table + " set "));
  EXPECT_EQ(value("SELECT title FROM " + table), info.title);
  EXPECT_EQ(value("SELECT filesize FROM " + table), std::to_string(LLONG_MIN));
  EXPECT_EQ(value("SELECT path FROM " + table), info.path);
}

INSTANTIATE_TEST_SUITE_P(Kinds, UpdatingWithTheLongestValues, testing::Range(0U, 4U));

TEST_F(UpdatingAFile, EscapesItsDates) {
  auto info = stored(MEDIA_TABLE_PHOTO, "photo", "/p");
  set(info.date, "', title = 'injected");
  EXPECT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PHOTO, &info), -1);
  EXPECT_EQ(value("SELECT title FROM photo"), "");
}

TEST_F(UpdatingAFile, TakesNoTextAsAFormat) {
  auto info = stored(MEDIA_TABLE_PHOTO, "photo", "/p");
  set(info.title, "100%n %s @TAVO:VAR");
  ASSERT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PHOTO, &info), 0);
  EXPECT_EQ(value("SELECT title FROM photo"), "100%n %s @TAVO:VAR");
}

TEST_F(UpdatingAFile, FailsWithoutAConnection) {
  const NoServer no_server;
  auto info = record("/p");
  EXPECT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PHOTO, &info), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

TEST_F(UpdatingAFile, LogsAFailedStatement) {
  auto info = stored(MEDIA_TABLE_PHOTO, "photo", "/p");
  take_away("photo");
  clear_sent_statements();
  EXPECT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PHOTO, &info), -1);
  ASSERT_EQ(sent_statements().size(), 1U);
  EXPECT_THAT(log_lines(), ElementsAre(failed_statement(sent_statements()[0])));
}

TEST_F(UpdatingAFile, FailsWhenATextCannotBeEscaped) {
  auto info = record("/p");
  for (int nth = 1; nth <= 11; ++nth) {
    clear_log();
    const Failing escape("TAVODBEscapeString", nth);
    EXPECT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PHOTO, &info), -1);
    EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to escape condition.")));
  }
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_F(UpdatingAFile, FailsWithoutMemoryForAText) {
  auto info = record("/" + std::string(1233, 'x'));
  const FailingAllocation allocation(Allocator::kMalloc, 2 * 1234 + 1);
  EXPECT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PHOTO, &info), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to malloc(2469)")));
}

TEST_F(UpdatingAFile, FailsWithoutMemoryForItsStatement) {
  auto info = record("/" + std::string(1233, 'x'));
  const FailingAllocation allocation(Allocator::kMalloc,
                                     1234 + 3 * 5 + 512);  // path, three times "epoch"
  EXPECT_EQ(MediaInfoDBUpdate(MEDIA_TABLE_PHOTO, &info), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to malloc(1761)")));
}
#endif

}  // namespace
}  // namespace mediidx::test
