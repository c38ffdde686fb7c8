// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <array>
#include <span>

#include "cli/row_output.h"
#include "cli/verbs.h"
#include "store/data_folder.h"
#include "store/database.h"

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

constexpr RowColumn kMusicColumns[] = {
    {"title", "Title", ValueType::kText},       {"artist", "Artist", ValueType::kText},
    {"album", "Album", ValueType::kText},       {"album_artist", nullptr, ValueType::kText},
    {"genre", nullptr, ValueType::kText},       {"year", "Year", ValueType::kNumber},
    {"disc", nullptr, ValueType::kNumber},      {"track", "No.", ValueType::kNumber},
    {"duration", "Time", ValueType::kSeconds},  {"codec", nullptr, ValueType::kText},
    {"container", nullptr, ValueType::kText},   {"bitrate", nullptr, ValueType::kNumber},
    {"frequency", nullptr, ValueType::kNumber}, {"channel", nullptr, ValueType::kNumber},
    {"filesize", nullptr, ValueType::kNumber},  {"virtual", nullptr, ValueType::kYesNo},
    {"userid", nullptr, ValueType::kNumber},    {"path", "Path", ValueType::kPath},
};
constexpr RowColumn kAlbumColumns[] = {
    {"album", "Album", ValueType::kText},      {"album_artist", "Album artist", ValueType::kText},
    {"year", "Year", ValueType::kNumber},      {"tracks", "Tracks", ValueType::kNumber},
    {"duration", "Time", ValueType::kSeconds},
};
constexpr RowColumn kArtistColumns[] = {
    {"artist", "Artist", ValueType::kText},
    {"albums", "Albums", ValueType::kNumber},
    {"tracks", "Tracks", ValueType::kNumber},
};
constexpr RowColumn kGenreColumns[] = {
    {"genre", "Genre", ValueType::kText},
    {"tracks", "Tracks", ValueType::kNumber},
};
constexpr RowColumn kPhotoColumns[] = {
    {"title", "Title", ValueType::kText},
    {"album", "Album", ValueType::kText},
    {"timetaken", "Taken", ValueType::kText},
    {"resolutionx", "Width", ValueType::kNumber},
    {"resolutiony", "Height", ValueType::kNumber},
    {"camera", "Camera", ValueType::kText},
    {"exposure", nullptr, ValueType::kText},
    {"aperture", nullptr, ValueType::kText},
    {"iso", nullptr, ValueType::kNumber},
    {"filesize", nullptr, ValueType::kNumber},
    {"path", "Path", ValueType::kPath},
};
constexpr RowColumn kVideoColumns[] = {
    {"title", "Title", ValueType::kText},
    {"album", nullptr, ValueType::kText},
    {"duration", "Time", ValueType::kSeconds},
    {"resolutionx", "Width", ValueType::kNumber},
    {"resolutiony", "Height", ValueType::kNumber},
    {"video_codec", "Video", ValueType::kText},
    {"audio_codec", "Audio", ValueType::kText},
    {"container_type", nullptr, ValueType::kText},
    {"frame_bitrate", nullptr, ValueType::kNumber},
    {"filesize", nullptr, ValueType::kNumber},
    {"path", "Path", ValueType::kPath},
};
constexpr RowColumn kPlaylistColumns[] = {
    {"title", "Title", ValueType::kText},      {"song_count", "Songs", ValueType::kNumber},
    {"filesize", nullptr, ValueType::kNumber}, {"userid", nullptr, ValueType::kNumber},
    {"path", "Path", ValueType::kPath},
};
constexpr RowColumn kFolderColumns[] = {
    {"title", nullptr, ValueType::kText},   {"mdate", "Changed", ValueType::kText},
    {"fs_uuid", nullptr, ValueType::kText}, {"userid", nullptr, ValueType::kNumber},
    {"path", "Path", ValueType::kPath},
};

struct List {
  const char* name;
  const char* query;
  std::span<const RowColumn> columns;
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

}  // namespace

std::span<const char* const> list_choices() { return kChoices; }

int run_list(const Arguments& arguments) {
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  for (const auto& list : kLists) {
    if (arguments.operands[0] != list.name) continue;
    print_rows(database.query(list.query), list.columns, arguments.has("--json"));
  }
  return kExitDone;
}

}  // namespace mediidx::tool
