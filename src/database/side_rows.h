// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The side tables of a track that hold its tags one by one, each row one statement.
#ifndef MEDIIDX_DATABASE_SIDE_ROWS_H_
#define MEDIIDX_DATABASE_SIDE_ROWS_H_

#include <span>

#include "database/catalogue_connection.h"

namespace mediidx::catalogue {

/// One row per genre, trimmed, in order; a text that names none gives one row with the whole text.
/// Rows written before a failure stay.
bool insert_genre_rows(const Connection& conn, const Record& info, int track_id);
bool insert_genre_row(const Connection& conn, const char* genre, int track_id);
bool insert_composer_row(const Connection& conn, const Record& info, int track_id);
bool insert_artist_row(const Connection& conn, const Record& info, int track_id);
/// Where in its audio file a virtual track begins, and the cue sheet that says so.
bool insert_virtual_info_row(const Connection& conn, const Record& info, const Record& cue_sheet,
                             int track_id);
/// `gains`: track gain, track peak, album gain, album peak.
bool insert_replay_gain_row(const Connection& conn, std::span<const float, 4> gains, int track_id);
/// Counts the personal_directory rows of a path; empty on failure.
std::optional<int> count_personal_directories(const Connection& conn, const char* path);

}  // namespace mediidx::catalogue

#endif
