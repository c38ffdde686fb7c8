// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "catalogue_fixture.h"

namespace mediidx::test {
namespace {

const std::string kProperties =
    "SELECT channel, frequency, bitrate, container, codec FROM track WHERE is_virtual = 'TRUE' "
    "ORDER BY id";

class AWholeTrack : public CatalogueTest {
 protected:
  static Record audio_file() {
    Record info = record("/music/a.flac", "X", "Hits");
    info.channel = 2;
    info.frequency = 44100;
    info.bitrate = 900000;
    set(info.container_type, "flac");
    set(info.video_codec, "flac");
    return info;
  }
  static Record part(int track) { return virtual_record("/music/a.flac", track, "X", "Hits"); }

  const Record cue_sheet = record("/music/a.cue");
  const Row properties{"2", "44100", "900000", "flac", "flac"};
};

TEST_F(AWholeTrack, HasARowInEachTable) {
  const int id = insert(audio_file());

  const auto track = "track = " + std::to_string(id);
  for (const std::string table : {"genre_track", "composer_track", "artist_track", "album_track"}) {
    EXPECT_EQ(count(table, track), 1) << table;
  }
  EXPECT_EQ(count("virtual_info_track"), 0);
  EXPECT_TRUE(logged().empty());
}

TEST_F(AWholeTrack, CutFromACueSheetHasItsOriginToo) {
  const int id = insert(part(3), cue_sheet);

  EXPECT_EQ(rows("SELECT * FROM virtual_info_track"),
            (std::vector<Row>{{std::to_string(id), "00:00:00", "/music/a.cue"}}));
}

TEST_F(AWholeTrack, SetsTheRecordsId) {
  insert(record("/music/other.mp3"));
  Record info = audio_file();

  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 0), 0);

  EXPECT_EQ(std::to_string(info.id), value("SELECT id FROM track WHERE path = '/music/a.flac'"));
}

TEST_F(AWholeTrack, BelongsToItsUser) {
  Record info = audio_file();

  MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 4294967295);

  EXPECT_EQ(only("userid", "track"), "4294967295");
}

TEST_F(AWholeTrack, CutFromAKnownFileTakesItsProperties) {
  insert(audio_file());

  insert(part(1), cue_sheet);
  insert(part(2), cue_sheet);

  EXPECT_EQ(rows(kProperties), (std::vector<Row>{properties, properties}));
  EXPECT_EQ(value("SELECT has_virtual FROM track WHERE is_virtual = 'FALSE'"), "TRUE");
}

TEST_F(AWholeTrack, ThatComesAfterItsCueSheetGivesItsProperties) {
  insert(part(1), cue_sheet);
  insert(part(2), cue_sheet);

  insert(audio_file());

  EXPECT_EQ(rows(kProperties), (std::vector<Row>{properties, properties}));
  EXPECT_EQ(value("SELECT has_virtual FROM track WHERE is_virtual = 'FALSE'"), "TRUE");
}

TEST_F(AWholeTrack, WithoutACueSheetIsNotMarked) {
  insert(audio_file());
  insert(virtual_record("/music/b.flac", 1), cue_sheet);

  EXPECT_EQ(value("SELECT has_virtual FROM track WHERE is_virtual = 'FALSE'"), "FALSE");
}

TEST_F(AWholeTrack, StaysMarkedWhenItsCueSheetIsGone) {
  insert(audio_file());
  insert(part(1), cue_sheet);

  rows("DELETE FROM track WHERE is_virtual = 'TRUE'");

  EXPECT_EQ(only("has_virtual", "track"), "TRUE");
}

TEST_F(AWholeTrack, IsUpdatedWithItsTags) {
  Record info = audio_file();
  set(info.genre, "Rock;Pop");
  info.id = static_cast<std::uint32_t>(insert(info));
  set(info.genre, "Jazz");
  set(info.composer, "C");
  set(info.artist, "Y");
  set(info.album, "Best");
  set(info.album_artist, "Z");
  set(info.title, "New");

  EXPECT_EQ(MediaDBUpdateTrackRelatedTables(conn, &info), 0);

  EXPECT_EQ(only("title", "track"), "New");
  EXPECT_EQ(only("genre", "genre_track"), "Jazz");
  EXPECT_EQ(only("composer", "composer_track"), "C");
  EXPECT_EQ(only("artist || has_album_artist", "artist_track"), "YTRUE");
  EXPECT_EQ(album_artists("Best"), (std::vector<std::string>{"Z/TRUE"}));
  EXPECT_TRUE(album_artists("Hits").empty());
}

TEST_F(AWholeTrack, KeepsOriginRatingsAndGainsInAnUpdate) {
  Record info = part(1);
  info.id = static_cast<std::uint32_t>(insert(info, cue_sheet));
  const auto id = std::to_string(info.id);
  rows("INSERT INTO rating_track VALUES(1001, " + id + ", 4)");
  rows("INSERT INTO replaygain_track VALUES(" + id + ", '1', '2', '3', '4')");

  EXPECT_EQ(MediaDBUpdateTrackRelatedTables(conn, &info), 0);

  EXPECT_EQ(count("virtual_info_track"), 1);
  EXPECT_EQ(only("star", "rating_track"), "4");
  EXPECT_EQ(count("replaygain_track"), 1);
}

TEST_F(AWholeTrack, LosesOnlyItsTagRowsWhenTheyAreDeleted) {
  Record info = audio_file();
  info.id = static_cast<std::uint32_t>(insert(info));
  const auto other = std::to_string(insert(record("/music/other.mp3")));

  EXPECT_EQ(MediaDBDeleteRecordsInRelatedTables(conn, &info), 0);

  EXPECT_EQ(count("track"), 2);
  for (const std::string table : {"genre_track", "composer_track", "artist_track", "album_track"}) {
    EXPECT_EQ(rows("SELECT track FROM " + table), (std::vector<Row>{{other}})) << table;
  }
}

TEST_F(AWholeTrack, LosesItsTagRowsWhateverTheConnectionSaysItIs) {
  Record info = audio_file();
  info.id = static_cast<std::uint32_t>(insert(info));
  int asked = 0;
  platform_fakes().database_type = [&asked] { return ++asked == 1 ? 1 : 99; };

  EXPECT_EQ(MediaDBDeleteRecordsInRelatedTables(conn, &info), 0);

  EXPECT_EQ(asked, 1);
  EXPECT_EQ(count("genre_track"), 0);
}

}  // namespace
}  // namespace mediidx::test
