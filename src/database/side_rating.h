// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The star ratings that users gave a track.
#ifndef MEDIIDX_DATABASE_SIDE_RATING_H_
#define MEDIIDX_DATABASE_SIDE_RATING_H_

#include <cstdint>
#include <optional>
#include <vector>

#include "database/catalogue_connection.h"

namespace mediidx::catalogue {

/// What one user thinks of a track.
struct Rating {
  std::uint32_t userid;
  int star;
};

/// The ratings of the song's rating file that known users gave. A virtual track has a file of its
/// own, named by path, "_" and track number. Empty, and logged, when it cannot be read.
std::optional<std::vector<Rating>> read_ratings(const Record& info, bool is_virtual);

/// Stores them. A row that cannot be written is logged, and the others are written all the same.
bool insert_rating_rows(const Connection& conn, const Record& info, int track_id, bool is_virtual);

}  // namespace mediidx::catalogue

#endif
