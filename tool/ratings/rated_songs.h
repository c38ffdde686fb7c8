// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Songs of the index as those who rate them know them, and the users who do.
#ifndef MEDIIDX_TOOL_RATINGS_RATED_SONGS_H_
#define MEDIIDX_TOOL_RATINGS_RATED_SONGS_H_

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "store/database.h"

namespace mediidx::tool {

/// A user who rates. The library takes 0 for no user, so root has no ratings.
struct RatingUser {
  std::uint32_t id = 0;
  std::string name;  ///< Empty for an id that no user has any more.
};
/// The user of a name, or of an id in decimal digits. Throws std::runtime_error when there is none.
RatingUser find_user(const std::string& named);
/// The name of a user's id; empty when there is no such user.
std::string name_of_user(std::uint32_t id);

/// An audio file, or a track that a cue sheet cuts out of it.
struct Song {
  std::string path;
  std::optional<int> track;  ///< Of a cue sheet's track.

  /// What its ratings stand under.
  std::string key() const { return track ? path + "_" + std::to_string(*track) : path; }
};

/// The songs of the index of a path and below it; of all paths when it is empty.
std::vector<Song> find_songs(Database& database, const std::string& path);

/// Has the library take a song's ratings into the index, by saving the file, or the cue sheets of
/// its track, again. False when the index does not hold the song. Throws std::runtime_error.
bool update_index(Database& database, const Song& song);

/// True when the index holds the song.
bool is_indexed(Database& database, const Song& song);

}  // namespace mediidx::tool

#endif
