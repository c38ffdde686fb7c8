// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Whole tracks of the music catalogue: the track row and the rows of its side tables.
///
/// Nothing is undone: what was written before a failure stays.
#ifndef MEDIIDX_DATABASE_CATALOGUE_H_
#define MEDIIDX_DATABASE_CATALOGUE_H_

#include <cstdint>

#include "database/catalogue_connection.h"

namespace mediidx::catalogue {

/// Inserts a track, virtual when a cue sheet is given, and stores its id into the record.
bool insert_track(const Connection& conn, Record& info, const Record* cue_sheet,
                  std::int64_t userid);
/// Rewrites the track `info.id`; its ratings, replay gain and cue sheet stay as they are.
bool update_track(const Connection& conn, const Record& info);
/// Removes the genre, composer, artist and album rows of `info.id`, its album recovered first.
bool delete_side_rows(const Connection& conn, const Record& info);

/// Logs that a track has everything but its ratings.
void log_ratings_not_inserted();

}  // namespace mediidx::catalogue

#endif
