// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "catalogue_fixture.h"

namespace mediidx::test {
namespace {

using Artists = std::vector<std::string>;

class AnAlbum : public CatalogueTest {
 protected:
  int add(const std::string& path, const std::string& artist, const std::string& tag = "",
          const std::string& album = "Hits") {
    return insert(record(path, artist, album, tag));
  }
  int add_part(const std::string& path, int track, const std::string& artist,
               const std::string& cue_sheet, const std::string& album = "Hits") {
    return insert(virtual_record(path, track, artist, album), record(cue_sheet));
  }
  Artists hits() { return album_artists("Hits"); }
  int leave(const std::string& path) { return MediaDBUpdateAlbumTrackTable(conn, path.c_str(), 0); }
  int leave_cue_sheet(const std::string& path) {
    return MediaDBUpdateAlbumTrackTable(conn, path.c_str(), 1);
  }
};

TEST_F(AnAlbum, OfOneArtistHasThatArtist) {
  add("/1", "The X");
  add("/2", "The X");

  EXPECT_EQ(hits(), (Artists{"The X/FALSE", "The X/FALSE"}));
  EXPECT_EQ(rows("SELECT DISTINCT album_artist_sort, album_artist_search FROM album_track"),
            (std::vector<Row>{{"X", "THE X"}}));
}

TEST_F(AnAlbum, OfTwoArtistsIsCollapsed) {
  add("/1", "X");
  add("/2", "Y");

  EXPECT_EQ(hits(), (Artists{"/TRUE", "/TRUE"}));
  EXPECT_EQ(rows("SELECT DISTINCT album_artist_sort, album_artist_search FROM album_track"),
            (std::vector<Row>{{"", ""}}));
}

TEST_F(AnAlbum, ThatIsCollapsedStaysSoForAFurtherTrack) {
  add("/1", "X");
  add("/2", "Y");
  add("/3", "X");

  EXPECT_EQ(hits(), (Artists{"/TRUE", "/TRUE", "/TRUE"}));
}

TEST_F(AnAlbum, RecoversWhenOneArtistIsLeft) {
  add("/1", "The X");
  add("/2", "Y");
  add("/3", "The X");

  EXPECT_EQ(leave("/2"), 0);

  EXPECT_EQ(hits(), (Artists{"The X/FALSE", "The X/FALSE", "The X/FALSE"}));
  EXPECT_EQ(rows("SELECT DISTINCT album_artist_sort, album_artist_search FROM album_track"),
            (std::vector<Row>{{"X", "THE X"}}));
}

TEST_F(AnAlbum, StaysCollapsedWhileTwoArtistsAreLeft) {
  add("/1", "X");
  add("/2", "Y");
  add("/3", "Z");

  EXPECT_EQ(leave("/3"), 0);

  EXPECT_EQ(hits(), (Artists{"/TRUE", "/TRUE", "/TRUE"}));
}

TEST_F(AnAlbum, StaysCollapsedWhenNothingIsLeft) {
  add("/1", "X");
  add("/2", "Y");
  rows("DELETE FROM track WHERE path = '/1'");

  EXPECT_EQ(leave("/2"), 0);

  EXPECT_EQ(hits(), (Artists{"/TRUE"}));
}

TEST_F(AnAlbum, ThatIsNotCollapsedDoesNotChangeWhenAFileLeaves) {
  add("/1", "X");
  add("/2", "X");

  EXPECT_EQ(leave("/2"), 0);

  EXPECT_EQ(hits(), (Artists{"X/FALSE", "X/FALSE"}));
  EXPECT_EQ(sent_statements().size(), 2 * 8 + 1U);
}

TEST_F(AnAlbum, IsTheSameWhateverTheFolderAndUser) {
  Record theirs = record("/home/u/music/1", "X", "Hits");
  MediaDBInsertIntoTrackRelatedTables(conn, &theirs, nullptr, 0, 1001);

  add("/volume1/music/2", "Y");

  EXPECT_EQ(hits(), (Artists{"/TRUE", "/TRUE"}));
}

TEST_F(AnAlbum, OfAnotherNameIsLeftAlone) {
  add("/1", "X", "", "Best");
  add("/2", "X");
  add("/3", "Y");

  EXPECT_EQ(album_artists("Best"), (Artists{"X/FALSE"}));
}

TEST_F(AnAlbum, WithATagHasTheTag) {
  add("/1", "X", "Band");
  add("/2", "Y", "Band");

  EXPECT_EQ(hits(), (Artists{"Band/TRUE", "Band/TRUE"}));
}

TEST_F(AnAlbum, IsNotCollapsedByATaggedTrack) {
  add("/1", "Y", "Band");
  add("/2", "X");

  EXPECT_EQ(hits(), (Artists{"Band/TRUE", "X/FALSE"}));
}

TEST_F(AnAlbum, KeepsATagWhenItIsCollapsed) {
  add("/1", "Y", "Band");
  add("/2", "X");
  add("/3", "Z");

  EXPECT_EQ(hits(), (Artists{"Band/TRUE", "/TRUE", "/TRUE"}));
}

// A recovery takes every row that does not follow its own artist for one of the collapsed.
TEST_F(AnAlbum, LosesATagInItsRecovery) {
  add("/1", "X", "Band");
  add("/2", "X");
  add("/3", "Y");

  EXPECT_EQ(leave("/3"), 0);

  EXPECT_EQ(hits(), (Artists{"X/FALSE", "X/FALSE", "X/FALSE"}));
}

TEST_F(AnAlbum, CountsTheArtistsOfTaggedTracksInItsRecovery) {
  add("/1", "Z", "Band");
  add("/2", "X");
  add("/3", "Y");

  EXPECT_EQ(leave("/3"), 0);

  EXPECT_EQ(hits(), (Artists{"Band/TRUE", "/TRUE", "/TRUE"}));
}

TEST_F(AnAlbum, RecoversWhenACueSheetLeaves) {
  add("/1", "X");
  add_part("/a.flac", 1, "Y", "/a.cue");
  add_part("/a.flac", 2, "Z", "/a.cue");

  EXPECT_EQ(leave_cue_sheet("/a.cue"), 0);

  EXPECT_EQ(hits(), (Artists{"X/FALSE", "X/FALSE", "X/FALSE"}));
}

TEST_F(AnAlbum, RecoversToTheTracksOfAnotherCueSheet) {
  add_part("/a.flac", 1, "Y", "/a.cue");
  add_part("/b.flac", 1, "Z", "/b.cue");

  EXPECT_EQ(leave_cue_sheet("/a.cue"), 0);

  EXPECT_EQ(hits(), (Artists{"Z/FALSE", "Z/FALSE"}));
}

// The album's other tracks are those of other paths, and a cut track has its file's.
TEST_F(AnAlbum, DoesNotRecoverToTracksCutFromTheLeavingFile) {
  add("/a.flac", "X");
  add_part("/a.flac", 1, "Y", "/a.cue");

  EXPECT_EQ(leave("/a.flac"), 0);

  EXPECT_EQ(hits(), (Artists{"/TRUE", "/TRUE"}));
}

TEST_F(AnAlbum, IsNotTakenForTheFilesOfACueSheet) {
  add("/1", "X");
  add("/2", "Y");

  EXPECT_EQ(leave_cue_sheet("/2"), 0);

  EXPECT_EQ(hits(), (Artists{"/TRUE", "/TRUE"}));
}

TEST_F(AnAlbum, IsCountedStepByStep) {
  const Record third = record("/3", "X", "Hits");
  add("/1", "X");
  EXPECT_EQ(MediaDBFindAlbumCollapseSingleAlbumArtist(conn, &third), 0);
  add("/2", "Y");

  EXPECT_EQ(MediaDBFindAlbumCollapseSingleAlbumArtist(conn, &third), 2);
  EXPECT_EQ(MediaDBCheckRecordInMultipleAlbumArtist(conn, "/1", 0), 1);
  EXPECT_EQ(MediaDBCheckRecordInMultipleAlbumArtist(conn, "/1", 1), 0);
  EXPECT_EQ(MediaDBCheckRecordsWithMultipleAlbumArtist(conn, "/1", 0), 1);
  EXPECT_EQ(MediaDBCheckRecordsWithMultipleAlbumArtist(conn, "/9", 0), 0);
  EXPECT_EQ(MediaDBRecoverToSingleAlbumArtist(conn, "/1", 0), 0);
  EXPECT_EQ(hits(), (Artists{"Y/FALSE", "Y/FALSE"}));
}

TEST_F(AnAlbum, OfACueSheetIsCountedStepByStep) {
  add("/1", "X");
  add_part("/a.flac", 1, "Y", "/a.cue");
  add_part("/a.flac", 2, "Z", "/a.cue");

  EXPECT_EQ(MediaDBCheckRecordInMultipleAlbumArtist(conn, "/a.cue", 1), 2);
  EXPECT_EQ(MediaDBCheckRecordInMultipleAlbumArtist(conn, "/a.cue", 0), 0);
  EXPECT_EQ(MediaDBCheckRecordsWithMultipleAlbumArtist(conn, "/a.cue", 1), 1);
  EXPECT_EQ(MediaDBRecoverToSingleAlbumArtist(conn, "/a.cue", 1), 0);
  EXPECT_EQ(hits(), (Artists{"X/FALSE", "X/FALSE", "X/FALSE"}));
}

TEST_F(AnAlbum, IsCollapsedByName) {
  add("/1", "X");
  add("/2", "X", "Band");
  add("/3", "X", "", "Best");
  const Record info = record("", "", "Hits");

  EXPECT_EQ(MediaDBUpdateAlbumWithMultipleAlbumArtist(conn, &info), 0);

  EXPECT_EQ(hits(), (Artists{"/TRUE", "Band/TRUE"}));
  EXPECT_EQ(album_artists("Best"), (Artists{"X/FALSE"}));
}

TEST_F(AnAlbum, RecoversWhenATrackIsTaggedAnew) {
  add("/1", "X");
  Record info = record("/2", "Y", "Hits");
  info.id = static_cast<std::uint32_t>(insert(info));
  set(info.artist, "X");

  EXPECT_EQ(MediaDBUpdateTrackRelatedTables(conn, &info), 0);

  EXPECT_EQ(hits(), (Artists{"X/FALSE", "X/FALSE"}));
}

}  // namespace
}  // namespace mediidx::test
