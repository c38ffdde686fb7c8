// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The album artist of a track that comes in.
///
/// A row of album_track holds one of three: the file's own album-artist tag (from_album_artist
/// TRUE); the track's artist, when the album's untagged tracks name that one only (FALSE); or
/// nothing, when they name several (TRUE and empty: the album is collapsed). Albums are one when
/// their names are one, whatever the artist, user or folder.
#ifndef MEDIIDX_DATABASE_ALBUM_ARTIST_H_
#define MEDIIDX_DATABASE_ALBUM_ARTIST_H_

#include <optional>

#include "database/catalogue_connection.h"

namespace mediidx::catalogue {

/// Writes the album row of a track, collapsing its album when the track's artist is a further one.
bool insert_album_of_track(const Connection& conn, const Record& info, int track_id);

/// Writes one album row.
bool insert_album_row(const Connection& conn, const Record& info, const char* album_artist,
                      int track_id, bool from_album_artist);
/// Counts the rows that speak against the track's artist being the album's only one: those of
/// another artist, and those that are collapsed already. Empty on failure.
std::optional<int> count_rows_against_artist(const Connection& conn, const Record& info);
/// Blanks the album artist of the album's rows that took it from their artist.
bool collapse_album(const Connection& conn, const Record& info);

}  // namespace mediidx::catalogue

#endif
