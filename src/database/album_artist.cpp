// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/album_artist.h"

#include "database/catalogue_text.h"
#include "support/sort_key.h"

namespace mediidx::catalogue {
namespace {

using Text = const char*;

constexpr Template<int, Text, Text, Text, Text, Text, Text, Text> kInsertAlbum =
    "INSERT INTO album_track(track, album, album_sort, album_search, album_artist, "
    "album_artist_sort, album_artist_search, from_album_artist) "
    "VALUES(@TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', "
    "'@TAVO:VAR', '@TAVO:VAR')";
constexpr Template<Text, Text, Text> kSelectAgainstArtist =
    "SELECT * FROM album_track "
    "WHERE (album = '@TAVO:VAR' AND album_artist != '@TAVO:VAR' "
    "AND from_album_artist = 'FALSE') OR (album = '@TAVO:VAR' "
    "AND album_artist = '' AND from_album_artist = 'TRUE')";
constexpr Template<Text> kCollapse =
    "UPDATE album_track "
    "SET album_artist = '', album_artist_sort = '', album_artist_search = '', "
    "from_album_artist = 'TRUE' "
    "WHERE album = '@TAVO:VAR' AND from_album_artist = 'FALSE'";

bool insert_or_say(const Connection& conn, const Record& info, const char* album_artist,
                   int track_id, bool from_album_artist, Line line) {
  return insert_album_row(conn, info, album_artist, track_id, from_album_artist) ||
         failed(line, "Failed to insert data into album_track table");
}

}  // namespace

bool insert_album_row(const Connection& conn, const Record& info, const char* album_artist,
                      int track_id, bool from_album_artist) {
  const NameKeys album(info.album);
  const NameKeys artist(album_artist);
  return conn.run(kAlbumInsertLine, conn.fill(kInsertAlbum, track_id, info.album, album.sort,
                                              album.search, album_artist, artist.sort,
                                              artist.search, text_flag(from_album_artist)));
}

std::optional<int> count_rows_against_artist(const Connection& conn, const Record& info) {
  return conn.count(kCollapseTestLine,
                    conn.fill(kSelectAgainstArtist, info.album, info.artist, info.album));
}

bool collapse_album(const Connection& conn, const Record& info) {
  return conn.run(kCollapseLine, conn.fill(kCollapse, info.album));
}

bool insert_album_of_track(const Connection& conn, const Record& info, int track_id) {
  if (*info.album_artist) {
    return insert_or_say(conn, info, info.album_artist, track_id, true, kTaggedAlbumFailedLine);
  }
  const auto against = count_rows_against_artist(conn, info);
  if (!against) {
    return failed(kCollapseTestFailedLine, "Failed to find alubm collapsing single album artist");
  }
  if (*against == 0) {
    return insert_or_say(conn, info, info.artist, track_id, false, kSingleAlbumFailedLine);
  }
  if (!collapse_album(conn, info)) {
    return failed(kCollapseFailedLine, "Failed to update album with multiple album artist");
  }
  return insert_or_say(conn, info, "", track_id, true, kCollapsedAlbumFailedLine);
}

}  // namespace mediidx::catalogue
