// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The star ratings that users gave a track.
#ifndef MEDIIDX_DATABASE_SIDE_RATING_H_
#define MEDIIDX_DATABASE_SIDE_RATING_H_

#include "database/catalogue_connection.h"

namespace mediidx::catalogue {

/// Stores the ratings of the song's rating file. A virtual track has one of its own, named by path,
/// "_" and track number. Ratings of unknown users are left out; a row that cannot be written is
/// logged, and the others are written all the same.
bool insert_rating_rows(const Connection& conn, const Record& info, int track_id, bool is_virtual);

}  // namespace mediidx::catalogue

#endif
