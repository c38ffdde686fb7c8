// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <cfloat>
#include <limits>

#include "catalogue_fixture.h"

namespace mediidx::test {
namespace {

const std::string kActualColumns =
    "SELECT userid, path, title, title_sort, title_search, agg_genre, agg_genre_sort, "
    "agg_genre_search, filesize, year, frequency, channel, bitrate, duration, comment, track, disc, "
    "container, codec, is_virtual, has_virtual, covercount, date, mdate FROM track";

Record full_record() {
  Record info = record("/music/The Wall.mp3", "Artist", "Album");
  set(info.title, "The Wall");
  set(info.genre, ";;Rock; Pop ;;Jazz");
  set(info.comment, "A comment");
  set(info.container_type, "mp3");
  set(info.video_codec, "mpeg");
  set(info.date, "2024-02-29 12:34:56");
  set(info.mdate, "2024-03-01 00:00:00");
  info.filesize = 5'000'000'000;
  info.year = 1979;
  info.frequency = 44100;
  info.channel = 2;
  info.bitrate = 320000;
  info.duration = 215;
  info.track = 5;
  info.disc = 2;
  info.covercount = 1;
  return info;
}

class ATrackRow : public CatalogueTest {
 protected:
  int insert_row(const Record& info, std::int64_t userid = 0) {
    return MediaDBInsertIntoTrackTable(conn, &info, nullptr, 0, userid);
  }
  int insert_virtual_row(const Record& info, const Record& cue_sheet) {
    return MediaDBInsertIntoTrackTable(conn, &info, &cue_sheet, 1, 0);
  }
};

TEST_F(ATrackRow, HoldsAnActualRecord) {
  EXPECT_EQ(insert_row(full_record(), 1026), 0);

  EXPECT_EQ(rows(kActualColumns), (std::vector<Row>{{"1026",
                                                     "/music/The Wall.mp3",
                                                     "The Wall",
                                                     "WALL",
                                                     "THE WALL",
                                                     "Rock; Pop; Jazz",
                                                     "ROCK; POP; JAZZ",
                                                     "ROCK; POP; JAZZ",
                                                     "5000000000",
                                                     "1979",
                                                     "44100",
                                                     "2",
                                                     "320000",
                                                     "215.000000",
                                                     "A comment",
                                                     "5",
                                                     "2",
                                                     "mp3",
                                                     "mpeg",
                                                     "FALSE",
                                                     "FALSE",
                                                     "1",
                                                     "2024-02-29 12:34:56",
                                                     "2024-03-01 00:00:00"}}));
  EXPECT_TRUE(logged().empty());
}

TEST_F(ATrackRow, OfAPathAloneIsEmptyAndOfTheEpoch) {
  EXPECT_EQ(insert_row(record("/music/a.mp3")), 0);

  EXPECT_EQ(rows(kActualColumns), (std::vector<Row>{{"0",
                                                     "/music/a.mp3",
                                                     "",
                                                     "",
                                                     "",
                                                     "",
                                                     "",
                                                     "",
                                                     "0",
                                                     "0",
                                                     "0",
                                                     "0",
                                                     "0",
                                                     "0.000000",
                                                     "",
                                                     "0",
                                                     "0",
                                                     "",
                                                     "",
                                                     "FALSE",
                                                     "FALSE",
                                                     "0",
                                                     "1970-01-01 00:00:00",
                                                     "1970-01-01 00:00:00"}}));
}

TEST_F(ATrackRow, HoldsAVirtualRecordOfItsCueSheet) {
  Record info = full_record();
  set(info.comment, "03:25:10");
  Record cue_sheet = record("/music/wall.cue");
  set(cue_sheet.date, "2020-01-02 03:04:05");

  EXPECT_EQ(insert_virtual_row(info, cue_sheet), 0);

  EXPECT_EQ(rows(kActualColumns), (std::vector<Row>{{"0",
                                                     "/music/The Wall.mp3",
                                                     "The Wall",
                                                     "WALL",
                                                     "THE WALL",
                                                     "Rock; Pop; Jazz",
                                                     "ROCK; POP; JAZZ",
                                                     "ROCK; POP; JAZZ",
                                                     "<null>",
                                                     "1979",
                                                     "<null>",
                                                     "<null>",
                                                     "<null>",
                                                     "215.000000",
                                                     "03:25:10/music/wall.cue",
                                                     "5",
                                                     "<null>",
                                                     "<null>",
                                                     "<null>",
                                                     "TRUE",
                                                     "FALSE",
                                                     "<null>",
                                                     "2020-01-02 03:04:05",
                                                     "<null>"}}));
}

TEST_F(ATrackRow, OfACueSheetWithoutADateIsOfTheEpoch) {
  insert_virtual_row(full_record(), record("/music/wall.cue"));

  EXPECT_EQ(only("date", "track"), "1970-01-01 00:00:00");
}

TEST_F(ATrackRow, HoldsTheWholePathOfItsCueSheet) {
  const auto path = "/" + std::string(4090, 'c') + ".cue";

  insert_virtual_row(virtual_record("/music/a.flac", 1), record(path));

  EXPECT_EQ(only("comment", "track"), "00:00:00" + path);
}

TEST_F(ATrackRow, OfAnActualRecordIgnoresTheCueSheet) {
  const Record info = full_record();
  const Record cue_sheet = record("/music/wall.cue");

  EXPECT_EQ(MediaDBInsertIntoTrackTable(conn, &info, &cue_sheet, 0, 0), 0);

  EXPECT_EQ(only("comment", "track"), "A comment");
  EXPECT_EQ(only("is_virtual", "track"), "FALSE");
}

TEST_F(ATrackRow, HoldsTheWidestNumbers) {
  Record info = record("/music/a.mp3");
  info.filesize = std::numeric_limits<std::int64_t>::max();
  info.year = std::numeric_limits<std::int32_t>::min();
  info.duration = FLT_MAX;

  EXPECT_EQ(insert_row(info, std::numeric_limits<std::uint32_t>::max()), 0);

  EXPECT_EQ(rows("SELECT userid, filesize, year, duration FROM track"),
            (std::vector<Row>{{"4294967295", "9223372036854775807", "-2147483648",
                               "340282346638528859811704183484516925440.000000"}}));
}

TEST_F(ATrackRow, KeepsFractionsOfASecond) {
  Record info = record("/music/a.mp3");
  info.duration = 59.9F;

  insert_row(info);

  EXPECT_EQ(only("duration", "track"), "59.900002");
}

TEST_F(ATrackRow, HasTheSameTwoKeysWithoutAnArticle) {
  Record info = record("/music/a.mp3");
  set(info.title, "Theory");

  insert_row(info);

  EXPECT_EQ(rows("SELECT title_sort, title_search FROM track"),
            (std::vector<Row>{{"THEORY", "THEORY"}}));
}

TEST_F(ATrackRow, KeepsTheLeadingBlankOfItsFirstGenre) {
  Record info = record("/music/a.mp3");
  set(info.genre, " Rock;Pop");

  insert_row(info);

  EXPECT_EQ(only("agg_genre", "track"), " Rock; Pop");
}

TEST_F(ATrackRow, KeepsAGenreOfSeparators) {
  Record info = record("/music/a.mp3");
  set(info.genre, ";;;");

  insert_row(info);

  EXPECT_EQ(only("agg_genre", "track"), ";;;");
}

TEST_F(ATrackRow, CutsJoinedGenresAtTheBorderOfACharacter) {
  Record info = record("/music/a.mp3");
  std::string genres;
  while (genres.size() + 4 <= 254) genres += "愛;";
  set(info.genre, genres);

  EXPECT_EQ(insert_row(info), 0);

  EXPECT_EQ(
      rows("SELECT octet_length(agg_genre), right(agg_genre, 2), octet_length(agg_genre_sort) "
           "FROM track"),
      (std::vector<Row>{{"255", "; ", "255"}}));
}

TEST_F(ATrackRow, IsNotWrittenWhenItsGenresCannotBeCopied) {
  platform_fakes().strdup_fails = true;

  EXPECT_EQ(insert_row(record("/music/a.mp3")), -1);

  platform_fakes().strdup_fails = false;
  expect_messages({"Failed to strdup. Cannot allocate memory"});
  EXPECT_TRUE(sent_statements().empty());
}

class UpdatingATrackRow : public ATrackRow {};

TEST_F(UpdatingATrackRow, RewritesWhatTheFileSays) {
  insert_row(record("/music/old.mp3"));
  Record info = full_record();
  info.id = 1;

  EXPECT_EQ(MediaDBUpdateTrackTable(conn, &info), 0);

  EXPECT_EQ(
      rows("SELECT path, filesize, title, title_sort, title_search, agg_genre, agg_genre_sort, "
           "agg_genre_search, comment, year, channel, frequency, bitrate, duration, track, "
           "disc, covercount, date, mdate FROM track"),
      (std::vector<Row>{{"/music/The Wall.mp3", "5000000000", "The Wall", "WALL", "THE WALL",
                         "Rock; Pop; Jazz", "ROCK; POP; JAZZ", "ROCK; POP; JAZZ", "A comment",
                         "1979", "2", "44100", "320000", "215.000000", "5", "2", "1",
                         "2024-02-29 12:34:56", "2024-03-01 00:00:00"}}));
}

TEST_F(UpdatingATrackRow, LeavesFormatOwnerAndFlagsAlone) {
  insert_row(full_record(), 1026);
  rows("UPDATE track SET has_virtual = 'TRUE'");
  Record info = record("/music/a.mp3");
  info.id = 1;

  EXPECT_EQ(MediaDBUpdateTrackTable(conn, &info), 0);

  EXPECT_EQ(rows("SELECT path, container, codec, userid, is_virtual, has_virtual, date FROM track"),
            (std::vector<Row>{
                {"/music/a.mp3", "mp3", "mpeg", "1026", "FALSE", "TRUE", "1970-01-01 00:00:00"}}));
}

TEST_F(UpdatingATrackRow, ChangesNoOther) {
  insert_row(record("/music/a.mp3"));
  insert_row(record("/music/b.mp3"));
  Record info = record("/music/c.mp3");
  info.id = 2;

  MediaDBUpdateTrackTable(conn, &info);

  EXPECT_EQ(rows("SELECT id, path FROM track ORDER BY id"),
            (std::vector<Row>{{"1", "/music/a.mp3"}, {"2", "/music/c.mp3"}}));
}

TEST_F(UpdatingATrackRow, IsNotBegunWhenItsGenresCannotBeCopied) {
  const Record info = full_record();
  platform_fakes().strdup_fails = true;

  EXPECT_EQ(MediaDBUpdateTrackTable(conn, &info), -1);

  platform_fakes().strdup_fails = false;
  expect_messages({"Failed to strdup. Cannot allocate memory"});
  EXPECT_TRUE(sent_statements().empty());
}

class FindingATrackId : public ATrackRow {
 protected:
  /// The answer for /music/a.mp3 when its row's id reads as `field`.
  int answer_for(const char* field) {
    platform_fakes().field = [field](const char* column, const char* real) {
      return std::string(column) == "id" ? field : real;
    };
    return MediaDBFindInsertedTrackID(conn, &info, 0);
  }

  Record info = record("/music/a.mp3");
};

TEST_F(FindingATrackId, StoresAndReturnsIt) {
  insert_row(record("/music/other.mp3"));
  insert_row(info);

  EXPECT_EQ(MediaDBFindInsertedTrackID(conn, &info, 0), 2);

  EXPECT_EQ(info.id, 2U);
}

TEST_F(FindingATrackId, TellsVirtualRowsByTheirNumbers) {
  insert_row(info);
  insert_virtual_row(virtual_record("/music/a.mp3", 1), record("/music/a.cue"));
  insert_virtual_row(virtual_record("/music/a.mp3", 2), record("/music/a.cue"));
  info.track = 2;

  EXPECT_EQ(MediaDBFindInsertedTrackID(conn, &info, 1), 3);
}

TEST_F(FindingATrackId, DoesNotTakeAVirtualRowForAnActualOne) {
  insert_virtual_row(virtual_record("/music/a.mp3", 0), record("/music/a.cue"));
  info.id = 77;

  EXPECT_EQ(MediaDBFindInsertedTrackID(conn, &info, 0), -1);

  EXPECT_EQ(info.id, 77U);
  EXPECT_TRUE(logged().empty());
}

TEST_F(FindingATrackId, FailsWithoutARow) {
  info.id = 77;

  EXPECT_EQ(MediaDBFindInsertedTrackID(conn, &info, 0), -1);

  EXPECT_EQ(info.id, 77U);
}

TEST_F(FindingATrackId, LeavesTheRecordAloneWhenTheQueryFails) {
  rows("ALTER TABLE track RENAME TO gone");
  info.id = 77;

  EXPECT_EQ(MediaDBFindInsertedTrackID(conn, &info, 0), -1);

  EXPECT_EQ(info.id, 77U);
  expect_failed_statement();
}

TEST_F(FindingATrackId, ReadsAMissingFieldAsZero) {
  insert_row(info);
  info.id = 77;

  EXPECT_EQ(answer_for(nullptr), 0);

  EXPECT_EQ(info.id, 0U);
}

TEST_F(FindingATrackId, ReadsATableWithoutIdsAsZero) {
  insert_row(info);
  rows("ALTER TABLE track RENAME COLUMN id TO number");
  info.id = 77;

  EXPECT_EQ(MediaDBFindInsertedTrackID(conn, &info, 0), 0);

  EXPECT_EQ(info.id, 0U);
}

TEST_F(FindingATrackId, KeepsTheLowHalfOfAWideNumber) {
  insert_row(info);

  EXPECT_EQ(answer_for("4294967301"), 5);

  EXPECT_EQ(info.id, 5U);
}

TEST_F(FindingATrackId, AnswersZeroForANumberBelowOne) {
  insert_row(info);

  EXPECT_EQ(answer_for("-3"), 0);

  EXPECT_EQ(info.id, static_cast<std::uint32_t>(-3));
}

TEST_F(FindingATrackId, ReadsDecimalsOnly) {
  insert_row(info);

  EXPECT_EQ(answer_for("010"), 10);
  EXPECT_EQ(answer_for("0x10"), 0);
}

class Counterparts : public ATrackRow {};

TEST_F(Counterparts, OfAnActualRecordAreItsVirtualRows) {
  const Record info = record("/music/a.flac");
  insert_row(info);
  insert_virtual_row(virtual_record("/music/a.flac", 1), record("/music/a.cue"));
  insert_virtual_row(virtual_record("/music/a.flac", 2), record("/music/a.cue"));
  insert_virtual_row(virtual_record("/music/b.flac", 1), record("/music/b.cue"));

  EXPECT_EQ(MediaDBFindRecordsWithSamePath(conn, &info, 0), 2);
  EXPECT_EQ(MediaDBFindRecordsWithSamePath(conn, &info, 1), 1);
}

TEST_F(Counterparts, AreNoneOfAnUnknownPath) {
  const Record info = record("/music/a.flac");

  EXPECT_EQ(MediaDBFindRecordsWithSamePath(conn, &info, 0), 0);
  EXPECT_EQ(MediaDBFindRecordsWithSamePath(conn, &info, 1), 0);
}

TEST_F(Counterparts, AreMarkedOnTheActualRowOnly) {
  const Record info = record("/music/a.flac");
  insert_row(info);
  insert_row(record("/music/b.flac"));
  insert_virtual_row(virtual_record("/music/a.flac", 1), record("/music/a.cue"));

  EXPECT_EQ(MediaDBUpdateHasVirtualColumn(conn, &info), 0);

  EXPECT_EQ(rows("SELECT has_virtual FROM track ORDER BY id"),
            (std::vector<Row>{{"TRUE"}, {"FALSE"}, {"FALSE"}}));
}

TEST_F(Counterparts, TakeThePropertiesOfTheActualRecord) {
  insert_virtual_row(virtual_record(full_record().path, 1), record("/music/a.cue"));
  insert_virtual_row(virtual_record(full_record().path, 2), record("/music/a.cue"));
  insert_virtual_row(virtual_record("/music/b.flac", 1), record("/music/b.cue"));
  const Record info = full_record();

  EXPECT_EQ(MediaDBUpdateVirtualMusicProperties(conn, &info, 0), 0);

  EXPECT_EQ(rows("SELECT channel, frequency, bitrate, container, codec FROM track ORDER BY id"),
            (std::vector<Row>{{"2", "44100", "320000", "mp3", "mpeg"},
                              {"2", "44100", "320000", "mp3", "mpeg"},
                              {"<null>", "<null>", "<null>", "<null>", "<null>"}}));
}

TEST_F(Counterparts, GiveTheirPropertiesToOneVirtualRow) {
  insert_row(full_record());
  insert_virtual_row(virtual_record(full_record().path, 1), record("/music/a.cue"));
  insert_virtual_row(virtual_record(full_record().path, 2), record("/music/a.cue"));
  Record info = virtual_record(full_record().path, 2);
  info.id = 3;

  EXPECT_EQ(MediaDBUpdateVirtualMusicProperties(conn, &info, 1), 0);

  EXPECT_EQ(rows("SELECT channel, frequency, bitrate, container, codec FROM track "
                 "WHERE is_virtual = 'TRUE' ORDER BY id"),
            (std::vector<Row>{{"<null>", "<null>", "<null>", "<null>", "<null>"},
                              {"2", "44100", "320000", "mp3", "mpeg"}}));
}

}  // namespace
}  // namespace mediidx::test
