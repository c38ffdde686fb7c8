// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Ratings on their way between rating files and the tags of the songs. Everything throws
/// std::runtime_error with the reason.
#ifndef MEDIIDX_TOOL_RATINGS_TRANSFER_H_
#define MEDIIDX_TOOL_RATINGS_TRANSFER_H_

#include <optional>

#include "ratings/rated_songs.h"
#include "store/database.h"

namespace mediidx::tool {

enum class ImportResult {
  kImported,
  kKept,     ///< The user has rated the song already.
  kUnrated,  ///< Its tags hold no rating.
};
struct Imported {
  ImportResult result;
  int stars;  ///< Of the tag; 0 when it has none.
};
/// Takes the rating of a song's tags as the user's; over one that differs only with `replace`.
Imported import_rating(Database& database, const Song& song, const RatingUser& user, bool replace);

/// The stars that the user gave the song; empty for none.
std::optional<int> stars_of(const Song& song, const RatingUser& user);

/// Writes the stars into the tags of a song that is a file of its own, and has it indexed as it is
/// then. False where the tags tell the same already.
bool export_rating(Database& database, const Song& song, const RatingUser& user, int stars);

}  // namespace mediidx::tool

#endif
