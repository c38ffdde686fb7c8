// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <filesystem>

#include "explain_test.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;
using testing::UnorderedElementsAre;

/// One song, and an audio file with a cue sheet, indexed.
class Repair : public ExplainTest {
 protected:
  Repair() {
    sample("music/Quay Sessions/01 - Ada Brandt.mp3", "a.mp3");
    media.take_sample("music/Night Ferry", "f");
    std::filesystem::remove(at("f/lost.cue"));
    index();
    whole = everything();
  }

  std::vector<std::string> faults() const {
    const auto found = run({"verify"});
    return column(json_with(found.status, {"verify"}), "fault");
  }
  /// All rows, told apart from their copies only by their ids.
  std::string everything() {
    return value(
        "SELECT string_agg(line, chr(10) ORDER BY line) FROM ("
        "SELECT concat_ws('|', 'track', t.path, t.title, t.track, t.is_virtual, t.has_virtual, "
        "t.codec, g.genre, c.composer, a.artist, b.album, b.album_artist, b.from_album_artist, "
        "v.audio_offset, v.cue_sheet_path) AS line FROM track t "
        "LEFT JOIN genre_track g ON g.track = t.id LEFT JOIN composer_track c ON c.track = t.id "
        "LEFT JOIN artist_track a ON a.track = t.id LEFT JOIN album_track b ON b.track = t.id "
        "LEFT JOIN virtual_info_track v ON v.track = t.id "
        "UNION ALL SELECT concat_ws('|', 'music', path, title) FROM music "
        "UNION ALL SELECT concat_ws('|', 'virtual', path, title, comment) FROM virtual_music "
        "UNION ALL SELECT concat_ws('|', 'playlist', path, song_count) FROM playlist) AS rows");
  }
  /// Repairs, and expects everything to be as it was before the damage.
  Json::Value mended() {
    const auto report = json({"repair"});
    EXPECT_THAT(report["left"], IsEmpty());
    EXPECT_EQ(run({"verify"}).status, 0);
    EXPECT_EQ(everything(), whole);
    return report["mended"];
  }
  std::string song() const { return quoted(at("a.mp3")); }

  std::string whole;
};

TEST_F(Repair, FindsNothingInAnIndexThatIsWhole) {
  EXPECT_EQ(output({"verify"}), "");
  EXPECT_THAT(json({"verify"}), IsEmpty());
  EXPECT_EQ(output({"repair"}), "");
  EXPECT_THAT(mended(), IsEmpty());
}

TEST_F(Repair, MendsATrackWithoutItsSideRows) {
  rows("DELETE FROM genre_track s USING track t WHERE t.id = s.track AND t.path = " + song());
  rows("DELETE FROM album_track s USING track t WHERE t.id = s.track AND t.path = " + song());
  const auto found = json_with(3, {"verify"});
  ASSERT_EQ(found.size(), 1U);
  EXPECT_EQ(found[0]["fault"], "track_without_side_rows");
  EXPECT_EQ(found[0]["path"], at("a.mp3"));
  EXPECT_EQ(found[0]["tables"], "genre_track, album_track");
  EXPECT_EQ(
      run({"verify"}).out,
      "a track without all of its side rows\tgenre_track, album_track\t" + at("a.mp3") + "\n");
  const auto done = mended();
  EXPECT_THAT(column(done, "done"), ElementsAre("saved_again"));
  EXPECT_THAT(column(done, "path"), ElementsAre(at("a.mp3")));
}

TEST_F(Repair, MendsAMusicRowWithoutItsTrack) {
  rows("DELETE FROM track WHERE path = " + song());
  EXPECT_THAT(faults(), ElementsAre("music_row_without_track"));
  mended();
}

TEST_F(Repair, MendsATrackWithoutItsMusicRow) {
  rows("DELETE FROM music WHERE path = " + song());
  EXPECT_THAT(faults(), ElementsAre("track_without_music_row"));
  mended();
}

TEST_F(Repair, MendsAFileOfSeveralSaves) {
  rows("INSERT INTO music(path) VALUES (" + song() + ")");
  const auto found = json_with(3, {"verify"});
  ASSERT_EQ(found.size(), 1U);
  EXPECT_EQ(found[0]["fault"], "file_twice");
  EXPECT_EQ(found[0]["tables"], "music");
  mended();
}

TEST_F(Repair, MendsVirtualTracksWithoutTheirSheet) {
  rows("DELETE FROM playlist");
  const auto found = json_with(3, {"verify"});
  EXPECT_EQ(found[0]["fault"], "virtual_track_without_sheet");
  EXPECT_EQ(found[0]["cue_sheet"], at("f/Night Ferry.cue"));
  EXPECT_EQ(found[0]["path"], at("f/Night Ferry.flac"));
  EXPECT_THAT(column(mended(), "path"), ElementsAre(at("f/Night Ferry.cue")));
}

TEST_F(Repair, MendsVirtualTracksThatDoNotKnowTheirSheet) {
  rows("DELETE FROM virtual_info_track");
  EXPECT_THAT(faults(), testing::Each("virtual_track_without_origin"));
  mended();
}

TEST_F(Repair, MendsVirtualTracksWithoutSideRowsOrMusicRows) {
  rows("DELETE FROM artist_track s USING track t WHERE t.id = s.track AND t.is_virtual = 'TRUE'");
  rows("DELETE FROM virtual_music WHERE track = 1");
  EXPECT_THAT(faults(), testing::Contains("virtual_track_without_music_row"));
  mended();
}

TEST_F(Repair, MendsVirtualMusicRowsWithoutTracks) {
  rows("DELETE FROM track WHERE is_virtual = 'TRUE' AND track = 2");
  EXPECT_THAT(faults(), ElementsAre("virtual_music_row_without_track"));
  mended();
}

TEST_F(Repair, MendsAFileThatDoesNotSayThatItHasVirtualTracks) {
  rows("UPDATE track SET has_virtual = 'FALSE'");
  EXPECT_THAT(faults(), ElementsAre("has_virtual_not_set"));
  mended();
}

TEST_F(Repair, DeletesTheRowsOfFilesThatAreGone) {
  rows("DELETE FROM artist_track");
  std::filesystem::remove(at("a.mp3"));
  std::filesystem::remove(at("f/Night Ferry.cue"));
  const auto report = json({"repair"});
  EXPECT_THAT(report["left"], IsEmpty());
  std::vector<std::string> done;
  for (const auto& one : report["mended"]) {
    done.push_back(one["done"].asString() + " " + one["path"].asString());
  }
  EXPECT_THAT(done, UnorderedElementsAre("deleted " + at("a.mp3"),
                                         "saved_again " + at("f/Night Ferry.flac"),
                                         "deleted " + at("f/Night Ferry.cue")));
  EXPECT_EQ(count("music"), 1);
  EXPECT_EQ(count("track"), 1);
  EXPECT_EQ(count("virtual_music"), 0);
  EXPECT_EQ(count("playlist"), 0);
}

TEST_F(Repair, DoesNotTakeADiskThatIsAwayForOneThatIsEmpty) {
  rows("DELETE FROM artist_track");
  const auto away = data.at("away");
  std::filesystem::create_directory(away);
  for (const char* name : {"a.mp3", "f"}) {
    std::filesystem::rename(at(name), away + "/" + name);
  }
  for (const bool has_folder : {true, false}) {
    if (!has_folder) std::filesystem::remove(media.path());
    const auto report = json_with(3, {"repair"});
    EXPECT_THAT(report["mended"], IsEmpty());
    EXPECT_THAT(column(report["left"], "reason"),
                testing::Each("the disk that holds it seems to be away"));
  }
  EXPECT_EQ(count("music"), 2);
}

TEST_F(Repair, DoesNotTakeWhatIsOfflineForGone) {
  rows("DELETE FROM artist_track s USING track t WHERE t.id = s.track AND t.path = " + song());
  rows("UPDATE music SET fs_online = false");
  std::filesystem::remove(at("a.mp3"));
  const auto report = json_with(3, {"repair"});
  EXPECT_THAT(report["mended"], IsEmpty());
  EXPECT_EQ(report["left"].size(), 1U);
}

TEST_F(Repair, LeavesWhatIsNoLongerChosenOrCannotBeRead) {
  rows("DELETE FROM artist_track");
  choose(R"({"path": "/media/f", "music": true})");
  media.write("f/Night Ferry.cue", "no cue sheet\n");
  const auto report = json_with(3, {"repair"});
  EXPECT_THAT(column(report["mended"], "path"), ElementsAre(at("f/Night Ferry.flac")));
  ASSERT_FALSE(report["left"].empty());
  EXPECT_EQ(report["left"][0]["path"], at("a.mp3"));
  EXPECT_EQ(report["left"][0]["reason"], "it is there, but not chosen for indexing");
  const auto done = run({"repair"});
  EXPECT_EQ(done.status, 3);
  EXPECT_THAT(done.out, HasSubstr("left\ta track without all of its side rows: it is there, but "
                                  "not chosen for indexing\t" +
                                  at("a.mp3") + "\n"));
}

TEST_F(Repair, DeletesSideRowsWhereItCanAndListsTheOthers) {
  for (const char* table : {"genre_track", "rating_track"}) {
    rows(std::string("ALTER TABLE ") + table + " DROP CONSTRAINT " + table + "_track_fkey");
  }
  rows("INSERT INTO genre_track(track, genre) VALUES (4000, 'Lost')");
  rows("INSERT INTO rating_track(track, userid, star) VALUES (5000, 1026, 3)");
  EXPECT_THAT(faults(), ElementsAre("side_row_without_track", "side_row_without_track"));
  const auto report = json_with(3, {"repair"});
  EXPECT_THAT(column(report["left"], "tables"), ElementsAre("rating_track"));
  EXPECT_EQ(report["left"][0]["reason"], "no request of the library mends it");
  EXPECT_EQ(count("genre_track", "track = 4000"), 0);
}

TEST_F(Repair, KeepsRatingsAndReplayGain) {
  sample("music/Quay Sessions/02 - Bo Lindqvist.mp3", "gain.mp3");
  media.write("@eaDir/gain.mp3/TAVOAUDIO_SONG_RATING", "1026=4\n");
  index();
  rows("DELETE FROM music WHERE path = " + quoted(at("gain.mp3")));
  EXPECT_EQ(run({"repair"}).status, 0);
  EXPECT_EQ(value("SELECT r.star || ' ' || g.rg_track_gain FROM track t "
                  "JOIN rating_track r ON r.track = t.id "
                  "JOIN replaygain_track g ON g.track = t.id "
                  "WHERE t.path = " +
                  quoted(at("gain.mp3"))),
            "4 -4.200000");
}

TEST_F(Repair, MendsPersonalLibrariesToo) {
  home.take_sample("music/Untagged/tape side A.mp3", "ada/music/a.mp3");
  ASSERT_EQ(run({"index", at_home("music")}).status, 0);
  ASSERT_EQ(count("track", "userid = 1026"), 1);
  EXPECT_EQ(run({"verify"}).status, 0);
  rows("DELETE FROM album_track s USING track t WHERE t.id = s.track AND t.userid = 1026");
  EXPECT_EQ(run({"repair"}).status, 0);
  EXPECT_EQ(run({"verify"}).status, 0);
  EXPECT_EQ(count("track", "userid = 1026"), 1);
  EXPECT_EQ(count("music", "path = " + quoted(at_home("music/a.mp3"))), 0);
}

}  // namespace
}  // namespace mediidx::test
