// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <filesystem>

#include "mediidx/database.h"
#include "verb_test.h"

namespace mediidx::test {
namespace {

using testing::Contains;
using testing::ElementsAre;

class Show : public VerbTest {};

TEST_F(Show, TellsAllThatIsKnownOfASong) {
  const auto id = save({.path = at("a.mp3"),
                        .title = "Boarding",
                        .artist = "Ada Brandt",
                        .album = "Night Ferry",
                        .composer = "Bo",
                        .genre = "Folk;Sea"});
  const float gains[] = {-6.5F, 0.9F, -7.25F, 1.0F};
  ASSERT_EQ(MediaInfoAudioRGMetadataDBSave(gains, id), 0);
  rows("INSERT INTO rating_track(userid, track, star) VALUES (1026, " + std::to_string(id) +
       ", 4)");
  const auto shown = json({"show", at("a.mp3")});
  EXPECT_EQ(shown["path"], at("a.mp3"));
  ASSERT_EQ(shown["music"].size(), 1U);
  EXPECT_EQ(shown["music"][0]["title"], "Boarding");
  EXPECT_EQ(shown["music"][0]["fs_online"], true);
  ASSERT_EQ(shown["track"].size(), 1U);
  const auto& track = shown["track"][0];
  EXPECT_EQ(track["id"].asUInt(), id);
  EXPECT_EQ(track["title_search"], "BOARDING");
  EXPECT_EQ(track["composer"], "Bo");
  EXPECT_EQ(track["artist"], "Ada Brandt");
  EXPECT_EQ(track["album"], "Night Ferry");
  EXPECT_EQ(track["album_artist"], "Ada Brandt");
  ASSERT_EQ(track["genres"].size(), 2U);
  EXPECT_EQ(track["genres"][0], "Folk");
  EXPECT_EQ(track["genres"][1], "Sea");
  EXPECT_EQ(track["rg_track_gain"], "-6.500000");
  EXPECT_EQ(track["rg_album_gain"], "-7.250000");
  ASSERT_EQ(track["ratings"].size(), 1U);
  EXPECT_EQ(track["ratings"][0]["userid"], 1026);
  EXPECT_EQ(track["ratings"][0]["star"], 4);
  EXPECT_THAT(shown["video"], IsEmpty());
}

TEST_F(Show, PrintsAValueALine) {
  const auto id = save({.path = at("a.mp3"), .title = "A\nB", .genre = "Folk;Sea"});
  rows("INSERT INTO rating_track(userid, track, star) VALUES (7, " + std::to_string(id) + ", 4)");
  const auto track = "track " + std::to_string(id);
  const auto shown = lines(output({"show", at("a.mp3")}));
  EXPECT_THAT(shown, Contains("music 1\ttitle\tA\\nB"));
  EXPECT_THAT(shown, Contains(track + "\tgenres\tFolk; Sea"));
  EXPECT_THAT(shown, Contains(track + "\tratings\t4 stars from user 7"));
}

TEST_F(Show, GivesTheTracksOfACueSheet) {
  const auto id = save({.path = at("a.mp3"), .title = "Side A"});
  rows("INSERT INTO virtual_info_track(track, audio_offset, cue_sheet_path) VALUES (" +
       std::to_string(id) + ", '00:00:00', " + quoted(at("a.cue")) + ")");
  const auto shown = json({"show", at("a.cue")});
  ASSERT_EQ(shown["track"].size(), 1U);
  EXPECT_EQ(shown["track"][0]["path"], at("a.mp3"));
  EXPECT_EQ(shown["track"][0]["cue_sheet_path"], at("a.cue"));
}

TEST_F(Show, FindsEveryKindOfRow) {
  const auto path = at("it's 100%_\\ OR.x");
  insert(path);
  insert(at("it's 100%_\\ ORx"));
  for (const char* table : {"virtual_music", "personal_playlist", "personal_directory"}) {
    rows(std::string("INSERT INTO ") + table + "(path) VALUES (" + quoted(path) + ")");
  }
  rows("INSERT INTO video_convert(video_path) VALUES (" + quoted(path) + ")");
  const auto shown = json({"show", path});
  for (const char* table : {"music", "virtual_music", "video", "photo", "playlist", "directory",
                            "personal_playlist", "personal_directory", "video_convert"}) {
    EXPECT_EQ(shown[table].size(), 1U) << table;
  }
}

TEST_F(Show, TakesAPathAsItIsWritten) {
  save({.path = at("sub/a.mp3")});
  EXPECT_EQ(json({"show", at("sub/../sub/./a.mp3")})["path"], at("sub/a.mp3"));
}

TEST_F(Show, FollowsALinkToWhatIsIndexed) {
  media.write("real/a.mp3", "x");
  std::filesystem::create_symlink(at("real"), at("link"));
  save({.path = at("real/a.mp3")});
  EXPECT_EQ(json({"show", at("link/a.mp3")})["path"], at("real/a.mp3"));
}

TEST_F(Show, FailsForWhatTheIndexDoesNotHold) {
  auto done = run({"show", at("a.mp3")});
  EXPECT_EQ(done.status, 1);
  EXPECT_EQ(done.out, "");
  EXPECT_EQ(done.err, "mediidx: the index holds nothing of " + at("a.mp3") + "\n");
  done = run({"show", "/\xE9"});
  EXPECT_EQ(done.status, 1);
  EXPECT_EQ(done.err, "mediidx: /\\xE9 is no UTF-8: the index cannot hold such a path\n");
  EXPECT_EQ(run({"show"}).status, 2);
}

}  // namespace
}  // namespace mediidx::test
