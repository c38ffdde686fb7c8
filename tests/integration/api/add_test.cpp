// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <json/reader.h>

#include <string>

#include "mediidx/database.h"
#include "request_test.h"

namespace mediidx::test {
namespace {

class AddingAFile : public RequestTest {};

TEST_F(AddingAFile, WritesARowOfItsType) {
  auto video = record(shared("a.mp4"));
  auto photo = record(shared("a.jpg"));
  auto playlist = record(shared("a.m3u"));
  EXPECT_EQ(TAVOMediaIndexAdd(&video, MEDIA_TABLE_VIDEO), 0);
  EXPECT_EQ(TAVOMediaIndexAdd(&photo, MEDIA_TABLE_PHOTO), 0);
  EXPECT_EQ(TAVOMediaIndexAdd(&playlist, MEDIA_TABLE_PLAYLIST), 0);
  EXPECT_THAT(paths("video"), ElementsAre(shared("a.mp4")));
  EXPECT_THAT(paths("photo"), ElementsAre(shared("a.jpg")));
  EXPECT_THAT(paths("playlist"), ElementsAre(shared("a.m3u")));
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(AddingAFile, SetsTheIdOfAMusicRecord) {
  auto song = record(shared("a.mp3"));
  EXPECT_EQ(TAVOMediaIndexAdd(&song, MEDIA_TABLE_MUSIC), 0);
  EXPECT_THAT(paths("track"), ElementsAre(shared("a.mp3")));
  EXPECT_EQ(std::to_string(song.id), value("SELECT id FROM track"));
}

TEST_F(AddingAFile, ReplacesTheRowOfItsPath) {
  auto video = record(shared("a.mp4"));
  EXPECT_EQ(TAVOMediaIndexAdd(&video, MEDIA_TABLE_VIDEO), 0);
  EXPECT_EQ(TAVOMediaIndexReindexUpdate(&video, MEDIA_TABLE_VIDEO), 0);
  EXPECT_EQ(count("video"), 1);
}

TEST_F(AddingAFile, NeedsARecord) {
  EXPECT_EQ(TAVOMediaIndexAdd(nullptr, MEDIA_TABLE_VIDEO), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Bad parameter"));
  EXPECT_EQ(logged()[0].priority, 3);
}

TEST_F(AddingAFile, RefusesAFolder) {
  auto info = record(root.make_folder("volume1/media/%s.mp4"));
  EXPECT_EQ(TAVOMediaIndexAdd(&info, MEDIA_TABLE_VIDEO), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre("mediidx:N Path should be a file, not a directory: " + shared("%s.mp4")));
  EXPECT_THAT(sent_statements(), IsEmpty());
}

TEST_F(AddingAFile, IgnoresOneOutsideOfTheIndex) {
  auto info = record(outside("a.mp4"));
  EXPECT_EQ(TAVOMediaIndexAdd(&info, MEDIA_TABLE_VIDEO), 0);
  EXPECT_THAT(sent_statements(), IsEmpty());
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(AddingAFile, IgnoresOneOnARemoteMount) {
  platform_answers().remote_mount = root.at("volume1/media");
  auto info = record(shared("a.mp4"));
  EXPECT_EQ(TAVOMediaIndexAdd(&info, MEDIA_TABLE_VIDEO), 0);
  EXPECT_THAT(sent_statements(), IsEmpty());
}

TEST_F(AddingAFile, IgnoresAnEmptyPath) {
  auto info = record("");
  EXPECT_EQ(TAVOMediaIndexAdd(&info, MEDIA_TABLE_VIDEO), 0);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N TAVOMediaIndexIsIndexPath: Bad parameter: path"));
  EXPECT_THAT(sent_statements(), IsEmpty());
}

TEST_F(AddingAFile, TakesAPersonalLibraryWhateverTheFolders) {
  auto info = record(root.at("homes/ann/Music/a.mp3"));
  EXPECT_EQ(TAVOMediaIndexAdd(&info, MEDIA_TABLE_MUSIC), 0);
  EXPECT_EQ(value("SELECT userid FROM track"), "1026");
}

TEST_F(AddingAFile, FailsWhenItCannotBeSaved) {
  take_away("video");
  auto info = record(shared("a.mp4"));
  EXPECT_EQ(TAVOMediaIndexAdd(&info, MEDIA_TABLE_VIDEO), -1);
  ASSERT_FALSE(logged().empty());
  EXPECT_EQ(log_lines().back(), "mediidx:N Failed to save media info.");
  EXPECT_EQ(logged().back().priority, 3);
}

TEST_F(AddingAFile, SavesACueSheetAsAPlaylist) {
  root.write("volume1/media/a.mp3", "no music");
  root.write("volume1/media/A.CUE",
             "FILE \"a.mp3\" MP3\n  TRACK 01 AUDIO\n    TITLE \"One\"\n    INDEX 01 00:00:00\n");
  auto info = record(shared("A.CUE"));
  EXPECT_EQ(TAVOMediaIndexAdd(&info, MEDIA_TABLE_PLAYLIST), 0);
  EXPECT_THAT(paths("playlist"), ElementsAre(shared("A.CUE")));
}

TEST_F(AddingAFile, TakesHostileNames) {
  for (const char* name : {"it's.mp4", "100%_\\.mp4", "line\nbreak.mp4", "@TAVO:VAR %s.mp4",
                           "'; DROP TABLE video; --.mp4"}) {
    auto info = record(shared(name));
    EXPECT_EQ(TAVOMediaIndexAdd(&info, MEDIA_TABLE_VIDEO), 0) << name;
    EXPECT_EQ(count("video", "path = " + quoted(shared(name))), 1) << name;
  }
  EXPECT_EQ(count("video"), 5);
}

class AddingJson : public RequestTest {
 protected:
  /// A song with these replay-gain members.
  Json::Value song(const char* gains) {
    Json::Value json;
    EXPECT_TRUE(Json::Reader().parse(gains, json));
    json["szPath"] = shared("a.mp3");
    return json;
  }
  std::vector<Row> stored_gains() {
    return rows(
        "SELECT rg_track_gain, rg_track_peak, rg_album_gain, rg_album_peak FROM replaygain_track");
  }
};

TEST_F(AddingJson, WritesARowOfItsType) {
  auto json = json_record(shared("a.mp4"));
  json["title"] = "A film";
  EXPECT_EQ(TAVOMediaIndexAdd_Json(json, MEDIA_TABLE_VIDEO), 0);
  EXPECT_EQ(rows("SELECT path, title FROM video"), (std::vector<Row>{{shared("a.mp4"), "A film"}}));
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(AddingJson, RefusesWhatHasNoPath) {
  Json::Value number_as_path(Json::objectValue);
  number_as_path["szPath"] = 7;
  for (const auto& json : {Json::Value(), Json::Value(Json::objectValue),
                           Json::Value(Json::arrayValue), Json::Value("/a"), number_as_path}) {
    clear_log();
    EXPECT_EQ(TAVOMediaIndexAdd_Json(json, MEDIA_TABLE_VIDEO), -1);
    EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Bad parameter"));
  }
}

TEST_F(AddingJson, RefusesAFolder) {
  const auto folder = root.make_folder("volume1/media/sub");
  EXPECT_EQ(TAVOMediaIndexAdd_Json(json_record(folder), MEDIA_TABLE_VIDEO), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre("mediidx:N Path should be a file, not a directory: " + folder));
}

TEST_F(AddingJson, IgnoresAFileOutsideOfTheIndex) {
  EXPECT_EQ(TAVOMediaIndexAdd_Json(json_record(outside("a.mp4")), MEDIA_TABLE_VIDEO), 0);
  EXPECT_THAT(sent_statements(), IsEmpty());
}

TEST_F(AddingJson, FailsWhenItCannotBeSaved) {
  take_away("photo");
  EXPECT_EQ(TAVOMediaIndexAdd_Json(json_record(shared("a.jpg")), MEDIA_TABLE_PHOTO), -1);
  EXPECT_EQ(log_lines().back(), "mediidx:N Failed to save media info.");
}

TEST_F(AddingJson, FailsForAPathThatNoRecordHolds) {
  const auto path = shared(std::string(20000, 'x') + ".mp4");
  EXPECT_EQ(TAVOMediaIndexAdd_Json(json_record(path), MEDIA_TABLE_VIDEO), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Failed to save media info."));
  EXPECT_EQ(count("video"), 0);
}

TEST_F(AddingJson, StoresReplayGainOfMusic) {
  const auto json = song(R"({"rg_track_gain": -6.5, "rg_track_peak": 1, "rg_album_gain": "+2.25",
                             "rg_album_peak": " 0.5"})");
  EXPECT_EQ(TAVOMediaIndexAdd_Json(json, MEDIA_TABLE_MUSIC), 0);
  EXPECT_EQ(stored_gains(), (std::vector<Row>{{"-6.500000", "1.000000", "2.250000", "0.500000"}}));
  EXPECT_EQ(value("SELECT track FROM replaygain_track"), value("SELECT id FROM track"));
}

TEST_F(AddingJson, TakesReplayGainOfAnotherTypeAsZero) {
  const auto json = song(R"({"rg_track_gain": [], "rg_track_peak": "loud", "rg_album_gain": {}})");
  EXPECT_EQ(TAVOMediaIndexAdd_Json(json, MEDIA_TABLE_MUSIC), 0);
  EXPECT_EQ(stored_gains(), (std::vector<Row>{{"0.000000", "0.000000", "0.000000", "0.000000"}}));
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(AddingJson, HoldsReplayGainWithinAFloat) {
  const auto json = song(R"({"rg_track_gain": 1e300, "rg_track_peak": "-1e300",
                             "rg_album_gain": "nan", "rg_album_peak": "inf"})");
  EXPECT_EQ(TAVOMediaIndexAdd_Json(json, MEDIA_TABLE_MUSIC), 0);
  const std::string largest = "340282346638528859811704183484516925440.000000";
  EXPECT_EQ(stored_gains(), (std::vector<Row>{{largest, "-" + largest, "0.000000", "0.000000"}}));
}

TEST_F(AddingJson, StoresNoReplayGainWithoutATrackGain) {
  EXPECT_EQ(TAVOMediaIndexAdd_Json(song(R"({"rg_album_gain": 1})"), MEDIA_TABLE_MUSIC), 0);
  EXPECT_EQ(TAVOMediaIndexAdd_Json(song(R"({"rg_track_gain": null})"), MEDIA_TABLE_MUSIC), 0);
  EXPECT_EQ(count("track"), 1);
  EXPECT_EQ(count("replaygain_track"), 0);
}

TEST_F(AddingJson, StoresNoReplayGainOfOtherMedia) {
  EXPECT_EQ(TAVOMediaIndexAdd_Json(song(R"({"rg_track_gain": 1})"), MEDIA_TABLE_VIDEO), 0);
  EXPECT_EQ(count("video"), 1);
  EXPECT_EQ(count("replaygain_track"), 0);
}

TEST_F(AddingJson, FailsWhenReplayGainCannotBeSaved) {
  take_away("replaygain_track");
  EXPECT_EQ(TAVOMediaIndexAdd_Json(song(R"({"rg_track_gain": 1})"), MEDIA_TABLE_MUSIC), -1);
  EXPECT_EQ(log_lines().back(), "mediidx:N Failed to save replayGain metadata.");
  EXPECT_EQ(count("track"), 1);
}

TEST_F(AddingJson, SavesACueSheetAsAPlaylist) {
  root.write("volume1/media/a.mp3", "no music");
  root.write("volume1/media/a.cue",
             "FILE \"a.mp3\" MP3\n  TRACK 01 AUDIO\n    TITLE \"One\"\n    INDEX 01 00:00:00\n");
  EXPECT_EQ(TAVOMediaIndexAdd_Json(json_record(shared("a.cue")), MEDIA_TABLE_PLAYLIST), 0);
  EXPECT_THAT(paths("playlist"), ElementsAre(shared("a.cue")));
}

/// Compilers may take it that two names are two functions: they are not to know which it is.
template <class Function>
Function* linked(Function* function) {
  Function* volatile found = function;
  return found;
}

TEST(SecondNames, AreTheSameFunctions) {
  EXPECT_EQ(linked(&TAVOMediaIndexReindexUpdate), linked(&TAVOMediaIndexAdd));
  EXPECT_EQ(linked(&TAVOMediaIndexReindexUpdate_Json), linked(&TAVOMediaIndexAdd_Json));
  EXPECT_EQ(linked(&TAVOMediaIndexReindexDirUpdate), linked(&TAVOMediaIndexDirAdd));
  EXPECT_EQ(linked(&TAVOMediaIndexDBGetOne), linked(&MediaInfoDBGetOne));
  EXPECT_EQ(linked(&TAVOMediaIndexDBVacuum), linked(&MediaDBVacuum));
}

}  // namespace
}  // namespace mediidx::test
