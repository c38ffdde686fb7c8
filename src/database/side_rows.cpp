// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/side_rows.h"

#include <tavocore.h>

#include <array>
#include <cerrno>
#include <cstring>

#include "database/catalogue_text.h"
#include "database/track_genre.h"
#include "support/log.h"
#include "support/sort_key.h"

namespace mediidx::catalogue {
namespace {

using Text = const char*;

constexpr Template<int, Text, Text, Text> kInsertGenre =
    "INSERT INTO genre_track(track, genre, genre_sort, genre_search) "
    "VALUES(@TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR')";
constexpr Template<int, Text, Text, Text> kInsertComposer =
    "INSERT INTO composer_track(track, composer, composer_sort, composer_search) "
    "VALUES(@TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR')";
constexpr Template<int, Text, Text, Text, Text> kInsertArtist =
    "INSERT INTO artist_track(track, artist, artist_sort, artist_search, "
    "has_album_artist) "
    "VALUES(@TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR')";
constexpr Template<int, Text, Text> kInsertVirtualInfo =
    "INSERT INTO virtual_info_track(track, audio_offset, cue_sheet_path) "
    "VALUES(@TAVO:INT, '@TAVO:VAR', '@TAVO:VAR')";
constexpr Template<int, Text, Text, Text, Text> kInsertReplayGain =
    "INSERT INTO replaygain_track(track, rg_track_gain, rg_track_peak, rg_album_gain, "
    "rg_album_peak) "
    "VALUES(@TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR')";
constexpr Template<Text> kSelectPersonalDirectory =
    "SELECT * FROM personal_directory "
    "WHERE path = '@TAVO:VAR'";

}  // namespace

bool insert_genre_row(const Connection& conn, const char* genre, int track_id) {
  const NameKeys keys(genre);
  return conn.run(kGenreInsertLine,
                  conn.fill(kInsertGenre, track_id, genre, keys.sort, keys.search));
}

bool insert_genre_rows(const Connection& conn, const Record& info, int track_id) {
  GenreTokens tokens(info.genre);
  if (!tokens) {
    kDatabaseLog.colon(kGenreCopyLine, "Failed to strdup. %s", std::strerror(errno));
    return false;
  }
  char* token = tokens.next();
  if (!token) return insert_genre_row(conn, info.genre, track_id);
  for (; token; token = tokens.next()) {
    // Unlike in the aggregated text, the first one is trimmed too.
    if (!insert_genre_row(conn, StringTrim(token), track_id)) {
      return failed(kOneGenreLine, "Failed to insert one genre record into genre_track table");
    }
  }
  return true;
}

bool insert_composer_row(const Connection& conn, const Record& info, int track_id) {
  const NameKeys keys(info.composer);
  return conn.run(kComposerInsertLine,
                  conn.fill(kInsertComposer, track_id, info.composer, keys.sort, keys.search));
}

bool insert_artist_row(const Connection& conn, const Record& info, int track_id) {
  const NameKeys keys(info.artist);
  return conn.run(kArtistInsertLine, conn.fill(kInsertArtist, track_id, info.artist, keys.sort,
                                               keys.search, text_flag(*info.album_artist)));
}

bool insert_virtual_info_row(const Connection& conn, const Record& info, const Record& cue_sheet,
                             int track_id) {
  return conn.run(kVirtualInfoInsertLine,
                  conn.fill(kInsertVirtualInfo, track_id, info.comment, cue_sheet.path));
}

bool insert_replay_gain_row(const Connection& conn, std::span<const float, 4> gains, int track_id) {
  const auto [track_gain, track_peak, album_gain, album_peak] =
      std::array{decimal_text(gains[0]), decimal_text(gains[1]), decimal_text(gains[2]),
                 decimal_text(gains[3])};
  return conn.run(kReplayGainInsertLine,
                  conn.fill(kInsertReplayGain, track_id, track_gain.data(), track_peak.data(),
                            album_gain.data(), album_peak.data()));
}

std::optional<int> count_personal_directories(const Connection& conn, const char* path) {
  return conn.count(kPersonalDirectoryLine, conn.fill(kSelectPersonalDirectory, path));
}

}  // namespace mediidx::catalogue
