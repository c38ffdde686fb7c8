// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "ratings/rated_songs.h"

#include <tavosdk.h>

#include <charconv>
#include <stdexcept>

#include "explain/save_again.h"
#include "mediidx/request.h"
#include "store/query.h"
#include "support/owned.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

using Text = const char*;

constexpr Template<Text, Text> kSelectSongs{
    "SELECT DISTINCT path, CASE WHEN is_virtual = 'TRUE' THEN track END AS track "
    "FROM track "
    "WHERE path = '@TAVO:VAR' OR path LIKE '@TAVO:LVAR/%' "
    "ORDER BY path, track NULLS FIRST"};
constexpr Template<Text> kFindFile{
    "SELECT 1 AS found FROM track WHERE path = '@TAVO:VAR' AND is_virtual = 'FALSE'"};
constexpr Template<Text, int> kSelectSheets{
    "SELECT DISTINCT v.cue_sheet_path "
    "FROM track t JOIN virtual_info_track v ON v.track = t.id "
    "WHERE t.path = '@TAVO:VAR' AND t.track = @TAVO:INT AND t.is_virtual = 'TRUE' "
    "ORDER BY v.cue_sheet_path"};

template <class Number>
std::optional<Number> number_from(const std::string& text) {
  Number number{};
  const auto read = std::from_chars(text.data(), text.data() + text.size(), number);
  const bool whole = read.ec == std::errc() && read.ptr == text.data() + text.size();
  return whole ? std::optional(number) : std::nullopt;
}

std::vector<std::string> cue_sheets_of(Database& database, const Song& song) {
  std::vector<std::string> out;
  auto rows = database.query(filled(kSelectSheets, song.path.c_str(), song.track.value_or(0)));
  while (rows.next()) out.push_back(rows.text("cue_sheet_path"));
  return out;
}

}  // namespace

std::string name_of_user(std::uint32_t id) {
  OwnedUser user;
  TAVOUserGetByUID(id, out(user));
  return user ? user->name : "";
}

RatingUser find_user(const std::string& named) {
  if (const auto id = TAVOMediaIndexGetUserIdFromName(named.c_str()); id != 0) return {id, named};
  const auto id = number_from<std::uint32_t>(named).value_or(0);
  const auto name = id != 0 ? name_of_user(id) : std::string();
  if (!name.empty()) return {id, name};
  throw std::runtime_error("there is no user " + escape_for_display(named) + " who can rate");
}

std::vector<Song> find_songs(Database& database, const std::string& path) {
  std::vector<Song> out;
  auto rows = database.query(filled(kSelectSongs, path.c_str(), path.c_str()));
  while (rows.next()) out.push_back({rows.text("path"), number_from<int>(rows.text("track"))});
  return out;
}

bool is_indexed(Database& database, const Song& song) {
  if (song.track) return !cue_sheets_of(database, song).empty();
  return database.query(filled(kFindFile, song.path.c_str())).next();
}

bool update_index(Database& database, const Song& song) {
  if (!song.track) {
    if (!is_indexed(database, song)) return false;
    save_again(database, song.path, Kind::kMusic);
    return true;
  }
  const auto sheets = cue_sheets_of(database, song);
  for (const auto& sheet : sheets) save_again(database, sheet, Kind::kCueSheet);
  return !sheets.empty();
}

}  // namespace mediidx::tool
