// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Names that mean something to SQL, to printf or to the templates: stored as they are, by every
// write.
#include <gtest/gtest.h>

#include <limits>

#include "catalogue_fixture.h"

namespace mediidx::test {
namespace {

struct NameCase {
  const char* name;
  std::string text;
};

class AHostileName : public CatalogueTest, public testing::WithParamInterface<NameCase> {
 protected:
  AHostileName() {
    info = record(path, text, text);
    set(info.title, text);
    set(info.genre, text);
    set(info.composer, text);
    set(info.comment, text);
    set(info.container_type, text);
    set(info.video_codec, text);
  }

  const std::string text = GetParam().text;
  const std::string path = "/music/" + text;
  Record info;
};

TEST_P(AHostileName, IsStoredInEveryRowOfAFile) {
  insert(info);

  EXPECT_EQ(rows("SELECT path, title, agg_genre, comment, container, codec FROM track"),
            (std::vector<Row>{{path, text, text, text, text, text}}));
  EXPECT_EQ(only("genre", "genre_track"), text);
  EXPECT_EQ(only("composer", "composer_track"), text);
  EXPECT_EQ(only("artist", "artist_track"), text);
  EXPECT_EQ(rows("SELECT album, album_artist FROM album_track"), (std::vector<Row>{{text, text}}));
  EXPECT_TRUE(logged().empty());
}

TEST_P(AHostileName, IsStoredInEveryRowOfACutTrack) {
  insert(info);
  info.track = 1;
  const Record cue_sheet = record(path + ".cue");

  insert(info, cue_sheet);

  EXPECT_EQ(rows("SELECT path, title, agg_genre, comment, container, codec FROM track "
                 "WHERE is_virtual = 'TRUE'"),
            (std::vector<Row>{{path, text, text, text + path + ".cue", text, text}}));
  EXPECT_EQ(rows("SELECT audio_offset, cue_sheet_path FROM virtual_info_track"),
            (std::vector<Row>{{text, path + ".cue"}}));
}

TEST_P(AHostileName, IsATagToo) {
  set(info.album_artist, text);

  insert(info);

  EXPECT_EQ(rows("SELECT album_artist, from_album_artist FROM album_track"),
            (std::vector<Row>{{text, "TRUE"}}));
}

TEST_P(AHostileName, IsFoundByUpdateAndRecovery) {
  info.id = static_cast<std::uint32_t>(insert(info));
  insert(record("/music/other", "Other", text));

  EXPECT_EQ(MediaDBUpdateTrackRelatedTables(conn, &info), 0);
  EXPECT_EQ(album_artists(text), (std::vector<std::string>{"/TRUE", "/TRUE"}));
  EXPECT_EQ(MediaDBUpdateAlbumTrackTable(conn, "/music/other", 0), 0);

  EXPECT_EQ(album_artists(text), (std::vector<std::string>{text + "/FALSE", text + "/FALSE"}));
}

TEST_P(AHostileName, IsFoundByTheRecoveryOfACueSheet) {
  insert(record("/music/other", "Other", text));
  info.track = 1;
  const Record cue_sheet = record(path + ".cue");
  insert(info, cue_sheet);

  EXPECT_EQ(MediaDBUpdateAlbumTrackTable(conn, cue_sheet.path, 1), 0);

  EXPECT_EQ(album_artists(text), (std::vector<std::string>{"Other/FALSE", "Other/FALSE"}));
}

TEST_P(AHostileName, OfAPersonalFolderIsCounted) {
  rows("INSERT INTO personal_directory(path) VALUES(" + quoted(path) + "), ('/music/other')");

  EXPECT_EQ(MediaDBFindPersonalDirWithSamePath(conn, path.c_str()), 1);
}

INSTANTIATE_TEST_SUITE_P(
    Names, AHostileName,
    testing::Values(NameCase{"Quotes", "it's ''\"\"''"}, NameCase{"Injection", "x'), ('y'), --"},
                    NameCase{"Comparison", "x' OR '1'='1"}, NameCase{"Format", "100%s %n %5$d"},
                    NameCase{"Pattern", "%_____%"}, NameCase{"Backslash", "back\\slash\\' \\"},
                    NameCase{"Control", "two\r\nlines\x01\x1f\x7f"},
                    NameCase{"Placeholder", "@TAVO:VAR @TAVO:INT '@TAVO:NEVAR' $1 $$"},
                    NameCase{"Comment", "-- /* */ x"},
                    NameCase{"Script", "愛と誠 Кино 🎵\u202eabc\u0301"}),
    [](const auto& test) { return std::string(test.param.name); });

class AHostileRecord : public CatalogueTest {};

TEST_F(AHostileRecord, MayHaveALongPath) {
  const auto path = "/" + std::string(4000, '\'');

  insert(record(path));

  EXPECT_EQ(only("path", "track"), path);
  EXPECT_TRUE(logged().empty());
}

// Its attribute folder, which would hold its ratings, can have no name.
TEST_F(AHostileRecord, WithTheLongestPathIsThereWithoutItsRatings) {
  const auto path = "/" + std::string(4094, 'x');
  Record info = record(path, "X", "Hits");

  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 0), -1);

  EXPECT_EQ(logged_messages().back(), "Failed to insert rating data into rating_track table");
  EXPECT_EQ(only("path", "track"), path);
  EXPECT_EQ(album_artists("Hits"), (std::vector<std::string>{"X/FALSE"}));
}

TEST_F(AHostileRecord, MayFillEveryField) {
  Record info = record("/music/a.mp3", std::string(254, 'a'), std::string(254, 'b'));
  set(info.title, std::string(254, 't'));
  set(info.genre, std::string(254, 'g'));
  set(info.composer, std::string(254, 'c'));
  set(info.comment, std::string(254, 'm'));

  insert(info);

  EXPECT_EQ(rows("SELECT title, title_sort, agg_genre, comment FROM track"),
            (std::vector<Row>{{std::string(254, 't'), std::string(254, 'T'), std::string(254, 'g'),
                               std::string(254, 'm')}}));
  EXPECT_EQ(only("artist_sort", "artist_track"), std::string(254, 'A'));
}

TEST_F(AHostileRecord, WithBytesThatAreNoTextIsRefused) {
  const int other = insert(record("/music/good.mp3", "X", "Hits"));
  Record info = record("/music/bad.mp3", "\xff\xfe", "Hits");
  clear_log();

  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 0), -1);

  expect_failed_statement({"Failed to insert data into artist_track table"});
  EXPECT_EQ(value("SELECT artist FROM artist_track WHERE track = " + std::to_string(other)), "X");
  EXPECT_EQ(album_artists("Hits"), (std::vector<std::string>{"X/FALSE"}));
}

TEST_F(AHostileRecord, WithAPathThatIsNoTextIsRefused) {
  Record info = record("/music/\xe6\x84.mp3");

  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 0), -1);
  expect_failed_statement({"Failed to insert data into track table"});
  clear_log();
  EXPECT_EQ(MediaDBUpdateAlbumTrackTable(conn, info.path, 0), -1);
  expect_failed_statement({"Failed to check data in multiple album artist"});

  insert(record("/music/good.mp3"));
  EXPECT_EQ(count("track"), 1);
}

TEST_F(AHostileRecord, WithADateThatIsNoneIsRefused) {
  Record info = record("/music/a.mp3");
  set(info.date, "no date");

  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 0), -1);

  expect_failed_statement({"Failed to insert data into track table"});
}

TEST_F(AHostileRecord, MayHaveADurationThatIsNoNumber) {
  Record info = record("/music/a.mp3");
  info.duration = std::numeric_limits<float>::infinity();

  insert(info);

  EXPECT_EQ(only("duration", "track"), "inf");
}

}  // namespace
}  // namespace mediidx::test
