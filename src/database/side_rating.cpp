// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/side_rating.h"

#include <tavocore.h>
#include <tavosdk.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <string>
#include <utility>

#include "mediidx/request.h"
#include "support/log.h"
#include "support/text.h"

namespace mediidx::catalogue {
namespace {

constexpr Template<std::int64_t, int, int> kInsertRating =
    "INSERT INTO rating_track(userid, track, star) "
    "VALUES(@TAVO:LLINT, @TAVO:INT, @TAVO:INT)";

/// The longest name under which ratings are looked up.
constexpr std::size_t kRatingKeyWidth = 4103;

std::string rating_key(const Record& info, bool is_virtual) {
  std::string key = info.path;
  if (is_virtual) key += "_" + std::to_string(info.track);
  key.resize(cut_at_character(key, kRatingKeyWidth).size());
  return key;
}

/// A decimal number of a rating file; empty when it is none that the type can hold.
template <class Number>
std::optional<Number> number_from(const char* text) {
  const auto number = std::strtoll(text, nullptr, 10);
  if (!std::in_range<Number>(number)) return std::nullopt;
  return static_cast<Number>(number);
}

bool user_exists(std::uint32_t uid) {
  OwnedUser user;
  return TAVOUserGetByUID(uid, out(user)) == 0;
}

void insert_rating_row(const Connection& conn, const Rating& rating, int track_id) {
  const auto sql = conn.fill(kInsertRating, std::int64_t{rating.userid}, track_id, rating.star);
  if (conn.run_unlogged(sql)) return;
  kDatabaseLog.colon(kRatingInsertLine, "Failed to exec [%s] (%s).", sql ? sql.get() : "(null)",
                     conn.error());
}

}  // namespace

std::optional<std::vector<Rating>> read_ratings(const Record& info, bool is_virtual) {
  const auto key = rating_key(info, is_virtual);
  const OwnedHash found(TLIBCSzHashAlloc(1024));
  if (!found) {
    failed(kRatingHashLine, "Failed to alloc memory");
    return std::nullopt;
  }
  if (TAVOMediaIndexGetAllUserDefinedSongRating(key.c_str(), found.get()) == 0) {
    kDatabaseLog.colon(kRatingReadLine, "Failed to get song rating from path [%s]", key.c_str());
    return std::nullopt;
  }
  std::vector<Rating> ratings;
  int cursor = 0;
  const char* user = nullptr;
  const char* stars = nullptr;
  while (TLIBCSzHashNext(found.get(), &cursor, &user, &stars) == 1) {
    if (!user || !stars) continue;
    const auto uid = number_from<std::uint32_t>(user);
    const auto star = number_from<int>(stars);
    if (uid && star && user_exists(*uid)) ratings.push_back({*uid, *star});
  }
  return ratings;
}

bool insert_rating_rows(const Connection& conn, const Record& info, int track_id, bool is_virtual) {
  const auto ratings = read_ratings(info, is_virtual);
  if (!ratings) return false;
  for (const auto& rating : *ratings) insert_rating_row(conn, rating, track_id);
  return true;
}

}  // namespace mediidx::catalogue
