// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// What the requests take and give back.
#include <tavodb.h>

#include <filesystem>

#include "mediidx/database.h"
#include "twin_test.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class AddingMany : public TwinTest {
 protected:
  AddingMany() { use(Side::kTogether); }
};

TEST_F(AddingMany, GivesOneResultARecord) {
  std::vector<Info> videos{record(shared("a.mp4")), record(root.make_folder("volume1/media/b.mp4")),
                           record(outside("c.mp4")), record(""), record(shared("d.mp4"))};
  const auto given = add_to_both(videos, MEDIA_TABLE_VIDEO);
  EXPECT_THAT(given.results, ElementsAre(0, -1, 0, 0, 0));
  EXPECT_THAT(given.log,
              ElementsAre("mediidx:101 Path should be a file, not a directory: " + shared("b.mp4"),
                          "mediidx:301 TAVOMediaIndexIsIndexPath: Bad parameter: path"));
  EXPECT_EQ(count("video"), 2);
}

TEST_F(AddingMany, SetsTheIdsOfSongs) {
  std::vector<Info> songs{record(shared("a.mp3")), record(shared("b.mp3")),
                          record(shared("a.mp3"))};
  EXPECT_EQ(TAVOMediaIndexAddMany(songs.data(), 3, MEDIA_TABLE_MUSIC, nullptr), 0);
  EXPECT_EQ(value("SELECT path FROM track WHERE id = " + std::to_string(songs[1].id)),
            shared("b.mp3"));
  EXPECT_EQ(value("SELECT path FROM track WHERE id = " + std::to_string(songs[2].id)),
            shared("a.mp3"));
  EXPECT_EQ(count("track", "id = " + std::to_string(songs[0].id)), 0) << "it was replaced";
  EXPECT_NE(songs[0].id, 0U);
}

TEST_F(AddingMany, TakesNoRecords) {
  EXPECT_EQ(TAVOMediaIndexAddMany(nullptr, 0, MEDIA_TABLE_VIDEO, nullptr), 0);
  EXPECT_EQ(TAVOMediaIndexAddMany_Json(Json::Value(Json::arrayValue), MEDIA_TABLE_VIDEO, nullptr),
            0);
  EXPECT_EQ(TAVOMediaIndexDirAddMany(nullptr, 0, nullptr), 0);
  EXPECT_THAT(logged(), IsEmpty());
  EXPECT_EQ(platform_calls().statements, 0);
}

TEST_F(AddingMany, NeedsRecords) {
  std::vector<int> results(2, 77);
  EXPECT_EQ(TAVOMediaIndexAddMany(nullptr, 2, MEDIA_TABLE_VIDEO, results.data()), -1);
  EXPECT_THAT(results, ElementsAre(-1, -1));
  EXPECT_EQ(TAVOMediaIndexDirAddMany(nullptr, 2, nullptr), -1);
  EXPECT_EQ(TAVOMediaIndexAddMany_Json(Json::Value("text"), MEDIA_TABLE_VIDEO, nullptr), -1);
  EXPECT_THAT(logged_messages(), ElementsAre("Bad parameter", "Bad parameter", "Bad parameter"));
}

TEST_F(AddingMany, IsPartOfTheCallersTransaction) {
  std::vector<Info> songs{record(shared("a.mp3")), record(shared("b.mp3"))};
  const auto folder = folder_record(root.make_folder("volume1/media/c"));
  auto* conn = MediaDBConnGet();
  for (const char* end : {"ROLLBACK", "COMMIT"}) {
    ASSERT_EQ(TAVODBExecute(conn, "BEGIN", nullptr), 0);
    EXPECT_EQ(TAVOMediaIndexAddMany(songs.data(), 2, MEDIA_TABLE_MUSIC, nullptr), 0);
    EXPECT_EQ(TAVOMediaIndexDirAddMany(&folder, 1, nullptr), 0);
    EXPECT_EQ(count("track") + count("directory"), 0) << "nobody else sees them yet";
    ASSERT_EQ(TAVODBExecute(conn, end, nullptr), 0);
    EXPECT_EQ(count("track") + count("directory"), end == std::string("COMMIT") ? 3 : 0);
  }
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(AddingMany, RefusesATypeThatIsNoFiles) {
  std::vector<Info> records{record(shared("a.mp3")), record(shared("b.mp3"))};
  for (const MEDIA_TABLE_TYPE type : {MEDIA_TABLE_VIDEO_CONVERT, MEDIA_TABLE_FOLDER}) {
    add_to_both(records, type);
  }
  expect_same_content();
}

TEST_F(AddingMany, OfJsonFailsForWhatIsNoRecord) {
  Json::Value array(Json::arrayValue);
  array.append("text");
  array.append(Json::Value(Json::objectValue));
  array.append(Json::Value());
  Json::Value song(Json::objectValue);
  song["szPath"] = shared("a.mp3");
  array.append(song);
  song["szPath"] = shared(std::string(5000, 'x'));
  array.append(song);
  const auto given = add_to_both(array, MEDIA_TABLE_MUSIC);
  EXPECT_EQ(given.results[3], 0);
  EXPECT_EQ(count("track"), 1);
  expect_same_content();
}

TEST_F(AddingMany, TouchesTheMarkerOfChangedTables) {
  auto song = record(shared("a.mp3"));
  auto photo = record(shared("a.jpg"));
  EXPECT_EQ(TAVOMediaIndexAddMany(&photo, 1, MEDIA_TABLE_PHOTO, nullptr), 0);
  EXPECT_FALSE(root.exists("tmp/tavoindexdaapd_checkin"));
  EXPECT_EQ(TAVOMediaIndexAddMany(&song, 1, MEDIA_TABLE_MUSIC, nullptr), 0);
  EXPECT_TRUE(root.exists("tmp/tavoindexdaapd_checkin"));
  std::filesystem::remove(root.at("tmp/tavoindexdaapd_checkin"));
  auto video = record(shared("a.mp4"));
  EXPECT_EQ(TAVOMediaIndexAddMany(&video, 1, MEDIA_TABLE_VIDEO, nullptr), 0);
  EXPECT_TRUE(root.exists("tmp/tavoindexdaapd_checkin"));
}

TEST_F(AddingMany, CutsCueSheetsAtTheLengthsOfTheirFiles) {
  auto song = record(shared("a.mp3"));
  song.duration = 200;
  ASSERT_EQ(TAVOMediaIndexAddMany(&song, 1, MEDIA_TABLE_MUSIC, nullptr), 0);
  root.write("volume1/media/a.cue",
             "REM COMMENT \"Ünder 日本語\"\nFILE \"a.mp3\" MP3\nTRACK 1 AUDIO\nINDEX 01 00:00:00\n"
             "TRACK 2 AUDIO\nINDEX 01 02:00:00\n");
  auto sheet = record(shared("a.cue"));
  EXPECT_EQ(TAVOMediaIndexAddMany(&sheet, 1, MEDIA_TABLE_PLAYLIST, nullptr), 0);
  EXPECT_EQ(rows("SELECT track, duration FROM virtual_music ORDER BY track"),
            (std::vector<Row>{{"1", "120"}, {"2", "80"}}));
}

}  // namespace
}  // namespace mediidx::test
