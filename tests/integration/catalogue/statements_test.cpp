// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The catalogue's statements to the letter: what a whole track sends, in order.
#include <gtest/gtest.h>

#include "catalogue_fixture.h"

namespace mediidx::test {
namespace {

using Statements = std::vector<std::string>;

const Statements kActual = {
    "INSERT INTO track(userid, path, title, title_sort, title_search, agg_genre, "
    "agg_genre_sort, agg_genre_search, filesize, year, frequency, channel, bitrate, "
    "duration, comment, track, disc, container, codec, is_virtual, has_virtual, "
    "covercount, date, mdate) "
    "VALUES(1026, '/music/a.flac', 'The Wall', 'WALL', 'THE WALL', 'Rock; Pop', "
    "'ROCK; POP', 'ROCK; POP', 5000000000, 1979, 44100, 2, 320000, '215.000000', "
    "'A comment', 5, 2, 'flac', 'pcm', 'FALSE', 'FALSE', 1, '2024-02-29 12:34:56', "
    "'epoch')",
    "SELECT * FROM track WHERE path = '/music/a.flac' AND is_virtual = 'FALSE' "
    "AND track = 5",
    "SELECT * FROM track WHERE path = '/music/a.flac' AND is_virtual = 'TRUE'",
    "INSERT INTO genre_track(track, genre, genre_sort, genre_search) "
    "VALUES(1, 'Rock', 'ROCK', 'ROCK')",
    "INSERT INTO genre_track(track, genre, genre_sort, genre_search) "
    "VALUES(1, 'Pop', 'POP', 'POP')",
    "INSERT INTO composer_track(track, composer, composer_sort, composer_search) "
    "VALUES(1, 'Composer', 'COMPOSER', 'COMPOSER')",
    "INSERT INTO artist_track(track, artist, artist_sort, artist_search, "
    "has_album_artist) VALUES(1, 'X''s', 'X''S', 'X''S', 'FALSE')",
    "SELECT * FROM album_track WHERE (album = 'Hits' AND album_artist != 'X''s' "
    "AND from_album_artist = 'FALSE') OR (album = 'Hits' AND album_artist = '' "
    "AND from_album_artist = 'TRUE')",
    "INSERT INTO album_track(track, album, album_sort, album_search, album_artist, "
    "album_artist_sort, album_artist_search, from_album_artist) "
    "VALUES(1, 'Hits', 'HITS', 'HITS', 'X''s', 'X''S', 'X''S', 'FALSE')",
    "INSERT INTO rating_track(userid, track, star) VALUES(1001, 1, 4)",
};

const Statements kVirtualBesideActual = {
    "INSERT INTO track(userid, path, title, title_sort, title_search, agg_genre, "
    "agg_genre_sort, agg_genre_search, year, duration, comment, is_virtual, has_virtual, "
    "track, date) "
    "VALUES(1026, '/music/a.flac', 'The Wall', 'WALL', 'THE WALL', 'Rock; Pop', "
    "'ROCK; POP', 'ROCK; POP', 1979, '215.000000', '03:25:10/music/a.cue', 'TRUE', "
    "'FALSE', 5, '2020-01-02 03:04:05')",
    "SELECT * FROM track WHERE path = '/music/a.flac' AND is_virtual = 'TRUE' "
    "AND track = 5",
    "SELECT * FROM track WHERE path = '/music/a.flac' AND is_virtual = 'FALSE'",
    "UPDATE track SET has_virtual = 'TRUE' WHERE path = '/music/a.flac' "
    "AND is_virtual = 'FALSE'",
    "UPDATE track "
    "SET channel = tb.channel, frequency = tb.frequency, bitrate = tb.bitrate, "
    "container = tb.container, codec = tb.codec "
    "FROM (SELECT channel, frequency, bitrate, container, codec FROM track "
    "WHERE path = '/music/a.flac' and is_virtual = 'FALSE') AS tb WHERE id = 2",
    "INSERT INTO genre_track(track, genre, genre_sort, genre_search) "
    "VALUES(2, 'Rock', 'ROCK', 'ROCK')",
    "INSERT INTO genre_track(track, genre, genre_sort, genre_search) "
    "VALUES(2, 'Pop', 'POP', 'POP')",
    "INSERT INTO composer_track(track, composer, composer_sort, composer_search) "
    "VALUES(2, 'Composer', 'COMPOSER', 'COMPOSER')",
    "INSERT INTO artist_track(track, artist, artist_sort, artist_search, "
    "has_album_artist) VALUES(2, 'X''s', 'X''S', 'X''S', 'FALSE')",
    "SELECT * FROM album_track WHERE (album = 'Hits' AND album_artist != 'X''s' "
    "AND from_album_artist = 'FALSE') OR (album = 'Hits' AND album_artist = '' "
    "AND from_album_artist = 'TRUE')",
    "UPDATE album_track "
    "SET album_artist = '', album_artist_sort = '', album_artist_search = '', "
    "from_album_artist = 'TRUE' WHERE album = 'Hits' AND from_album_artist = 'FALSE'",
    "INSERT INTO album_track(track, album, album_sort, album_search, album_artist, "
    "album_artist_sort, album_artist_search, from_album_artist) "
    "VALUES(2, 'Hits', 'HITS', 'HITS', '', '', '', 'TRUE')",
    "INSERT INTO virtual_info_track(track, audio_offset, cue_sheet_path) "
    "VALUES(2, '03:25:10', '/music/a.cue')",
};

const Statements kActualBesideVirtual = {
    "INSERT INTO track(userid, path, title, title_sort, title_search, agg_genre, "
    "agg_genre_sort, agg_genre_search, filesize, year, frequency, channel, bitrate, "
    "duration, comment, track, disc, container, codec, is_virtual, has_virtual, "
    "covercount, date, mdate) "
    "VALUES(1026, '/music/a.flac', 'The Wall', 'WALL', 'THE WALL', 'Rock; Pop', "
    "'ROCK; POP', 'ROCK; POP', 5000000000, 1979, 44100, 2, 320000, '215.000000', "
    "'A comment', 5, 2, 'flac', 'pcm', 'FALSE', 'FALSE', 1, '2024-02-29 12:34:56', "
    "'epoch')",
    "SELECT * FROM track WHERE path = '/music/a.flac' AND is_virtual = 'FALSE' "
    "AND track = 5",
    "SELECT * FROM track WHERE path = '/music/a.flac' AND is_virtual = 'TRUE'",
    "UPDATE track SET has_virtual = 'TRUE' WHERE path = '/music/a.flac' "
    "AND is_virtual = 'FALSE'",
    "UPDATE track "
    "SET channel = 2, frequency = 44100, bitrate = 320000, container = 'flac', "
    "codec = 'pcm' WHERE path = '/music/a.flac' AND is_virtual = 'TRUE'",
    "INSERT INTO genre_track(track, genre, genre_sort, genre_search) "
    "VALUES(2, 'Rock', 'ROCK', 'ROCK')",
    "INSERT INTO genre_track(track, genre, genre_sort, genre_search) "
    "VALUES(2, 'Pop', 'POP', 'POP')",
    "INSERT INTO composer_track(track, composer, composer_sort, composer_search) "
    "VALUES(2, 'Composer', 'COMPOSER', 'COMPOSER')",
    "INSERT INTO artist_track(track, artist, artist_sort, artist_search, "
    "has_album_artist) VALUES(2, 'X''s', 'X''S', 'X''S', 'FALSE')",
    "SELECT * FROM album_track WHERE (album = 'Hits' AND album_artist != 'X''s' "
    "AND from_album_artist = 'FALSE') OR (album = 'Hits' AND album_artist = '' "
    "AND from_album_artist = 'TRUE')",
    "INSERT INTO album_track(track, album, album_sort, album_search, album_artist, "
    "album_artist_sort, album_artist_search, from_album_artist) "
    "VALUES(2, 'Hits', 'HITS', 'HITS', 'X''s', 'X''S', 'X''S', 'FALSE')",
};

const Statements kTagged = {
    "INSERT INTO artist_track(track, artist, artist_sort, artist_search, "
    "has_album_artist) VALUES(1, 'X', 'X', 'X', 'TRUE')",
    "INSERT INTO album_track(track, album, album_sort, album_search, album_artist, "
    "album_artist_sort, album_artist_search, from_album_artist) "
    "VALUES(1, 'Hits', 'HITS', 'HITS', 'The Band', 'BAND', 'THE BAND', 'TRUE')",
};

const Statements kUpdateWithRecovery = {
    "UPDATE track SET path = '/music/a.flac', filesize = 5000000000, title = 'The Wall', "
    "title_sort = 'WALL', title_search = 'THE WALL', agg_genre = 'Rock; Pop', "
    "agg_genre_sort = 'ROCK; POP', agg_genre_search = 'ROCK; POP', "
    "comment = 'A comment', year = 1979, channel = 2, frequency = 44100, "
    "bitrate = 320000, duration = '215.000000', track = 5, disc = 2, covercount = 1, "
    "date = '2024-02-29 12:34:56', mdate = 'epoch' WHERE id = 1",
    "SELECT * FROM track LEFT JOIN album_track ON track.id = album_track.track "
    "WHERE path = '/music/a.flac' AND is_virtual = 'FALSE' AND album_artist = '' "
    "AND from_album_artist = 'TRUE'",
    "SELECT artist FROM (track LEFT JOIN album_track ON track.id = album_track.track) "
    "LEFT JOIN artist_track ON id = artist_track.track WHERE album IN (SELECT album "
    "FROM track LEFT JOIN album_track ON track.id = album_track.track "
    "WHERE path = '/music/a.flac' AND is_virtual = 'FALSE' AND album_artist = '' "
    "AND from_album_artist = 'TRUE') AND path != '/music/a.flac' "
    "AND from_album_artist = 'TRUE' GROUP BY artist",
    "UPDATE album_track "
    "SET album_artist = tmp.artist, album_artist_sort = tmp.artist_sort, "
    "album_artist_search = tmp.artist_search, from_album_artist = 'FALSE' FROM (SELECT * "
    "FROM (album_track LEFT JOIN track ON album_track.track = track.id) "
    "LEFT JOIN artist_track ON id = artist_track.track WHERE album IN (SELECT album "
    "FROM track LEFT JOIN album_track ON track.id = album_track.track "
    "WHERE path = '/music/a.flac' AND is_virtual = 'FALSE' AND album_artist = '' "
    "AND from_album_artist = 'TRUE') AND path != '/music/a.flac' "
    "AND from_album_artist = 'TRUE') AS tmp WHERE (album_track.album IN (SELECT album "
    "FROM track LEFT JOIN album_track ON track.id = album_track.track "
    "WHERE path = '/music/a.flac' AND is_virtual = 'FALSE' AND album_artist = '' "
    "AND from_album_artist = 'TRUE')) AND album_track.from_album_artist = 'TRUE'",
    "DELETE FROM album_track WHERE track = 1; DELETE FROM artist_track WHERE track = 1; "
    "DELETE FROM genre_track WHERE track = 1; DELETE FROM composer_track "
    "WHERE track = 1; ",
    "INSERT INTO genre_track(track, genre, genre_sort, genre_search) "
    "VALUES(1, 'Rock', 'ROCK', 'ROCK')",
    "INSERT INTO genre_track(track, genre, genre_sort, genre_search) "
    "VALUES(1, 'Pop', 'POP', 'POP')",
    "INSERT INTO composer_track(track, composer, composer_sort, composer_search) "
    "VALUES(1, 'Composer', 'COMPOSER', 'COMPOSER')",
    "INSERT INTO artist_track(track, artist, artist_sort, artist_search, "
    "has_album_artist) VALUES(1, 'X''s', 'X''S', 'X''S', 'FALSE')",
    "SELECT * FROM album_track WHERE (album = 'Hits' AND album_artist != 'X''s' "
    "AND from_album_artist = 'FALSE') OR (album = 'Hits' AND album_artist = '' "
    "AND from_album_artist = 'TRUE')",
    "UPDATE album_track "
    "SET album_artist = '', album_artist_sort = '', album_artist_search = '', "
    "from_album_artist = 'TRUE' WHERE album = 'Hits' AND from_album_artist = 'FALSE'",
    "INSERT INTO album_track(track, album, album_sort, album_search, album_artist, "
    "album_artist_sort, album_artist_search, from_album_artist) "
    "VALUES(1, 'Hits', 'HITS', 'HITS', '', '', '', 'TRUE')",
};

const Statements kCueSheetLeaves = {
    "SELECT * FROM album_track "
    "LEFT JOIN virtual_info_track ON album_track.track = virtual_info_track.track "
    "WHERE cue_sheet_path = '/music/a.cue' AND album_artist = '' "
    "AND from_album_artist = 'TRUE'",
    "SELECT artist FROM ((track LEFT JOIN album_track ON track.id = album_track.track) "
    "LEFT JOIN artist_track ON id = artist_track.track) "
    "LEFT JOIN virtual_info_track ON id = virtual_info_track.track "
    "WHERE album IN (SELECT album FROM album_track "
    "LEFT JOIN virtual_info_track ON album_track.track = virtual_info_track.track "
    "WHERE cue_sheet_path = '/music/a.cue' AND album_artist = '' "
    "AND from_album_artist = 'TRUE') AND (cue_sheet_path != '/music/a.cue' "
    "OR is_virtual = 'FALSE') AND from_album_artist = 'TRUE' GROUP BY artist",
    "UPDATE album_track "
    "SET album_artist = tmp.artist, album_artist_sort = tmp.artist_sort, "
    "album_artist_search = tmp.artist_search, from_album_artist = 'FALSE' FROM (SELECT * "
    "FROM ((album_track LEFT JOIN track ON album_track.track = track.id) "
    "LEFT JOIN artist_track ON id = artist_track.track) "
    "LEFT JOIN virtual_info_track ON id = virtual_info_track.track  "
    "WHERE album IN (SELECT album FROM album_track "
    "LEFT JOIN virtual_info_track ON album_track.track = virtual_info_track.track "
    "WHERE cue_sheet_path = '/music/a.cue' AND album_artist = '' "
    "AND from_album_artist = 'TRUE') AND (cue_sheet_path != '/music/a.cue' "
    "OR is_virtual = 'FALSE') AND from_album_artist = 'TRUE') AS tmp "
    "WHERE (album_track.album IN (SELECT album FROM album_track "
    "LEFT JOIN virtual_info_track ON album_track.track = virtual_info_track.track "
    "WHERE cue_sheet_path = '/music/a.cue' AND album_artist = '' "
    "AND from_album_artist = 'TRUE')) AND album_track.from_album_artist = 'TRUE'",
};

const Statements kOthers = {
    "INSERT INTO replaygain_track(track, rg_track_gain, rg_track_peak, rg_album_gain, "
    "rg_album_peak) VALUES(1, '-6.500000', '0.988000', '-7.000000', '1.000000')",
    "SELECT * FROM personal_directory WHERE path = '/home/u'",
};

Record known_record() {
  Record info = record("/music/a.flac", "X's", "Hits");
  set(info.title, "The Wall");
  set(info.genre, "Rock;; Pop");
  set(info.composer, "Composer");
  set(info.comment, "A comment");
  set(info.container_type, "flac");
  set(info.video_codec, "pcm");
  set(info.date, "2024-02-29 12:34:56");
  info.filesize = 5'000'000'000;
  info.year = 1979;
  info.frequency = 44100;
  info.channel = 2;
  info.bitrate = 320000;
  info.duration = 215;
  info.track = 5;
  info.disc = 2;
  info.covercount = 1;
  return info;
}

class TheStatements : public CatalogueTest {
 protected:
  TheStatements() { set(cue_sheet.date, "2020-01-02 03:04:05"); }

  Record info = known_record();
  Record cue_sheet = record("/music/a.cue");
};

TEST_F(TheStatements, OfAnAudioFile) {
  root.add_user("ann", 1001, root.at("home/ann"));
  // The rating file of a file that need not exist itself, in a folder made for it alone.
  const auto path = root.at("a.flac");
  root.write("@eaDir/a.flac/TAVOAUDIO_SONG_RATING", "1001=4\n");
  set(info.path, path);

  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 1026), 0);

  Statements sent = sent_statements();
  for (auto& sql : sent) {
    if (const auto at = sql.find(path); at != sql.npos)
      sql.replace(at, path.size(), "/music/a.flac");
  }
  EXPECT_EQ(sent, kActual);
}

TEST_F(TheStatements, OfATrackCutFromAKnownFile) {
  insert(record("/music/a.flac", "Y", "Hits"));
  clear_sent_statements();
  set(info.comment, "03:25:10");

  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, &cue_sheet, 1, 1026), 0);

  EXPECT_EQ(sent_statements(), kVirtualBesideActual);
}

TEST_F(TheStatements, OfAFileThatComesAfterItsCueSheet) {
  insert(virtual_record("/music/a.flac", 1, "X's", "Hits"), cue_sheet);
  clear_sent_statements();

  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 1026), 0);

  EXPECT_EQ(sent_statements(), kActualBesideVirtual);
}

TEST_F(TheStatements, OfATaggedAlbum) {
  insert(record("/music/a.flac", "X", "Hits", "The Band"));

  EXPECT_EQ(Statements(sent_statements().end() - 2, sent_statements().end()), kTagged);
}

TEST_F(TheStatements, OfAnUpdateThatLetsAnAlbumRecover) {
  insert(record("/music/a.flac", "X's", "Hits"));
  insert(record("/music/b.flac", "Y", "Hits"));
  clear_sent_statements();
  info.id = 1;

  EXPECT_EQ(MediaDBUpdateTrackRelatedTables(conn, &info), 0);

  EXPECT_EQ(sent_statements(), kUpdateWithRecovery);
}

TEST_F(TheStatements, OfACueSheetThatLeaves) {
  insert(record("/music/b.flac", "Y", "Hits"));
  insert(virtual_record("/music/a.flac", 1, "X's", "Hits"), cue_sheet);
  clear_sent_statements();

  EXPECT_EQ(MediaDBUpdateAlbumTrackTable(conn, "/music/a.cue", 1), 0);

  EXPECT_EQ(sent_statements(), kCueSheetLeaves);
}

TEST_F(TheStatements, OfReplayGainsAndPersonalFolders) {
  insert(record("/music/a.flac"));
  clear_sent_statements();
  const float gains[] = {-6.5F, 0.988F, -7, 1};

  MediaDBInsertIntoReplayGainTrackTable(conn, gains, 1);
  MediaDBFindPersonalDirWithSamePath(conn, "/home/u");

  EXPECT_EQ(sent_statements(), kOthers);
}

}  // namespace
}  // namespace mediidx::test
