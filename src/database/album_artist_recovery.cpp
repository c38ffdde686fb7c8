// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/album_artist_recovery.h"

namespace mediidx::catalogue {
namespace {

using Text = const char*;

constexpr Template<Text> kSelectCollapsedOfFile =
    "SELECT * FROM track "
    "LEFT JOIN album_track ON track.id = album_track.track "
    "WHERE path = '@TAVO:VAR' AND is_virtual = 'FALSE' "
    "AND album_artist = '' AND from_album_artist = 'TRUE'";
constexpr Template<Text> kSelectCollapsedOfCueSheet =
    "SELECT * FROM album_track "
    "LEFT JOIN virtual_info_track ON album_track.track = virtual_info_track.track "
    "WHERE cue_sheet_path = '@TAVO:VAR' AND album_artist = '' "
    "AND from_album_artist = 'TRUE'";
constexpr Template<Text, Text> kSelectArtistsBesideFile =
    "SELECT artist "
    "FROM (track "
    "LEFT JOIN album_track ON track.id = album_track.track) "
    "LEFT JOIN artist_track ON id = artist_track.track "
    "WHERE album IN (SELECT album FROM track "
    "LEFT JOIN album_track ON track.id = album_track.track "
    "WHERE path = '@TAVO:VAR' AND is_virtual = 'FALSE' "
    "AND album_artist = '' AND from_album_artist = 'TRUE') "
    "AND path != '@TAVO:VAR' AND from_album_artist = 'TRUE' "
    "GROUP BY artist";
constexpr Template<Text, Text> kSelectArtistsBesideCueSheet =
    "SELECT artist "
    "FROM ((track "
    "LEFT JOIN album_track ON track.id = album_track.track) "
    "LEFT JOIN artist_track ON id = artist_track.track) "
    "LEFT JOIN virtual_info_track ON id = virtual_info_track.track "
    "WHERE album IN (SELECT album FROM album_track "
    "LEFT JOIN virtual_info_track ON album_track.track = virtual_info_track.track "
    "WHERE cue_sheet_path = '@TAVO:VAR' AND album_artist = '' "
    "AND from_album_artist = 'TRUE') "
    "AND (cue_sheet_path != '@TAVO:VAR' OR is_virtual = 'FALSE') "
    "AND from_album_artist = 'TRUE' GROUP BY artist";
constexpr Template<Text, Text, Text> kRecoverBesideFile =
    "UPDATE album_track "
    "SET album_artist = tmp.artist, album_artist_sort = tmp.artist_sort, "
    "album_artist_search = tmp.artist_search, from_album_artist = 'FALSE' "
    "FROM (SELECT * "
    "FROM (album_track "
    "LEFT JOIN track ON album_track.track = track.id) "
    "LEFT JOIN artist_track ON id = artist_track.track "
    "WHERE album IN (SELECT album FROM track "
    "LEFT JOIN album_track ON track.id = album_track.track "
    "WHERE path = '@TAVO:VAR' AND is_virtual = 'FALSE' "
    "AND album_artist = '' AND from_album_artist = 'TRUE') "
    "AND path != '@TAVO:VAR' AND from_album_artist = 'TRUE') "
    "AS tmp "
    "WHERE (album_track.album IN (SELECT album FROM track "
    "LEFT JOIN album_track ON track.id = album_track.track "
    "WHERE path = '@TAVO:VAR' AND is_virtual = 'FALSE' "
    "AND album_artist = '' AND from_album_artist = 'TRUE')) "
    "AND album_track.from_album_artist = 'TRUE'";
constexpr Template<Text, Text, Text> kRecoverBesideCueSheet =
    "UPDATE album_track "
    "SET album_artist = tmp.artist, album_artist_sort = tmp.artist_sort, "
    "album_artist_search = tmp.artist_search, from_album_artist = 'FALSE' "
    "FROM (SELECT * "
    "FROM ((album_track "
    "LEFT JOIN track ON album_track.track = track.id) "
    "LEFT JOIN artist_track ON id = artist_track.track) "
    "LEFT JOIN virtual_info_track ON id = virtual_info_track.track  "
    "WHERE album IN (SELECT album FROM album_track "
    "LEFT JOIN virtual_info_track ON album_track.track = virtual_info_track.track "
    "WHERE cue_sheet_path = '@TAVO:VAR' AND album_artist = '' "
    "AND from_album_artist = 'TRUE') "
    "AND (cue_sheet_path != '@TAVO:VAR' OR is_virtual = 'FALSE') "
    "AND from_album_artist = 'TRUE') AS tmp "
    "WHERE (album_track.album IN (SELECT album FROM album_track "
    "LEFT JOIN virtual_info_track ON album_track.track = virtual_info_track.track "
    "WHERE cue_sheet_path = '@TAVO:VAR' AND album_artist = '' "
    "AND from_album_artist = 'TRUE')) "
    "AND album_track.from_album_artist = 'TRUE'";

}  // namespace

std::optional<int> count_collapsed_rows(const Connection& conn, const char* path, Leaving leaving) {
  if (leaving == Leaving::kCueSheet) {
    return conn.count(kCueMemberTestLine, conn.fill(kSelectCollapsedOfCueSheet, path));
  }
  return conn.count(kMemberTestLine, conn.fill(kSelectCollapsedOfFile, path));
}

std::optional<int> count_remaining_artists(const Connection& conn, const char* path,
                                           Leaving leaving) {
  if (leaving == Leaving::kCueSheet) {
    return conn.count(kCueRemainingArtistsLine,
                      conn.fill(kSelectArtistsBesideCueSheet, path, path));
  }
  return conn.count(kRemainingArtistsLine, conn.fill(kSelectArtistsBesideFile, path, path));
}

bool recover_single_artist(const Connection& conn, const char* path, Leaving leaving) {
  if (leaving == Leaving::kCueSheet) {
    return conn.run(kCueRecoveryLine, conn.fill(kRecoverBesideCueSheet, path, path, path));
  }
  return conn.run(kRecoveryLine, conn.fill(kRecoverBesideFile, path, path, path));
}

bool recover_album_artists(const Connection& conn, const char* path, Leaving leaving) {
  const auto collapsed = count_collapsed_rows(conn, path, leaving);
  if (!collapsed) {
    return failed(kMemberTestFailedLine, "Failed to check data in multiple album artist");
  }
  if (*collapsed == 0) return true;
  const auto artists = count_remaining_artists(conn, path, leaving);
  if (!artists) {
    return failed(kRemainingArtistsFailedLine,
                  "Failed to check if other records has multiple album artist");
  }
  if (*artists != 1) return true;
  return recover_single_artist(conn, path, leaving) ||
         failed(kRecoveryFailedLine, "Failed to recover to single album artist");
}

}  // namespace mediidx::catalogue
