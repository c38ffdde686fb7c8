// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <unistd.h>

#include <array>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <span>

#include "cli/output.h"
#include "cli/verbs.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "text/table.h"

namespace mediidx::tool {
namespace {

constexpr const char* kSelectMusic =
    "SELECT t.title, a.artist, b.album, b.album_artist, t.agg_genre AS genre, t.year, t.disc, "
    "t.track, t.duration, t.codec, t.container, t.bitrate, t.frequency, t.channel, t.filesize, "
    "(t.is_virtual = 'TRUE') AS virtual, t.userid, t.path "
    "FROM track t "
    "LEFT JOIN artist_track a ON a.track = t.id "
    "LEFT JOIN album_track b ON b.track = t.id "
    "ORDER BY b.album_artist_sort, b.album_sort, t.disc, t.track, t.title_sort, t.path, t.id";

constexpr const char* kSelectAlbums =
    "SELECT b.album, b.album_artist, count(*) AS tracks, max(t.year) AS year, "
    "sum(t.duration::double precision) AS duration "
    "FROM album_track b JOIN track t ON t.id = b.track "
    "WHERE b.album <> '' "
    "GROUP BY b.album, b.album_artist, b.album_sort, b.album_artist_sort "
    "ORDER BY b.album_artist_sort, b.album_sort, b.album_artist, b.album";

constexpr const char* kSelectArtists =
    "SELECT a.artist, count(*) AS tracks, count(DISTINCT nullif(b.album, '')) AS albums "
    "FROM artist_track a LEFT JOIN album_track b ON b.track = a.track "
    "WHERE a.artist <> '' "
    "GROUP BY a.artist, a.artist_sort "
    "ORDER BY a.artist_sort, a.artist";

constexpr const char* kSelectGenres =
    "SELECT genre, count(*) AS tracks "
    "FROM genre_track "
    "WHERE genre <> '' "
    "GROUP BY genre, genre_sort "
    "ORDER BY genre_sort, genre";

// Saved without a time, a photo carries the epoch.
constexpr const char* kSelectPhotos =
    "SELECT title, album, nullif(timetaken, 'epoch') AS timetaken, resolutionx, resolutiony, "
    "concat_ws(' ', nullif(camera_make, ''), nullif(camera_model, '')) AS camera, exposure, "
    "aperture, iso, filesize, path "
    "FROM photo "
    "ORDER BY path, id";

constexpr const char* kSelectVideos =
    "SELECT title, album, duration, resolutionx, resolutiony, video_codec, audio_codec, "
    "container_type, frame_bitrate, filesize, path "
    "FROM video "
    "ORDER BY path, id";

constexpr const char* kSelectPlaylists =
    "SELECT title, song_count, filesize, 0 AS userid, path FROM playlist "
    "UNION ALL "
    "SELECT title, song_count, filesize, userid, path FROM personal_playlist "
    "ORDER BY path";

constexpr const char* kSelectFolders =
    "SELECT title, mdate, fs_uuid, 0 AS userid, path FROM directory "
    "UNION ALL "
    "SELECT title, mdate, fs_uuid, userid, path FROM personal_directory "
    "ORDER BY path";

enum class Type { kText, kPath, kNumber, kSeconds, kYesNo };

/// A column of a query: its name, also in JSON, and its title in a table (null: in JSON only).
struct ListColumn {
  const char* name;
  const char* title;
  Type type;
};

constexpr ListColumn kMusicColumns[] = {
    {"title", "Title", Type::kText},       {"artist", "Artist", Type::kText},
    {"album", "Album", Type::kText},       {"album_artist", nullptr, Type::kText},
    {"genre", nullptr, Type::kText},       {"year", "Year", Type::kNumber},
    {"disc", nullptr, Type::kNumber},      {"track", "No.", Type::kNumber},
    {"duration", "Time", Type::kSeconds},  {"codec", nullptr, Type::kText},
    {"container", nullptr, Type::kText},   {"bitrate", nullptr, Type::kNumber},
    {"frequency", nullptr, Type::kNumber}, {"channel", nullptr, Type::kNumber},
    {"filesize", nullptr, Type::kNumber},  {"virtual", nullptr, Type::kYesNo},
    {"userid", nullptr, Type::kNumber},    {"path", "Path", Type::kPath},
};
constexpr ListColumn kAlbumColumns[] = {
    {"album", "Album", Type::kText},      {"album_artist", "Album artist", Type::kText},
    {"year", "Year", Type::kNumber},      {"tracks", "Tracks", Type::kNumber},
    {"duration", "Time", Type::kSeconds},
};
constexpr ListColumn kArtistColumns[] = {
    {"artist", "Artist", Type::kText},
    {"albums", "Albums", Type::kNumber},
    {"tracks", "Tracks", Type::kNumber},
};
constexpr ListColumn kGenreColumns[] = {
    {"genre", "Genre", Type::kText},
    {"tracks", "Tracks", Type::kNumber},
};
constexpr ListColumn kPhotoColumns[] = {
    {"title", "Title", Type::kText},
    {"album", "Album", Type::kText},
    {"timetaken", "Taken", Type::kText},
    {"resolutionx", "Width", Type::kNumber},
    {"resolutiony", "Height", Type::kNumber},
    {"camera", "Camera", Type::kText},
    {"exposure", nullptr, Type::kText},
    {"aperture", nullptr, Type::kText},
    {"iso", nullptr, Type::kNumber},
    {"filesize", nullptr, Type::kNumber},
    {"path", "Path", Type::kPath},
};
constexpr ListColumn kVideoColumns[] = {
    {"title", "Title", Type::kText},
    {"album", nullptr, Type::kText},
    {"duration", "Time", Type::kSeconds},
    {"resolutionx", "Width", Type::kNumber},
    {"resolutiony", "Height", Type::kNumber},
    {"video_codec", "Video", Type::kText},
    {"audio_codec", "Audio", Type::kText},
    {"container_type", nullptr, Type::kText},
    {"frame_bitrate", nullptr, Type::kNumber},
    {"filesize", nullptr, Type::kNumber},
    {"path", "Path", Type::kPath},
};
constexpr ListColumn kPlaylistColumns[] = {
    {"title", "Title", Type::kText},      {"song_count", "Songs", Type::kNumber},
    {"filesize", nullptr, Type::kNumber}, {"userid", nullptr, Type::kNumber},
    {"path", "Path", Type::kPath},
};
constexpr ListColumn kFolderColumns[] = {
    {"title", nullptr, Type::kText},   {"mdate", "Changed", Type::kText},
    {"fs_uuid", nullptr, Type::kText}, {"userid", nullptr, Type::kNumber},
    {"path", "Path", Type::kPath},
};

struct List {
  const char* name;
  const char* query;
  std::span<const ListColumn> columns;
};

constexpr List kLists[] = {
    {"music", kSelectMusic, kMusicColumns},
    {"albums", kSelectAlbums, kAlbumColumns},
    {"artists", kSelectArtists, kArtistColumns},
    {"genres", kSelectGenres, kGenreColumns},
    {"photos", kSelectPhotos, kPhotoColumns},
    {"videos", kSelectVideos, kVideoColumns},
    {"playlists", kSelectPlaylists, kPlaylistColumns},
    {"folders", kSelectFolders, kFolderColumns},
};

constexpr auto kChoices = [] {
  std::array<const char*, std::size(kLists)> names{};
  for (std::size_t i = 0; i < names.size(); ++i) names[i] = kLists[i].name;
  return names;
}();

double number_of(const std::string& text) {
  double value = 0;
  std::from_chars(text.data(), text.data() + text.size(), value);
  return std::isfinite(value) ? value : 0;
}

/// "3:05", "1:02:03"
std::string clock_text(double seconds) {
  const auto whole = static_cast<long>(seconds);
  std::array<char, 48> text;
  if (whole < 3600) {
    std::snprintf(text.data(), text.size(), "%ld:%02ld", whole / 60, whole % 60);
  } else {
    std::snprintf(text.data(), text.size(), "%ld:%02ld:%02ld", whole / 3600, whole / 60 % 60,
                  whole % 60);
  }
  return text.data();
}

std::string cell_text(const Rows& rows, const ListColumn& column) {
  const auto text = rows.text(column.name);
  if (column.type == Type::kNumber) return text == "0" ? "" : text;
  if (column.type == Type::kSeconds) return text.empty() ? "" : clock_text(number_of(text));
  return text;
}

Json::Value json_value(const Rows& rows, const ListColumn& column) {
  const auto text = rows.text(column.name);
  if (column.type == Type::kNumber) return Json::Int64{std::llround(number_of(text))};
  if (column.type == Type::kSeconds) return number_of(text);
  if (column.type == Type::kYesNo) return text == "t";
  return text;
}

void print_json(Rows rows, const List& list) {
  JsonList out;
  while (rows.next()) {
    Json::Value object(Json::objectValue);
    for (const auto& column : list.columns) object[column.name] = json_value(rows, column);
    out.add(object);
  }
  out.finish();
}

void print_table(Rows rows, const List& list) {
  std::vector<Column> columns;
  for (const auto& column : list.columns) {
    if (!column.title) continue;
    const bool is_number = column.type == Type::kNumber || column.type == Type::kSeconds;
    columns.push_back({column.title, is_number, column.type == Type::kPath});
  }
  std::vector<TableRow> lines;
  while (rows.next()) {
    TableRow line;
    for (const auto& column : list.columns) {
      if (column.title) line.push_back(cell_text(rows, column));
    }
    lines.push_back(std::move(line));
  }
  const int width = terminal_width(STDOUT_FILENO);
  put(width > 0 ? format_table(columns, lines, width) : format_lines(lines));
}

}  // namespace

std::span<const char* const> list_choices() { return kChoices; }

int run_list(const Arguments& arguments) {
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  for (const auto& list : kLists) {
    if (arguments.operands[0] != list.name) continue;
    auto rows = database.query(list.query);
    if (arguments.has("--json")) {
      print_json(std::move(rows), list);
    } else {
      print_table(std::move(rows), list);
    }
  }
  return kExitDone;
}

}  // namespace mediidx::tool
