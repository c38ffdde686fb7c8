// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "ratings/transfer.h"

#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <stdexcept>

#include "ratings/rating_file.h"
#include "ratings/rating_tag.h"

namespace mediidx::tool {
namespace {

void check_readable(const std::string& path) {
  if (access(path.c_str(), R_OK) != 0) throw std::runtime_error(std::strerror(errno));
}

}  // namespace

Imported import_rating(Database& database, const Song& song, const RatingUser& user, bool replace) {
  check_readable(song.path);
  const auto stars = read_rating_tag(song.path, user.name);
  if (!stars) return {ImportResult::kUnrated, 0};
  const auto known = stars_of(song, user);
  if (known && (known == stars || !replace)) return {ImportResult::kKept, *stars};
  write_rating(song.key(), user.id, *stars);
  update_index(database, song);
  return {ImportResult::kImported, *stars};
}

std::optional<int> stars_of(const Song& song, const RatingUser& user) {
  const auto ratings = read_ratings(song.key());
  const auto found = ratings.find(user.id);
  if (found == ratings.end() || found->second < 1 || found->second > kMostStars)
    return std::nullopt;
  return found->second;
}

bool export_rating(Database& database, const Song& song, const RatingUser& user, int stars) {
  check_readable(song.path);
  if (read_rating_tag(song.path, user.name) == stars) return false;
  if (!write_rating_tag(song.path, user.name, stars)) {
    throw std::runtime_error("its format holds no ratings");
  }
  update_index(database, song);
  return true;
}

}  // namespace mediidx::tool
