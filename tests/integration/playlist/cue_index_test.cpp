// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Cue sheets through the requests, beside their audio files.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <tavocore.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "database.h"
#include "mediidx/request.h"

namespace {

using mediidx::test::logged_messages;
using mediidx::test::Row;
using testing::ElementsAre;

constexpr const char* kSheet =
    "PERFORMER \"Band\"\nTITLE \"Album\"\nREM GENRE Rock\nREM DATE 1999\n"
    "FILE \"a.flac\" WAVE\n"
    "  TRACK 01 AUDIO\n    TITLE \"One\"\n    PERFORMER \"X\"\n    INDEX 01 00:00:00\n"
    "  TRACK 02 AUDIO\n    TITLE \"Two\"\n    PERFORMER \"Y\"\n    INDEX 01 03:00:00\n";

class IndexedCueSheet : public mediidx::test::DatabaseTest {
 protected:
  IndexedCueSheet() { root.index_everything("music", folder); }

  std::string at(const std::string& name) { return folder + "/" + name; }

  int add(const std::string& path, MEDIA_TABLE_TYPE type) {
    auto info = std::make_unique<__tag_TAVO_MEDIA_INFO>();
    std::strcpy(info->path, path.c_str());
    if (type == MEDIA_TABLE_MUSIC) {
      std::strcpy(info->title, "File");
      std::strcpy(info->album, "Album");
      std::strcpy(info->artist, "Band");
      std::strcpy(info->video_codec, "flac");
      std::strcpy(info->container_type, "flac");
      info->duration = 600;
      info->channel = 2;
      info->frequency = 44100;
      info->bitrate = 900000;
    }
    std::strcpy(info->date, "2020-01-02 03:04:05");
    return TAVOMediaIndexAdd(info.get(), type);
  }
  int add_audio() {
    root.write("volume1/music/a.flac", "x");
    return add(at("a.flac"), MEDIA_TABLE_MUSIC);
  }
  int add_sheet(const std::string& name = "album.cue", const std::string& content = kSheet) {
    root.write("volume1/music/" + name, content);
    return add(at(name), MEDIA_TABLE_PLAYLIST);
  }

  /// Every row that the files have, ids aside.
  std::vector<Row> catalogue(bool last_duration = true) {
    const std::string duration =
        last_duration ? "t.duration" : "CASE WHEN t.track = 2 THEN '' ELSE t.duration END";
    return rows(
        "SELECT t.path, t.title, t.title_sort, t.agg_genre, t.year, t.channel, t.frequency, "
        "t.bitrate, " +
        duration +
        ", t.comment, t.track, t.container, t.codec, "
        "t.is_virtual, t.has_virtual, t.date, a.album, a.album_artist, "
        "a.from_album_artist, r.artist, c.composer, v.audio_offset, v.cue_sheet_path "
        "FROM track t LEFT JOIN album_track a ON a.track = t.id "
        "LEFT JOIN artist_track r ON r.track = t.id "
        "LEFT JOIN composer_track c ON c.track = t.id "
        "LEFT JOIN virtual_info_track v ON v.track = t.id "
        "ORDER BY t.is_virtual, t.path, t.track");
  }
  long rows_left() {
    long left = 0;
    for (const char* table :
         {"track", "genre_track", "composer_track", "artist_track", "album_track",
          "virtual_info_track", "rating_track", "music", "virtual_music", "playlist"}) {
      left += count(table);
    }
    return left;
  }

  std::string folder = root.make_folder("volume1/music");
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
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(add_sheet(), 0);
  const auto audio_first = catalogue(false);
  const auto audio_first_whole = catalogue();
  mediidx::test::TestServer::get().fresh_database();
  TAVOMediaIndexDBClose();

  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(catalogue(false), audio_first);

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
  std::filesystem::remove(at("album.cue"));
  EXPECT_EQ(TAVOMediaIndexDelete(at("album.cue").c_str()), 0);
  EXPECT_EQ(rows_left(), alone);
}

TEST_F(IndexedCueSheet, InADeletedFolderLeavesNoRow) {
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(add_sheet(), 0);
  EXPECT_EQ(TAVOMediaIndexDirDelete(folder.c_str()), 0);
  EXPECT_EQ(rows_left(), 0);
}

TEST_F(IndexedCueSheet, OutlivesItsAudioFile) {
  EXPECT_EQ(add_audio(), 0);
  EXPECT_EQ(add_sheet(), 0);
  std::filesystem::remove(at("a.flac"));
  EXPECT_EQ(TAVOMediaIndexDelete(at("a.flac").c_str()), 0);
  EXPECT_EQ(count("track", "is_virtual = 'TRUE'"), 2);
  EXPECT_EQ(count("track", "is_virtual = 'FALSE'"), 0);
  std::filesystem::remove(at("album.cue"));
  EXPECT_EQ(TAVOMediaIndexDelete(at("album.cue").c_str()), 0);
  EXPECT_EQ(rows_left(), 0);
}

TEST_F(IndexedCueSheet, WithALongPathKeepsCutRowsAfterItsDelete) {
  // The row's comment holds 254 bytes: eight of the start, 246 of the sheet's path.
  const auto name = std::string(250, 'n') + ".cue";
  EXPECT_EQ(add_sheet(name), 0);
  EXPECT_EQ(value("SELECT max(length(comment)) FROM virtual_music"), "254");
  std::filesystem::remove(at(name));
  EXPECT_EQ(TAVOMediaIndexDelete(at(name).c_str()), 0);
  EXPECT_EQ(count("virtual_music"), 2);
  EXPECT_EQ(count("track"), 0);
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
  root.write("volume1/music/1.flac", "x");
  root.write("volume1/music/2.flac", "x");
  EXPECT_EQ(add(at("1.flac"), MEDIA_TABLE_MUSIC), 0);
  EXPECT_EQ(add(at("2.flac"), MEDIA_TABLE_MUSIC), 0);
  EXPECT_EQ(add_sheet("album.cue",
                      "FILE 1.flac WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\nFILE 2.flac WAVE\n"
                      "TRACK 02 AUDIO\nINDEX 00 00:00:00\nINDEX 01 00:02:00\n"),
            0);
  EXPECT_EQ(rows("SELECT duration FROM virtual_music ORDER BY track"),
            (std::vector<Row>{{"600"}, {"598"}}));
}

}  // namespace
