// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The order of events leaves no trace: after a scan the index is what a first scan would have made.
#include <fstream>

#include "scan_fixture.h"

namespace mediidx::test {
namespace {

class History : public ScanTest {
 protected:
  std::vector<Row> albums() {
    return rows(
        "SELECT t.title, a.album_artist, a.from_album_artist FROM track t "
        "JOIN album_track a ON a.track = t.id ORDER BY t.title");
  }
  /// A song, and a sheet that cuts it in two.
  void write_sheet(const std::string& name, const std::string& audio, const std::string& artist,
                   const std::string& album) const {
    media.write("m/" + name, "PERFORMER \"" + artist + "\"\nTITLE \"" + album + "\"\nFILE \"" +
                                 audio +
                                 "\" WAVE\n  TRACK 01 AUDIO\n    TITLE \"One\"\n"
                                 "    PERFORMER \"" +
                                 artist +
                                 "\"\n    INDEX 01 00:00:00\n"
                                 "  TRACK 02 AUDIO\n    TITLE \"Two\"\n    PERFORMER \"" +
                                 artist + "\"\n    INDEX 01 00:01:00\n");
  }
};

TEST_F(History, OfAnAlbumsSecondArtistIsForgottenWithItsFolder) {
  song("one/a.mp3", {"A", "Hits", "X", ""});
  song("one/b.mp3", {"B", "Hits", "X", ""});
  song("two/c.mp3", {"C", "Hits", "Y", ""});
  index();
  EXPECT_THAT(albums(),
              ElementsAre(Row{"A", "", "TRUE"}, Row{"B", "", "TRUE"}, Row{"C", "", "TRUE"}));
  remove("two");
  expect_scan(0, {.removed = 1});
  EXPECT_THAT(albums(), ElementsAre(Row{"A", "X", "FALSE"}, Row{"B", "X", "FALSE"}));
  expect_as_fresh();
}

TEST_F(History, OfARecoveryDoesNotCostATaggedAlbumArtist) {
  song("a.mp3", {"A", "Hits", "X", ""});
  song("b.mp3", {"B", "Hits", "Y", ""});
  song("c.mp3", {"C", "Hits", "X", "The Band"});
  index();
  remove("b.mp3");
  expect_scan(0, {.removed = 1});
  EXPECT_THAT(albums(), ElementsAre(Row{"A", "X", "FALSE"}, Row{"C", "The Band", "TRUE"}));
  expect_as_fresh();
}

TEST_F(History, OfARetaggedFileIsForgotten) {
  song("a.mp3", {"A", "Hits", "X", ""});
  song("b.mp3", {"B", "Hits", "Y", ""});
  song("c.mp3", {"C", "Hits", "Z", "Z"});
  index();
  remove("b.mp3");
  song("b.mp3", {"B", "Other", "Y", ""});
  expect_scan(0, {.changed = 1});
  expect_as_fresh();
}

TEST_F(History, IsNotRewrittenWhereADeleteChangesNothing) {
  for (int i = 0; i < 5; ++i) song(std::to_string(i) + ".mp3", {"", "Hits", std::to_string(i), ""});
  index();
  const auto ids = rows("SELECT id FROM track WHERE path NOT LIKE '%/4.mp3' ORDER BY id");
  remove("4.mp3");
  expect_scan(0, {.removed = 1});
  EXPECT_EQ(rows("SELECT id FROM track ORDER BY id"), ids);
}

TEST_F(History, OfASheetThatCameFirstIsForgottenWithItsAudio) {
  write_sheet("a.cue", "a.mp3", "X", "Cut");
  index();
  song("a.mp3", {"Whole", "Cut", "X", ""});
  expect_scan(0, {.added = 1});
  EXPECT_EQ(value("SELECT has_virtual FROM track WHERE is_virtual = 'FALSE'"), "TRUE");
  EXPECT_EQ(count("track", "is_virtual = 'TRUE' AND frequency IS NULL"), 0);
  EXPECT_EQ(count("track", "is_virtual = 'TRUE' AND duration LIKE '-%'"), 0);
  expect_as_fresh();
}

TEST_F(History, OfAChangedAudioFileReachesItsSheet) {
  song("a.mp3");
  write_sheet("a.cue", "a.mp3", "X", "Cut");
  index();
  remove("a.mp3");
  fs::copy_file(fs::path(MEDIIDX_SAMPLE_LIBRARY) / "music/Other Scripts/מזח 🌊.mp3", at("a.mp3"));
  expect_scan(0, {.changed = 1});
  expect_as_fresh();
}

TEST_F(History, OfAudioThatWentIsForgottenByItsSheet) {
  song("a.mp3");
  write_sheet("a.cue", "a.mp3", "X", "Cut");
  index();
  remove("a.mp3");
  expect_scan(0, {.removed = 1});
  EXPECT_EQ(count("track", "is_virtual = 'TRUE'"), 2);
  EXPECT_EQ(count("track", "frequency IS NOT NULL"), 0);
  expect_as_fresh();
}

TEST_F(History, OfASheetThatWentIsForgottenByItsAudio) {
  song("a.mp3", {"Whole", "Cut", "Y", ""});
  write_sheet("a.cue", "a.mp3", "X", "Cut");
  index();
  remove("a.cue");
  expect_scan(0, {.removed = 1});
  EXPECT_EQ(value("SELECT has_virtual FROM track"), "FALSE");
  EXPECT_THAT(albums(), ElementsAre(Row{"Whole", "Y", "FALSE"}));
  expect_as_fresh();
}

TEST_F(History, OfAFolderWithASheetOfAudioElsewhereLeavesNoTrack) {
  song("audio/a.mp3");
  write_sheet("sheets/a.cue", "../audio/a.mp3", "X", "Cut");
  index();
  EXPECT_EQ(count("track", "is_virtual = 'TRUE'"), 2);
  remove("sheets");
  expect_scan(0, {.removed = 1});
  EXPECT_EQ(count("track", "is_virtual = 'TRUE'"), 0);
  expect_as_fresh();
}

TEST_F(History, OfAFolderWithAudioOfASheetElsewhereKeepsItsTracks) {
  song("audio/a.mp3");
  write_sheet("sheets/a.cue", "../audio/a.mp3", "X", "Cut");
  index();
  remove("audio");
  expect_scan(0, {.removed = 1});
  expect_as_fresh();
}

TEST_F(History, OfTracksThatSomebodyElseDeletedIsMissedByASheetFarFromItsAudio) {
  song("audio/a.mp3");
  write_sheet("sheets/a.cue", "../audio/a.mp3", "X", "Cut");
  index();
  for (const char* which : {"is_virtual = 'TRUE'", "true"}) {
    rows(std::string("DELETE FROM track WHERE ") + which);
    EXPECT_EQ(scan().status, 0);
    EXPECT_EQ(count("track", "is_virtual = 'TRUE'"), 2);
    expect_as_fresh();
    expect_scan(0, {});
  }
}

TEST_F(History, OfAlbumsThatASheetTiesTogetherIsForgotten) {
  song("a.mp3", {"A", "Hits", "X", "Tagged"});
  song("b.mp3", {"B", "Hits", "Y", ""});
  song("c.mp3", {"C", "Cut", "Z", "Tagged too"});
  song("d.mp3", {"D", "Cut", "W", ""});
  media.write("m/a.cue",
              "TITLE \"Cut\"\nFILE \"d.mp3\" WAVE\nTRACK 01 AUDIO\nPERFORMER \"V\"\n"
              "INDEX 01 00:00:00\n");
  media.write("m/b.cue",
              "TITLE \"Hits\"\nFILE \"d.mp3\" WAVE\nTRACK 02 AUDIO\nPERFORMER \"V\"\n"
              "INDEX 01 00:00:00\n");
  index();
  remove("b.mp3");
  remove("d.mp3");
  expect_scan(0, {.removed = 2});
  expect_as_fresh();
}

TEST_F(History, OfPlaylistsDoesNotDependOnTheirSongs) {
  media.write("m/a.m3u", "a.mp3\nb.mp3\n");
  index();
  song("a.mp3");
  song("b.mp3");
  scan();
  remove("b.mp3");
  scan();
  expect_as_fresh();
}

TEST_F(History, OfAScanThatWasKilledBeforeItSettledIsStillForgotten) {
  song("a.mp3", {"A", "Hits", "X", ""});
  song("c.mp3", {"C", "Hits", "X", "The Band"});
  index();
  // As a scan leaves it that removed a file of another artist, and was killed then.
  rows("UPDATE album_track SET album_artist = 'X', from_album_artist = 'FALSE'");
  rows("INSERT INTO scan.unsettled(what, name) VALUES(0, 'Hits')");
  expect_scan(0, {});
  EXPECT_THAT(albums(), ElementsAre(Row{"A", "X", "FALSE"}, Row{"C", "The Band", "TRUE"}));
  EXPECT_EQ(count("scan.unsettled"), 0);
}

}  // namespace
}  // namespace mediidx::test
