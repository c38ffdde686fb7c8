// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include <cfloat>

#include "catalogue_fixture.h"

namespace mediidx::test {
namespace {

class ASideRow : public CatalogueTest {
 protected:
  ASideRow() { rows("INSERT INTO track(id) VALUES(7)"); }
  std::vector<Row> genres() { return rows("SELECT * FROM genre_track"); }

  Record info = record("/music/a.mp3");
};

TEST_F(ASideRow, HoldsEachGenre) {
  set(info.genre, "Rock;;Pop");

  EXPECT_EQ(MediaDBInsertIntoGenreTrackTable(conn, &info, 7), 0);

  EXPECT_EQ(genres(),
            (std::vector<Row>{{"7", "Rock", "ROCK", "ROCK"}, {"7", "Pop", "POP", "POP"}}));
}

TEST_F(ASideRow, HoldsEveryGenreTrimmed) {
  set(info.genre, "; The Blues ; ;\tPop;");

  EXPECT_EQ(MediaDBInsertIntoGenreTrackTable(conn, &info, 7), 0);

  EXPECT_EQ(genres(), (std::vector<Row>{{"7", "The Blues", "BLUES", "THE BLUES"},
                                        {"7", "", "", ""},
                                        {"7", "Pop", "POP", "POP"}}));
}

TEST_F(ASideRow, HoldsAnEmptyGenre) {
  EXPECT_EQ(MediaDBInsertIntoGenreTrackTable(conn, &info, 7), 0);

  EXPECT_EQ(genres(), (std::vector<Row>{{"7", "", "", ""}}));
}

TEST_F(ASideRow, HoldsAGenreOfSeparators) {
  set(info.genre, ";;");

  EXPECT_EQ(MediaDBInsertIntoGenreTrackTable(conn, &info, 7), 0);

  EXPECT_EQ(genres(), (std::vector<Row>{{"7", ";;", ";;", ";;"}}));
}

TEST_F(ASideRow, HoldsOneGenreAsItIs) {
  EXPECT_EQ(MediaDBInsertOneGenreRecord(conn, " a;b ", 7), 0);

  EXPECT_EQ(genres(), (std::vector<Row>{{"7", " a;b ", " A;B ", " A;B "}}));
}

TEST_F(ASideRow, OfAGenreStaysWhenTheNextFails) {
  set(info.genre, "Rock;Pop;Jazz");
  rows("ALTER TABLE genre_track ADD CHECK (genre <> 'Pop')");

  EXPECT_EQ(MediaDBInsertIntoGenreTrackTable(conn, &info, 7), -1);

  EXPECT_EQ(genres(), (std::vector<Row>{{"7", "Rock", "ROCK", "ROCK"}}));
  expect_failed_statement({"Failed to insert one genre record into genre_track table"});
}

TEST_F(ASideRow, IsNotWrittenWhenGenresCannotBeCopied) {
  platform_fakes().strdup_fails = true;

  EXPECT_EQ(MediaDBInsertIntoGenreTrackTable(conn, &info, 7), -1);

  platform_fakes().strdup_fails = false;
  expect_messages({"Failed to strdup. Cannot allocate memory"});
  EXPECT_TRUE(sent_statements().empty());
}

TEST_F(ASideRow, HoldsTheComposerUncut) {
  set(info.composer, "The Composer; Another");

  EXPECT_EQ(MediaDBInsertIntoComposerTrackTable(conn, &info, 7), 0);

  EXPECT_EQ(rows("SELECT * FROM composer_track"),
            (std::vector<Row>{
                {"7", "The Composer; Another", "COMPOSER; ANOTHER", "THE COMPOSER; ANOTHER"}}));
}

TEST_F(ASideRow, HoldsTheArtistUncut) {
  set(info.artist, "An Artist;b");

  EXPECT_EQ(MediaDBInsertIntoArtistTrackTable(conn, &info, 7), 0);

  EXPECT_EQ(rows("SELECT * FROM artist_track"),
            (std::vector<Row>{{"7", "An Artist;b", "ARTIST;B", "AN ARTIST;B", "FALSE"}}));
}

TEST_F(ASideRow, OfAnArtistTellsOfAnAlbumArtist) {
  set(info.album_artist, "Various");

  EXPECT_EQ(MediaDBInsertIntoArtistTrackTable(conn, &info, 7), 0);

  EXPECT_EQ(only("has_album_artist", "artist_track"), "TRUE");
}

TEST_F(ASideRow, HoldsTheAlbumAndTheGivenAlbumArtist) {
  set(info.album, "The Album");
  set(info.album_artist, "not this");

  EXPECT_EQ(MediaDBInsertIntoAlbumTrackTable(conn, &info, "A Band", 7, 1), 0);
  EXPECT_EQ(MediaDBInsertIntoAlbumTrackTable(conn, &info, "", 7, 0), 0);

  EXPECT_EQ(rows("SELECT * FROM album_track"),
            (std::vector<Row>{
                {"7", "The Album", "ALBUM", "THE ALBUM", "A Band", "BAND", "A BAND", "TRUE"},
                {"7", "The Album", "ALBUM", "THE ALBUM", "", "", "", "FALSE"}}));
}

TEST_F(ASideRow, HoldsTheOffsetAndTheCueSheet) {
  set(info.comment, "03:25:10");
  const Record cue_sheet = record("/music/a.cue");

  EXPECT_EQ(MediaDBInsertIntoVirtualInfoTrackTable(conn, &info, &cue_sheet, 7), 0);

  EXPECT_EQ(rows("SELECT * FROM virtual_info_track"),
            (std::vector<Row>{{"7", "03:25:10", "/music/a.cue"}}));
}

TEST_F(ASideRow, HoldsReplayGains) {
  const float gains[] = {-6.5F, 0.988F, -FLT_MAX, 1};

  EXPECT_EQ(MediaDBInsertIntoReplayGainTrackTable(conn, gains, 7), 0);

  EXPECT_EQ(rows("SELECT * FROM replaygain_track"),
            (std::vector<Row>{{"7", "-6.500000", "0.988000",
                               "-340282346638528859811704183484516925440.000000", "1.000000"}}));
}

TEST_F(ASideRow, GoesWithItsTrack) {
  const float gains[] = {1, 2, 3, 4};
  MediaDBInsertIntoReplayGainTrackTable(conn, gains, 7);

  rows("DELETE FROM track");

  EXPECT_EQ(count("replaygain_track"), 0);
}

class APersonalFolder : public CatalogueTest {};

TEST_F(APersonalFolder, IsCountedByItsPath) {
  rows("INSERT INTO personal_directory(path) VALUES('/home/u/music'), ('/home/u/music'), ('/x')");

  EXPECT_EQ(MediaDBFindPersonalDirWithSamePath(conn, "/home/u/music"), 2);
}

TEST_F(APersonalFolder, ThatIsUnknownCountsAsNone) {
  rows("INSERT INTO personal_directory(path) VALUES('/home/u/music')");

  EXPECT_EQ(MediaDBFindPersonalDirWithSamePath(conn, "/home/u/musi_"), 0);
}

class RatingsOfASong : public CatalogueTest {
 protected:
  RatingsOfASong() {
    root.add_user("ann", 1001, root.at("home/ann"));
    root.add_user("bob", 1002, root.at("home/bob"));
    rows("INSERT INTO track(id) VALUES(7)");
  }
  void rate(const std::string& name, const std::string& lines) {
    root.write("song/@eaDir/" + name + "/TAVOAUDIO_SONG_RATING", lines);
  }
  std::vector<Row> ratings() { return rows("SELECT * FROM rating_track ORDER BY userid"); }

  Record info = record(root.at("song/a.mp3"));
};

TEST_F(RatingsOfASong, AreNoneWithoutAFile) {
  EXPECT_EQ(MediaDBInsertIntoRatingTrackTable(conn, &info, 7, 0), 0);

  EXPECT_TRUE(ratings().empty());
  EXPECT_TRUE(logged().empty());
}

TEST_F(RatingsOfASong, AreStoredForEachUser) {
  rate("a.mp3", "1001=5\n1002=3\n");

  EXPECT_EQ(MediaDBInsertIntoRatingTrackTable(conn, &info, 7, 0), 0);

  EXPECT_EQ(ratings(), (std::vector<Row>{{"1001", "7", "5"}, {"1002", "7", "3"}}));
}

TEST_F(RatingsOfASong, OfUsersThatAreGoneAreLeftOut) {
  rate("a.mp3", "1001=5\n1999=1\n");

  EXPECT_EQ(MediaDBInsertIntoRatingTrackTable(conn, &info, 7, 0), 0);

  EXPECT_EQ(ratings(), (std::vector<Row>{{"1001", "7", "5"}}));
  EXPECT_TRUE(logged().empty());
}

TEST_F(RatingsOfASong, ThatNoIdOrCountCanBeAreLeftOut) {
  // 4294968297 is 1001 in its low half.
  rate("a.mp3", "4294968297=5\n-1=2\nann=4\n1001=99999999999\n1002=2\n");

  EXPECT_EQ(MediaDBInsertIntoRatingTrackTable(conn, &info, 7, 0), 0);

  EXPECT_EQ(ratings(), (std::vector<Row>{{"1002", "7", "2"}}));
}

TEST_F(RatingsOfASong, OfAVirtualTrackAreItsOwn) {
  rate("a.mp3", "1001=1\n");
  rate("a.mp3_3", "1001=5\n");
  info.track = 3;

  EXPECT_EQ(MediaDBInsertIntoRatingTrackTable(conn, &info, 7, 1), 0);

  EXPECT_EQ(ratings(), (std::vector<Row>{{"1001", "7", "5"}}));
}

TEST_F(RatingsOfASong, ComeWithAWholeTrack) {
  rate("a.mp3", "1001=1\n");
  rate("a.mp3_3", "1002=5\n");
  Record track = virtual_record(info.path, 3);

  const int actual = insert(info);
  const int part = insert(track, record(root.at("song/a.cue")));

  EXPECT_EQ(ratings(), (std::vector<Row>{{"1001", std::to_string(actual), "1"},
                                         {"1002", std::to_string(part), "5"}}));
}

TEST_F(RatingsOfASong, ThatCannotBeWrittenDoNotKeepTheOthersOut) {
  rate("a.mp3", "1001=5\n1002=3\n");
  rows("ALTER TABLE rating_track ADD CHECK (userid <> 1001)");

  EXPECT_EQ(MediaDBInsertIntoRatingTrackTable(conn, &info, 7, 0), 0);

  EXPECT_EQ(ratings(), (std::vector<Row>{{"1002", "7", "3"}}));
  ASSERT_EQ(logged_messages().size(), 1U);
  EXPECT_TRUE(
      logged_messages()[0].starts_with("Failed to exec [INSERT INTO rating_track(userid, "
                                       "track, star) VALUES(1001, 7, 5)] (ERROR:"))
      << logged_messages()[0];
  EXPECT_TRUE(logged_messages()[0].ends_with(").")) << logged_messages()[0];
  EXPECT_TRUE(logged()[0].text.starts_with("mediidx_database:"));
}

TEST_F(RatingsOfASong, NeedTheirMemory) {
  platform_fakes().hash_alloc_fails = true;

  EXPECT_EQ(MediaDBInsertIntoRatingTrackTable(conn, &info, 7, 0), -1);

  expect_messages({"Failed to alloc memory"});
}

TEST_F(RatingsOfASong, ThatCannotBeReadAreAFailure) {
  root.make_folder("song/@eaDir/a.mp3/TAVOAUDIO_SONG_RATING");

  EXPECT_EQ(MediaDBInsertIntoRatingTrackTable(conn, &info, 7, 0), -1);

  ASSERT_FALSE(logged().empty());
  EXPECT_EQ(logged_messages().back(),
            "Failed to get song rating from path [" + root.at("song/a.mp3") + "]");
  EXPECT_TRUE(logged().back().text.starts_with("mediidx_database:"));
}

TEST_F(RatingsOfASong, AreLookedUpUnderACutName) {
  const Record deep = record("/" + std::string(4094, 'x'));
  Record part = deep;
  part.track = 123456789;

  MediaDBInsertIntoRatingTrackTable(conn, &part, 7, 1);

  const auto cut = std::string(deep.path) + "_1234567";
  ASSERT_FALSE(logged().empty());
  EXPECT_EQ(logged_messages().back(), "Failed to get song rating from path [" + cut + "]");
}

}  // namespace
}  // namespace mediidx::test
