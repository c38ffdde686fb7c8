// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <memory>

#include "explain_test.h"
#include "mediidx/database.h"
#include "support/text.h"

namespace mediidx::test {
namespace {

using testing::Each;
using testing::ElementsAre;

class Explain : public ExplainTest {
 protected:
  /// Saves a song of the album "Hits".
  void save(const std::string& name, const std::string& artist,
            const std::string& album_artist = {}, const std::string& album = "Hits") const {
    const auto info = std::make_unique<__tag_TAVO_MEDIA_INFO>();
    copy_text(info->path, at(name));
    copy_text(info->title, name);
    copy_text(info->artist, artist);
    copy_text(info->album, album);
    copy_text(info->album_artist, album_artist);
    ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_MUSIC, info.get()), 0);
  }
  /// The one album of this name.
  Json::Value explained(const std::string& name = "Hits") const {
    const auto albums = json({"explain", name});
    EXPECT_EQ(albums.size(), 1U);
    return albums[0];
  }
};

TEST_F(Explain, TellsOfOneArtistWithoutATag) {
  save("a.mp3", "X");
  save("b.mp3", "X");
  const auto album = explained();
  EXPECT_EQ(album["album"], "Hits");
  EXPECT_THAT(column(album["tracks"], "source"), ElementsAre("artist", "artist"));
  EXPECT_THAT(column(album["tracks"], "album_artist"), Each("X"));
  EXPECT_EQ(album["tracks"][0]["path"], at("a.mp3"));
  EXPECT_EQ(album["tracks"][0]["tagged"], false);
  ASSERT_EQ(album["why"].size(), 1U);
  EXPECT_EQ(album["why"][0],
            "2 tracks without an album-artist tag, and one artist in all of them: \"X\" stands as "
            "album artist too.");
}

TEST_F(Explain, TellsOfSeveralArtists) {
  save("a.mp3", "X");
  save("b.mp3", "Y");
  save("c.mp3", "Z", "The Hitmakers");
  const auto album = explained();
  EXPECT_THAT(column(album["tracks"], "source"),
              ElementsAre("several_artists", "several_artists", "tag"));
  ASSERT_EQ(album["why"].size(), 2U);
  EXPECT_EQ(album["why"][0], "1 track with an album-artist tag: the tag says \"The Hitmakers\".");
  EXPECT_EQ(album["why"][1],
            "2 tracks without an album-artist tag in an album of several artists (\"X\", \"Y\"): "
            "it has none.");
}

TEST_F(Explain, TellsOfTheLastArtistLeft) {
  save("a.mp3", "X");
  save("b.mp3", "Y");
  save("c.mp3", "X", "The Hitmakers");
  ASSERT_EQ(MediaInfoDBDelete(MEDIA_TABLE_MUSIC, at("b.mp3").c_str()), 0);
  const auto album = explained();
  // One artist without a tag is what it would be had the other never been there.
  EXPECT_THAT(column(album["tracks"], "source"), ElementsAre("artist", "last_artist_left"));
  EXPECT_THAT(column(album["tracks"], "album_artist"), Each("X"));
  EXPECT_EQ(album["why"][1],
            "1 track, tags of 1 overruled, had no single album artist until files of other artists "
            "were removed: \"X\" was the only artist left.");
}

TEST_F(Explain, TellsThatATagWasOverruled) {
  save("a.mp3", "X");
  save("b.mp3", "Y");
  save("c.mp3", "X", "The Hitmakers");
  ASSERT_EQ(MediaInfoDBDelete(MEDIA_TABLE_MUSIC, at("b.mp3").c_str()), 0);
  save("d.mp3", "Z");
  const auto album = explained();
  EXPECT_THAT(column(album["tracks"], "source"), Each("several_artists"));
  EXPECT_THAT(album["why"][0].asString(), HasSubstr("album-artist tags were overruled"));
}

TEST_F(Explain, TellsThatIndexingAgainWouldGiveOneArtist) {
  save("a.mp3", "X");
  rows("UPDATE album_track SET album_artist = '', from_album_artist = 'TRUE'");
  EXPECT_EQ(explained()["why"][0],
            "1 track without an album-artist tag in an album of several artists: it has none. The "
            "others are gone or carry a tag now; when the files are indexed again, \"X\" becomes "
            "the album artist.");
}

TEST_F(Explain, WarnsOfRowsThatContradictEachOther) {
  save("a.mp3", "X");
  rows("UPDATE album_track SET album_artist = 'Y', from_album_artist = 'TRUE'");
  const auto album = explained();
  EXPECT_EQ(album["tracks"][0]["source"], "unknown");
  EXPECT_THAT(album["why"][0].asString(), HasSubstr("contradict each other"));
}

TEST_F(Explain, PointsOutAlbumsInSeveralFolders) {
  save("1/a.mp3", "X");
  save("2/a.mp3", "Y");
  EXPECT_EQ(explained()["why"][1],
            "The tracks lie in 2 folders: albums are known by their name alone, so those of the "
            "same name are one.");
}

TEST_F(Explain, FindsAnAlbumInAnyCaseWhenThereIsNoneOfTheName) {
  save("a.mp3", "X", "", "Night Ferry");
  save("b.mp3", "X", "", "NIGHT FERRY");
  EXPECT_THAT(column(json({"explain", "night ferry"}), "album"),
              ElementsAre("NIGHT FERRY", "Night Ferry"));
  EXPECT_EQ(explained("Night Ferry")["tracks"][0]["path"], at("a.mp3"));
}

TEST_F(Explain, PrintsSentencesThenTracks) {
  save("it's.mp3", "X");
  EXPECT_THAT(lines(output({"explain", "Hits"})),
              ElementsAre("1 track without an album-artist tag, and one artist in all of them: "
                          "\"X\" stands as album artist too.",
                          "\tit's.mp3\tX\tX\tits artist\t" + at("it's.mp3")));
}

TEST_F(Explain, FailsForAnAlbumThatIsNotThere) {
  const auto done = run({"explain", "it's\n%"});
  EXPECT_EQ(done.status, 1);
  EXPECT_EQ(done.err, "mediidx: the index holds no album it's\\n%\n");
  EXPECT_EQ(run({"explain", "\xE9"}).status, 2);
  EXPECT_EQ(run({"explain"}).status, 2);
}

}  // namespace
}  // namespace mediidx::test
