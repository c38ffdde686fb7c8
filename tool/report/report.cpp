// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "report/report.h"

namespace mediidx::tool {
namespace {

// Every file of the index, those of the users' own libraries too: their songs stand among the
// tracks only.
constexpr const char* kMedia =
    "WITH media AS ("
    "SELECT 'music' AS kind, path, filesize, duration::double precision, date, fs_uuid, "
    "coalesce(fs_online, true) AS online FROM music "
    "UNION ALL "
    "SELECT 'music', path, filesize, duration::double precision, date, '', true "
    "FROM track WHERE userid <> 0 AND is_virtual = 'FALSE' "
    "UNION ALL "
    "SELECT 'videos', path, filesize, duration, date, fs_uuid, coalesce(fs_online, true) FROM video "
    "UNION ALL "
    "SELECT 'photos', path, filesize, 0, date, fs_uuid, coalesce(fs_online, true) FROM photo "
    "UNION ALL "
    "SELECT 'playlists', path, filesize, 0, date, fs_uuid, coalesce(fs_online, true) FROM playlist "
    "UNION ALL "
    "SELECT 'playlists', path, filesize, 0, date, fs_uuid, true FROM personal_playlist) ";

// Albums, artists and genres as "list" and "stats" count them.
constexpr const char* kSelectTotals =
    "SELECT to_char(now() AT TIME ZONE 'UTC', 'YYYY-MM-DD HH24:MI') AS written, counted.*, "
    "(SELECT count(*) FROM (SELECT DISTINCT album, album_artist FROM album_track "
    "WHERE album <> '') AS a) AS albums, "
    "(SELECT count(DISTINCT artist) FROM artist_track WHERE artist <> '') AS artists, "
    "(SELECT count(DISTINCT genre) FROM genre_track WHERE genre <> '') AS genres, "
    "(SELECT count(*) FROM scan.file WHERE failure IS NOT NULL) AS failures "
    "FROM (SELECT count(*) AS files, count(*) FILTER (WHERE kind = 'music') AS songs, "
    "count(*) FILTER (WHERE kind = 'videos') AS videos, "
    "count(*) FILTER (WHERE kind = 'photos') AS photos, "
    "count(*) FILTER (WHERE kind = 'playlists') AS playlists, "
    "sum(filesize) AS bytes, sum(duration) FILTER (WHERE kind = 'music') AS seconds_of_music, "
    "sum(duration) FILTER (WHERE kind = 'videos') AS seconds_of_video, "
    "count(*) FILTER (WHERE NOT online) AS offline FROM media) AS counted";

struct Total {
  const char* name;
  std::int64_t ReportTotals::* value;
};
constexpr Total kTotals[] = {
    {"files", &ReportTotals::files},
    {"songs", &ReportTotals::songs},
    {"videos", &ReportTotals::videos},
    {"photos", &ReportTotals::photos},
    {"playlists", &ReportTotals::playlists},
    {"albums", &ReportTotals::albums},
    {"artists", &ReportTotals::artists},
    {"genres", &ReportTotals::genres},
    {"bytes", &ReportTotals::bytes},
    {"seconds_of_music", &ReportTotals::seconds_of_music},
    {"seconds_of_video", &ReportTotals::seconds_of_video},
    {"offline", &ReportTotals::offline},
    {"failures", &ReportTotals::failures},
};

constexpr ReportColumn kKindColumns[] = {
    {"kind", "Kind", ReportValue::kText},
    {"files", "Files", ReportValue::kNumber, "count"},
    {"bytes", "Size", ReportValue::kBytes},
    {"offline", "Offline", ReportValue::kNumber},
};
constexpr const char* kSelectKinds =
    "SELECT k.name AS kind, count(m.kind) AS files, sum(m.filesize) AS bytes, "
    "count(*) FILTER (WHERE NOT m.online) AS offline "
    "FROM (VALUES (1, 'music', 'Music'), (2, 'videos', 'Videos'), (3, 'photos', 'Photos'), "
    "(4, 'playlists', 'Playlists')) AS k(place, kind, name) "
    "LEFT JOIN media AS m ON m.kind = k.kind "
    "WHERE EXISTS (SELECT FROM media) GROUP BY k.place, k.name ORDER BY k.place";

constexpr ReportColumn kGrowthColumns[] = {
    {"period", "When", ReportValue::kText},
    {"music", "Music", ReportValue::kNumber, "music"},
    {"videos", "Videos", ReportValue::kNumber, "videos"},
    {"photos", "Photos", ReportValue::kNumber, "photos"},
    {"playlists", "Playlists", ReportValue::kNumber, "playlists"},
};
// Days for three months, months for fifteen years, else years. An unknown date is the epoch; one in
// the future would stretch the axis.
constexpr const char* kSelectGrowth =
    ", dated AS (SELECT kind, date FROM media "
    "WHERE date >= '1970-01-02' AND date < now()::timestamp + interval '1 day'), "
    "span AS (SELECT CASE WHEN max(date) - min(date) < interval '92 days' THEN 'day' "
    "WHEN max(date) - min(date) < interval '5479 days' THEN 'month' ELSE 'year' END AS unit "
    "FROM dated) "
    "SELECT to_char(date_trunc(unit, date), CASE unit WHEN 'day' THEN 'YYYY-MM-DD' "
    "WHEN 'month' THEN 'YYYY-MM' ELSE 'YYYY' END) AS period, "
    "count(*) FILTER (WHERE kind = 'music') AS music, "
    "count(*) FILTER (WHERE kind = 'videos') AS videos, "
    "count(*) FILTER (WHERE kind = 'photos') AS photos, "
    "count(*) FILTER (WHERE kind = 'playlists') AS playlists "
    "FROM dated, span GROUP BY 1 ORDER BY 1";

constexpr ReportColumn kYearColumns[] = {
    {"period", "Year", ReportValue::kText},
    {"music", "Songs released", ReportValue::kNumber, "music"},
    {"photos", "Photos taken", ReportValue::kNumber, "photos"},
};
// A tag may claim any year; those that a chart has no room for come first and last.
constexpr const char* kSelectYears =
    ", dated AS (SELECT 'music' AS kind, year FROM track WHERE is_virtual = 'FALSE' AND year > 0 "
    "UNION ALL "
    "SELECT 'photos', extract(year FROM timetaken)::integer FROM photo "
    "WHERE timetaken <> 'epoch' AND isfinite(timetaken)), "
    "placed AS (SELECT kind, "
    "least(greatest(year, 1899), extract(year FROM now())::integer + 2) AS year FROM dated) "
    "SELECT CASE WHEN year = 1899 THEN 'before 1900' "
    "WHEN year > extract(year FROM now()) + 1 THEN 'in the future' ELSE year::text END AS period, "
    "count(*) FILTER (WHERE kind = 'music') AS music, "
    "count(*) FILTER (WHERE kind = 'photos') AS photos "
    "FROM placed GROUP BY year ORDER BY year";

constexpr ReportColumn kGenreColumns[] = {
    {"genre", "Genre", ReportValue::kText},
    {"tracks", "Tracks", ReportValue::kNumber, "music"},
};
constexpr const char* kSelectGenres =
    ", counted AS (SELECT genre, count(*) AS tracks FROM genre_track WHERE genre <> '' "
    "GROUP BY genre), "
    "ranked AS (SELECT *, least(row_number() OVER (ORDER BY tracks DESC, genre), 13) AS place "
    "FROM counted) "
    "SELECT min(genre) AS genre, sum(tracks) AS tracks, "
    "CASE WHEN count(*) > 1 THEN count(*) ELSE 0 END AS rest "
    "FROM ranked GROUP BY place ORDER BY place";

constexpr ReportColumn kFormatColumns[] = {
    {"ending", "Format", ReportValue::kText},
    {"music", "Music", ReportValue::kNumber, "music"},
    {"videos", "Videos", ReportValue::kNumber, "videos"},
    {"photos", "Photos", ReportValue::kNumber, "photos"},
    {"playlists", "Playlists", ReportValue::kNumber, "playlists"},
    {"bytes", "Size", ReportValue::kBytes},
};
constexpr const char* kSelectFormats =
    ", counted AS (SELECT lower(substring(path FROM '[.]([^./]+)$')) AS ending, "
    "count(*) AS files, sum(filesize) AS bytes, "
    "count(*) FILTER (WHERE kind = 'music') AS music, "
    "count(*) FILTER (WHERE kind = 'videos') AS videos, "
    "count(*) FILTER (WHERE kind = 'photos') AS photos, "
    "count(*) FILTER (WHERE kind = 'playlists') AS playlists FROM media GROUP BY 1), "
    "ranked AS (SELECT *, least(row_number() OVER (ORDER BY files DESC, ending), 13) AS place "
    "FROM counted) "
    "SELECT min(ending) AS ending, sum(music) AS music, sum(videos) AS videos, "
    "sum(photos) AS photos, sum(playlists) AS playlists, sum(bytes) AS bytes, "
    "CASE WHEN count(*) > 1 THEN count(*) ELSE 0 END AS rest "
    "FROM ranked GROUP BY place ORDER BY place";

constexpr ReportColumn kFolderColumns[] = {
    {"folder", "Folder", ReportValue::kPath},
    {"music", "Music", ReportValue::kBytes, "music"},
    {"videos", "Videos", ReportValue::kBytes, "videos"},
    {"photos", "Photos", ReportValue::kBytes, "photos"},
    {"files", "Files", ReportValue::kNumber},
};
// The folders right below those that were scanned; of what no scan has seen, the first two names of
// the path.
constexpr const char* kSelectFolders =
    ", placed AS (SELECT kind, filesize, "
    "coalesce(r.path || coalesce(substring(substr(media.path, length(r.path) + 1) "
    "FROM '^(/[^/]+)/'), ''), substring(media.path FROM '^(/[^/]+(?:/[^/]+)?)/'), '/') AS folder "
    "FROM media LEFT JOIN LATERAL (SELECT path FROM scan.root "
    "WHERE media.path ^@ (root.path || '/') ORDER BY length(path) LIMIT 1) AS r ON true), "
    "counted AS (SELECT folder, count(*) AS files, sum(filesize) AS bytes, "
    "sum(filesize) FILTER (WHERE kind = 'music') AS music, "
    "sum(filesize) FILTER (WHERE kind = 'videos') AS videos, "
    "sum(filesize) FILTER (WHERE kind = 'photos') AS photos FROM placed GROUP BY folder), "
    "ranked AS (SELECT *, least(row_number() OVER (ORDER BY bytes DESC NULLS LAST, folder), 13) "
    "AS place FROM counted) "
    "SELECT min(folder) AS folder, sum(music) AS music, sum(videos) AS videos, "
    "sum(photos) AS photos, sum(files) AS files, "
    "CASE WHEN count(*) > 1 THEN count(*) ELSE 0 END AS rest "
    "FROM ranked GROUP BY place ORDER BY place";

constexpr ReportColumn kAlbumColumns[] = {
    {"album", "Album", ReportValue::kText},
    {"tracks", "Tracks", ReportValue::kNumber},
    {"artists", "Artists", ReportValue::kNumber},
    {"example", "One of its files", ReportValue::kPath},
};
constexpr const char* kSelectAlbums =
    ", counted AS (SELECT b.album, count(DISTINCT t.id) AS tracks, "
    "count(DISTINCT nullif(a.artist, '')) AS artists, min(t.path) AS example "
    "FROM album_track AS b JOIN track AS t ON t.id = b.track "
    "LEFT JOIN artist_track AS a ON a.track = t.id "
    "WHERE b.album <> '' AND coalesce(b.album_artist, '') = '' GROUP BY b.album) "
    "SELECT *, count(*) OVER () AS total FROM counted ORDER BY tracks DESC, album LIMIT 50";

constexpr ReportColumn kFailureColumns[] = {
    {"path", "File", ReportValue::kPath},
    {"failure", "Why", ReportValue::kText},
};
constexpr const char* kSelectFailures =
    "SELECT f.path || '/' || x.name AS path, x.failure, count(*) OVER () AS total "
    "FROM scan.file AS x JOIN scan.folder AS f ON x.folder = f.id "
    "WHERE x.failure IS NOT NULL ORDER BY 1 LIMIT 100";

constexpr ReportColumn kOfflineColumns[] = {
    {"volume", "Volume", ReportValue::kText},   {"music", "Music", ReportValue::kNumber},
    {"videos", "Videos", ReportValue::kNumber}, {"photos", "Photos", ReportValue::kNumber},
    {"bytes", "Size", ReportValue::kBytes},     {"example", "One of its files", ReportValue::kPath},
};
constexpr const char* kSelectOffline =
    ", counted AS (SELECT coalesce(fs_uuid, '') AS volume, count(*) AS files, "
    "count(*) FILTER (WHERE kind = 'music') AS music, "
    "count(*) FILTER (WHERE kind = 'videos') AS videos, "
    "count(*) FILTER (WHERE kind = 'photos') AS photos, sum(filesize) AS bytes, "
    "min(path) AS example FROM media WHERE NOT online GROUP BY 1) "
    "SELECT *, count(*) OVER () AS total FROM counted ORDER BY files DESC, volume LIMIT 50";

constexpr ReportColumn kScanColumns[] = {
    {"path", "Folder", ReportValue::kPath},
    {"state", "State", ReportValue::kText},
    {"scanned", "Last scan (UTC)", ReportValue::kText},
    {"files", "Files", ReportValue::kNumber},
    {"failed", "Not read", ReportValue::kNumber},
};
// A folder that is no longer chosen has left nothing but its root.
constexpr const char* kSelectScans =
    "SELECT r.path, CASE WHEN r.away THEN 'away' ELSE 'online' END AS state, "
    "coalesce(to_char(r.scanned AT TIME ZONE 'UTC', 'YYYY-MM-DD HH24:MI'), 'never') AS scanned, "
    "count(*) FILTER (WHERE x.size <> -1 AND x.failure IS NULL) AS files, "
    "count(x.failure) AS failed, count(*) OVER () AS total "
    "FROM scan.root AS r JOIN scan.folder AS f ON f.path = r.path OR f.path ^@ (r.path || '/') "
    "LEFT JOIN scan.file AS x ON x.folder = f.id "
    "GROUP BY r.id ORDER BY r.path LIMIT 50";

constexpr ReportSection kSections[] = {
    {"kinds", "What is in it", "Files by kind.", "The index is empty.", ReportChart::kRing,
     kKindColumns, kSelectKinds},
    {"growth", "Growth", "Files by the day they came to their disk.", "No file has a date.",
     ReportChart::kGrowth, kGrowthColumns, kSelectGrowth},
    {"years", "By year", "Songs by the year of their release, photos by the year they were taken.",
     "Nothing has a year.", ReportChart::kColumns, kYearColumns, kSelectYears},
    {"genres", "Genres", "Tracks; one of several genres counts with each.", "Nothing has a genre.",
     ReportChart::kBars, kGenreColumns, kSelectGenres},
    {"formats", "Formats", "Files by the ending of their names.", "The index is empty.",
     ReportChart::kBars, kFormatColumns, kSelectFormats},
    {"folders", "Folders", "Where the space goes: the size of what is in the index.",
     "The index is empty.", ReportChart::kBars, kFolderColumns, kSelectFolders},
    {"albums", "Albums without an artist",
     "Albums of several artists that no tag holds together. \"mediidx explain ALBUM\" tells more.",
     "Every album has its artist.", ReportChart::kNone, kAlbumColumns, kSelectAlbums},
    {"failures", "Files that could not be read", "They are left alone until they change.",
     "Every file that was found could be read.", ReportChart::kNone, kFailureColumns,
     kSelectFailures},
    {"offline", "Offline", "Files whose volume is away. They keep their place in the index.",
     "Every volume is there.", ReportChart::kNone, kOfflineColumns, kSelectOffline},
    {"scans", "Scans", "The folders chosen for indexing.", "No folder has been scanned.",
     ReportChart::kNone, kScanColumns, kSelectScans},
};

ReportTotals read_totals(Database& database) {
  ReportTotals out;
  auto rows = database.query(std::string(kMedia) + kSelectTotals);
  rows.next();
  out.written = rows.text("written");
  for (const auto& total : kTotals) out.*total.value = rows.number(total.name);
  return out;
}

ReportTable read_table(Database& database, const ReportSection& section) {
  ReportTable out{&section, {}, 0};
  for (auto rows = database.query(std::string(kMedia) + section.query); rows.next();) {
    ReportRow row;
    for (const auto& column : section.columns) row.cells.push_back(rows.text(column.name));
    row.rest = rows.number("rest");
    out.total = rows.number("total");
    out.rows.push_back(std::move(row));
  }
  return out;
}

}  // namespace

std::span<const ReportSection> report_sections() { return kSections; }

Report read_report(Database& database) {
  database.run("BEGIN ISOLATION LEVEL REPEATABLE READ READ ONLY");
  Report out{read_totals(database), {}};
  for (const auto& section : kSections) out.tables.push_back(read_table(database, section));
  database.run("COMMIT");
  return out;
}

}  // namespace mediidx::tool
