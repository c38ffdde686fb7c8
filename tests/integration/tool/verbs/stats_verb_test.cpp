// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "verb_test.h"

namespace mediidx::test {
namespace {

using testing::Contains;

class Stats : public VerbTest {
 protected:
  Stats() {
    save({.path = at("a.mp3"),
          .artist = "Ada",
          .album = "One",
          .genre = "Folk;Sea",
          .duration = 60,
          .filesize = 1000});
    save({.path = at("b.mp3"),
          .artist = "Bo",
          .album = "One",
          .genre = "Folk",
          .duration = 90,
          .filesize = 3000000000});
    rows("INSERT INTO video(path, duration, filesize, fs_online) VALUES ('/v', 10, 5, 'f')");
    rows("INSERT INTO photo(path, filesize) VALUES ('/p', 7)");
    rows("INSERT INTO directory(path) VALUES ('/d')");
    rows("INSERT INTO virtual_music(path, duration) VALUES ('/a', 30)");
    rows(
        "INSERT INTO track(userid, path, duration, filesize, is_virtual) "
        "VALUES (1026, '/home/x/a', '20.500000', 11, 'FALSE')");
    rows("INSERT INTO personal_playlist(userid, path, filesize) VALUES (1026, '/home/x/p', 3)");
    rows("INSERT INTO personal_directory(userid, path) VALUES (1026, '/home/x')");
    rows("INSERT INTO personal_directory(userid, path) VALUES (1027, '/home/y')");
  }
};

TEST_F(Stats, CountsEveryKind) {
  const auto counted = json({"stats"});
  const auto& kinds = counted["kinds"];
  EXPECT_EQ(kinds["music"]["number"], 2);
  EXPECT_EQ(kinds["music"]["duration"], 150.0);
  EXPECT_EQ(kinds["music"]["bytes"].asInt64(), 3000001000);
  EXPECT_EQ(kinds["music"]["offline"], 0);
  EXPECT_EQ(kinds["videos"]["offline"], 1);
  EXPECT_EQ(kinds["virtual_tracks"]["number"], 1);
  EXPECT_EQ(kinds["photos"]["bytes"], 7);
  EXPECT_EQ(kinds["playlists"]["number"], 0);
  EXPECT_EQ(kinds["folders"]["number"], 1);
  EXPECT_EQ(counted["artists"], 2);
  EXPECT_EQ(counted["genres"], 2);
  EXPECT_EQ(counted["converted_videos"], 0);
}

TEST_F(Stats, CountsAsManyAlbumsAsTheListHas) {
  EXPECT_EQ(json({"stats"})["albums"].asUInt(), json({"list", "albums"}).size());
}

TEST_F(Stats, TellsPersonalLibrariesApart) {
  const auto personal = json({"stats"})["personal"];
  EXPECT_THAT(personal.getMemberNames(), testing::ElementsAre("1026", "1027"));
  EXPECT_EQ(personal["1026"]["music"]["number"], 1);
  EXPECT_EQ(personal["1026"]["music"]["duration"], 20.5);
  EXPECT_EQ(personal["1026"]["playlists"]["bytes"], 3);
  EXPECT_EQ(personal["1027"]["folders"]["number"], 1);
}

TEST_F(Stats, CountsAVirtualTrackNotTwiceInTheTotal) {
  const auto total = json({"stats"})["total"];
  EXPECT_EQ(total["number"], 9);
  EXPECT_EQ(total["duration"], 180.5);
  EXPECT_EQ(total["bytes"].asInt64(), 3000001000 + 5 + 7 + 11 + 3);
  EXPECT_EQ(total["offline"], 1);
}

TEST_F(Stats, PrintsALineAKind) {
  const auto shown = lines(output({"stats"}));
  EXPECT_THAT(shown, Contains("music\t2\t2:30\t3000001000\t"));
  EXPECT_THAT(shown, Contains("videos\t1\t0:10\t5\t1"));
  EXPECT_THAT(shown, Contains("music of user 1026\t1\t0:20\t11\t"));
  EXPECT_THAT(shown, Contains("artists\t2\t\t\t"));
}

TEST_F(Stats, OfAnEmptyIndexAreZeros) {
  TestServer::get().fresh_database();
  const auto counted = json({"stats"});
  EXPECT_EQ(counted["kinds"]["music"]["number"], 0);
  EXPECT_EQ(counted["total"]["number"], 0);
  EXPECT_EQ(counted["albums"], 0);
  EXPECT_THAT(counted["personal"], IsEmpty());
}

}  // namespace
}  // namespace mediidx::test
