// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Cue sheets through the requests, beside their audio files.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "indexed_sheet.h"
#include "mediidx/request.h"

namespace mediidx::test {
namespace {

constexpr const char* kSheet =
    "PERFORMER \"Band\"\nTITLE \"Album\"\nREM GENRE Rock\nREM DATE 1999\n"
    "FILE \"a.flac\" WAVE\n"
    "  TRACK 01 AUDIO\n    TITLE \"One\"\n    PERFORMER \"X\"\n    INDEX 01 00:00:00\n"
    "  TRACK 02 AUDIO\n    TITLE \"Two\"\n    PERFORMER \"Y\"\n    INDEX 01 03:00:00\n";

class IndexedCueSheet : public IndexedSheetTest {
 protected:
  int add_sheet(const std::string& name = "album.cue", const std::string& content = kSheet) {
    return IndexedSheetTest::add_sheet(name, content);
  }
};

TEST_F(IndexedCueSheet, BringsItsTracks) {
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(add_sheet(), 0);

  EXPECT_EQ(count("playlist"), 1);
  EXPECT_EQ(rows("SELECT path, title, album, artist, album_artist, year, genre, comment, duration, "
                 "track FROM virtual_music ORDER BY track"),
            (std::vector<Row>{{at("a.flac"), "One", "Album", "X", "Band", "1999", "Rock",
                               "00:00:00" + at("album.cue"), "180", "1"},
                              {at("a.flac"), "Two", "Album", "Y", "Band", "1999", "Rock",
                               "03:00:00" + at("album.cue"), "420", "2"}}));
  EXPECT_EQ(rows("SELECT title, duration, channel, codec, comment FROM track "
                 "WHERE is_virtual = 'TRUE' ORDER BY track"),
            (std::vector<Row>{{"One", "180.000000", "2", "flac", "00:00:00" + at("album.cue")},
                              {"Two", "420.000000", "2", "flac", "03:00:00" + at("album.cue")}}));
  EXPECT_EQ(rows("SELECT audio_offset, cue_sheet_path FROM virtual_info_track ORDER BY 1"),
            (std::vector<Row>{{"00:00:00", at("album.cue")}, {"03:00:00", at("album.cue")}}));
  EXPECT_EQ(value("SELECT has_virtual FROM track WHERE is_virtual = 'FALSE'"), "TRUE");
}

TEST_F(IndexedCueSheet, ComesToTheSameBeforeItsAudioButForTheLastDuration) {
  root.add_user("ann", 1001, root.at("home/ann"));
  root.write("volume1/music/@eaDir/a.flac/TAVOAUDIO_SONG_RATING", "1001=5\n");
  root.write("volume1/music/@eaDir/a.flac_2/TAVOAUDIO_SONG_RATING", "1001=3\n");
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(add_sheet(), 0);
  const auto audio_first = catalogue(LastDurations::kLeftOut);
  const auto audio_first_whole = catalogue();
  start_anew();

  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(catalogue(LastDurations::kLeftOut), audio_first);

  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(catalogue(), audio_first_whole);
}

TEST_F(IndexedCueSheet, AddedAgainLeavesTheSameRows) {
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(add_sheet(), 0);
  const auto once = catalogue();
  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(catalogue(), once);
  EXPECT_EQ(count("virtual_music"), 2);
}

TEST_F(IndexedCueSheet, InCapitalsBringsItsTracksToo) {
  EXPECT_EQ(add_sheet("ALBUM.CUE"), 0);
  EXPECT_EQ(count("virtual_music"), 2);
}

TEST_F(IndexedCueSheet, ThatCannotBeParsedKeepsItsRow) {
  EXPECT_EQ(add_sheet("album.cue", "no tracks here\n"), -1);
  EXPECT_EQ(count("playlist"), 1);
  EXPECT_EQ(logged_messages().back(), "Failed to parse cue file");
}

TEST_F(IndexedCueSheet, WhoseTracksCannotBeStoredKeepsItsRow) {
  rows("DROP TABLE virtual_music CASCADE");
  EXPECT_EQ(add_sheet(), -1);
  EXPECT_EQ(count("playlist"), 1);
  EXPECT_EQ(logged_messages().back(), "Failed to save shared virtual files");
}

TEST_F(IndexedCueSheet, InAnUnknownCharacterSetKeepsItsRowWithoutTracks) {
  EXPECT_EQ(add_sheet("album.cue",
                      "FILE a.flac WAVE\nTRACK 01 AUDIO\nTITLE \"Caf\xE9\"\n"
                      "INDEX 01 00:00:00\n"),
            -1);
  EXPECT_EQ(count("playlist"), 1);
  EXPECT_EQ(count("virtual_music"), 0);
  EXPECT_EQ(logged_messages().back(), "Failed to save shared virtual files");
}

TEST_F(IndexedCueSheet, ThatIsDeletedLeavesNoRowOfItsOwn) {
  EXPECT_EQ(add_audio(), 0);
  const auto alone = rows_left();
  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(remove("album.cue"), 0);
  EXPECT_EQ(rows_left(), alone);
}

TEST_F(IndexedCueSheet, InADeletedFolderLeavesNoRow) {
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(TAVOMediaIndexDirDelete(folder.c_str()), 0);
  EXPECT_EQ(rows_left(), 0);
}

TEST_F(IndexedCueSheet, InADeletedFolderLeavesOtherFoldersAlone) {
  EXPECT_EQ(add_audio("other/a.flac"), 0);
  EXPECT_EQ(add_sheet("other/album.cue"), 0);
  const auto others = catalogue();
  EXPECT_EQ(add_audio("disc/a.flac"), 0);
  EXPECT_EQ(add_sheet("disc/album.cue"), 0);
  EXPECT_EQ(TAVOMediaIndexDirDelete(at("disc").c_str()), 0);
  EXPECT_EQ(catalogue(), others);
}

TEST_F(IndexedCueSheet, OutlivesItsAudioFile) {
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(add_sheet(), 0);
  const auto cut_tracks = [this] {
    return rows(
        "SELECT (to_jsonb(t) || to_jsonb(v))::text FROM track t "
        "JOIN virtual_info_track v ON v.track = t.id ORDER BY 1");
  };
  const auto before = cut_tracks();
  ASSERT_EQ(before.size(), 2U);
  EXPECT_EQ(remove("a.flac"), 0);
  EXPECT_EQ(cut_tracks(), before);
  EXPECT_EQ(count("virtual_music"), 2);
  EXPECT_EQ(count("track", "is_virtual = 'FALSE'"), 0);
  EXPECT_EQ(count("music"), 0);
  EXPECT_EQ(remove("album.cue"), 0);
  EXPECT_EQ(rows_left(), 0);
}

TEST_F(IndexedCueSheet, WithALongPathKeepsCutRowsAfterItsDelete) {
  // The row's comment holds 254 bytes: eight of the start, 246 of the sheet's path.
  const auto name = std::string(250, 'n') + ".cue";
  EXPECT_EQ(add_sheet(name), 0);
  EXPECT_EQ(value("SELECT max(length(comment)) FROM virtual_music"), "254");
  EXPECT_EQ(remove(name), 0);
  EXPECT_EQ(count("virtual_music"), 2);
  EXPECT_EQ(count("track"), 0);
}

TEST_F(IndexedCueSheet, WithAPathThatJustFitsLeavesNoRowAfterItsDelete) {
  const auto name = std::string(246 - at(".cue").size(), 'n') + ".cue";
  ASSERT_EQ(at(name).size(), 246U);
  EXPECT_EQ(add_sheet(name), 0);
  EXPECT_EQ(value("SELECT max(length(comment)) FROM virtual_music"), "254");
  EXPECT_EQ(remove(name), 0);
  EXPECT_EQ(rows_left(), 0);
}

TEST_F(IndexedCueSheet, GivesItsTracksRatingsOfTheirOwn) {
  root.add_user("ann", 1001, root.at("home/ann"));
  root.write("volume1/music/@eaDir/a.flac/TAVOAUDIO_SONG_RATING", "1001=5\n");
  root.write("volume1/music/@eaDir/a.flac_2/TAVOAUDIO_SONG_RATING", "1001=3\n");
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(rows("SELECT t.is_virtual, t.track, r.userid, r.star FROM rating_track r "
                 "JOIN track t ON t.id = r.track ORDER BY 1"),
            (std::vector<Row>{{"FALSE", "0", "1001", "5"}, {"TRUE", "2", "1001", "3"}}));
}

TEST_F(IndexedCueSheet, OfFilesOutsideTheIndexBringsNoTracks) {
  EXPECT_EQ(add_sheet("album.cue",
                      "FILE \"../../elsewhere/a.flac\" WAVE\nTRACK 01 AUDIO\n"
                      "INDEX 01 00:00:00\n"),
            0);
  // Coverage is told by the text of a path: this one begins with the folder.
  EXPECT_EQ(count("virtual_music"), 1);
  EXPECT_EQ(add_sheet("other.cue", "FILE x.bin BINARY\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n"), 0);
  EXPECT_EQ(count("virtual_music"), 1);
}

TEST_F(IndexedCueSheet, InEachCharacterSetKeepsItsTitles) {
  const struct {
    const char* code;
    const char* charset;
    const char* title;
  } cases[] = {
      {"enu", "CP1252", "Les été français à l'hôtel"},
      {"jpn", "CP932", "日本語の歌のなまえはなんですか"},
      {"chs", "CP936", "中文歌曲的名字是什么我们不知道"},
      {"krn", "CP949", "한국어 노래의 제목은 무엇입니까"},
      {"cht", "CP950", "中文歌曲的名字是什麼我們不知道這個問題"},
      {"plk", "CP1250", "Zażółć gęślą jaźń, mój miły, w Łodzi świeci słońce"},
      {"rus", "CP1251", "Песня о том, как мы пошли домой и потом"},
  };
  for (const auto& test : cases) {
    SCOPED_TRACE(test.charset);
    const auto content = in_charset(std::string("FILE a.flac WAVE\r\nTRACK 01 AUDIO\r\nTITLE \"") +
                                        test.title + "\"\r\nINDEX 01 00:00:00\r\n",
                                    test.charset);
    set_code_page(test.code);
    EXPECT_EQ(add_sheet("album.cue", content), 0);
    EXPECT_EQ(value("SELECT title FROM virtual_music"), test.title);
    EXPECT_EQ(value("SELECT title FROM track"), test.title);
    // No one can tell without the code page, and the bytes are no UTF-8.
    set_code_page("");
    EXPECT_EQ(add_sheet("album.cue", content), -1);
    EXPECT_EQ(count("playlist"), 1);
    EXPECT_EQ(count("virtual_music"), 0);
    EXPECT_EQ(logged_messages().back(), "Failed to save shared virtual files");
  }
}

TEST_F(IndexedCueSheet, InAPersonalLibraryLivesInTheCatalogueOnly) {
  root.add_user("ann", 1001, root.at("home/ann"));
  folder = root.make_folder("home/ann/music");
  root.write("home/ann/music/album.cue", kSheet);
  EXPECT_EQ(add(at("album.cue"), MEDIA_TABLE_PLAYLIST), 0);
  EXPECT_EQ(count("personal_playlist", "userid = 1001"), 1);
  EXPECT_EQ(count("playlist"), 0);
  EXPECT_EQ(count("virtual_music"), 0);
  EXPECT_EQ(count("track", "userid = 1001 AND is_virtual = 'TRUE'"), 2);
}

TEST_F(IndexedCueSheet, OfOneFilePerTrackHasTrueDurations) {
  EXPECT_EQ(add_audio("1.flac"), 0);
  EXPECT_EQ(add_audio("2.flac"), 0);
  EXPECT_EQ(add_sheet("album.cue",
                      "FILE 1.flac WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\nFILE 2.flac WAVE\n"
                      "TRACK 02 AUDIO\nINDEX 00 00:00:00\nINDEX 01 00:02:00\n"),
            0);
  EXPECT_EQ(rows("SELECT duration FROM virtual_music ORDER BY track"),
            (std::vector<Row>{{"600"}, {"598"}}));
}

}  // namespace
}  // namespace mediidx::test
