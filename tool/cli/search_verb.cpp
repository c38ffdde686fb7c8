// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Music whose names hold a text, by the keys that the index keeps for it.
#include <algorithm>

#include "cli/row_output.h"
#include "cli/verbs.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "store/query.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr Template<const char*> kSearch{
    "WITH wanted AS (SELECT '%@TAVO:LVAR%'::text AS pattern), "
    "tagged AS (SELECT t.id, t.title, a.artist, b.album, b.album_artist, c.composer, "
    "t.agg_genre AS genre, t.year, t.disc, t.track, t.duration, "
    "(t.is_virtual = 'TRUE') AS virtual, t.userid, t.path, "
    "b.album_artist_sort, b.album_sort, t.title_sort, "
    "concat_ws(', ', "
    "CASE WHEN t.title_search LIKE pattern THEN 'title' END, "
    "CASE WHEN b.album_search LIKE pattern THEN 'album' END, "
    "CASE WHEN a.artist_search LIKE pattern THEN 'artist' END, "
    "CASE WHEN c.composer_search LIKE pattern THEN 'composer' END, "
    "CASE WHEN EXISTS (SELECT 1 FROM genre_track g "
    "WHERE g.track = t.id AND g.genre_search LIKE pattern) THEN 'genre' END) AS found_in "
    "FROM wanted, track t "
    "LEFT JOIN artist_track a ON a.track = t.id "
    "LEFT JOIN album_track b ON b.track = t.id "
    "LEFT JOIN composer_track c ON c.track = t.id) "
    "SELECT * FROM tagged WHERE found_in <> '' "
    "ORDER BY album_artist_sort, album_sort, disc, track, title_sort, path, id"};

constexpr RowColumn kColumns[] = {
    {"found_in", "Found in", ValueType::kText},  {"title", "Title", ValueType::kText},
    {"artist", "Artist", ValueType::kText},      {"album", "Album", ValueType::kText},
    {"album_artist", nullptr, ValueType::kText}, {"composer", "Composer", ValueType::kText},
    {"genre", "Genre", ValueType::kText},        {"year", nullptr, ValueType::kNumber},
    {"disc", nullptr, ValueType::kNumber},       {"track", nullptr, ValueType::kNumber},
    {"duration", "Time", ValueType::kSeconds},   {"virtual", nullptr, ValueType::kYesNo},
    {"userid", nullptr, ValueType::kNumber},     {"id", nullptr, ValueType::kNumber},
    {"path", "Path", ValueType::kPath},
};

/// As the keys are made: a to z raised, everything else as it is.
std::string as_key(std::string text) {
  std::ranges::transform(text, text.begin(), [](char c) {
    return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
  });
  return text;
}

}  // namespace

int run_search(const Arguments& arguments) {
  const auto& text = arguments.operands[0];
  if (text.empty()) throw UsageError("search needs a text");
  if (!is_utf8(text)) throw UsageError("search needs a text in UTF-8");
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  print_rows(database.query(filled(kSearch, as_key(text).c_str())), kColumns,
             arguments.has("--json"));
  return kExitDone;
}

}  // namespace mediidx::tool
