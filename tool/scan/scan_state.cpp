// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/scan_state.h"

#include <unistd.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <thread>
#include <utility>

#include "store/query.h"
#include "store/row_arrays.h"

namespace mediidx::tool {
namespace {

// A statement of this many rows is a few hundred kilobytes, as a rule.
constexpr std::size_t kRowsOfAStatement = 2000;

// Any number that nobody else takes.
constexpr std::int64_t kScanRight = 6334281;

std::string number(std::int64_t value) { return std::to_string(value); }
/// An enumerator as it stands in the database.
template <class Enum>
int code(Enum value) {
  return static_cast<int>(value);
}
/// "= 4", or "IN (4, 5)".
template <class... Enums>
std::string is_one_of(Enums... values) {
  std::string list;
  ((list += (list.empty() ? "" : ", ") + number(code(values))), ...);
  return sizeof...(values) == 1 ? "= " + list : "IN (" + list + ")";
}

/// "f" is this folder or lies below it.
std::string in_folder(const std::string& folder) {
  return "(f.path = " + literal(folder) + " OR f.path ^@ " + literal(folder + "/") + ")";
}

/// Calls `write` with so many items at a time.
template <class Item, class Write>
void in_portions(std::span<const Item> items, const Write& write) {
  while (!items.empty()) {
    const auto portion = items.first(std::min(items.size(), kRowsOfAStatement));
    write(portion);
    items = items.subspan(portion.size());
  }
}

constexpr const char* kChangeColumns =
    "SELECT id, what, root, folder, path, kind, known, size, modified, device, inode, source "
    "FROM scan.change ";

/// Every file that the library holds below a folder, with its kind, some of them twice.
std::string rows_of_library(const std::string& folder) {
  const auto below = " path ^@ " + literal(folder + "/");
  const std::string kind_of_list = "CASE WHEN path ILIKE '%.cue' THEN 4 ELSE 3 END";
  return "(SELECT path, 0 AS kind, userid <> 0 AS personal FROM track WHERE is_virtual = 'FALSE' "
         "AND" +
         below + " UNION ALL SELECT path, 0, false FROM music WHERE" + below +
         " UNION ALL SELECT path, 1, false FROM photo WHERE" + below +
         " UNION ALL SELECT path, 2, false FROM video WHERE" + below + " UNION ALL SELECT path, " +
         kind_of_list + ", false FROM playlist WHERE" + below + " UNION ALL SELECT path, " +
         kind_of_list + ", true FROM personal_playlist WHERE" + below + ")";
}

/// Those of them that are not known here. A set operation, because the server, which knows nothing
/// of how often joined paths occur, would join them row by row.
std::string unknown_paths(const std::string& folder) {
  return "(SELECT path FROM " + rows_of_library(folder) +
         " r EXCEPT SELECT f.path || '/' || x.name FROM scan.file x JOIN scan.folder f "
         "ON x.folder = f.id WHERE " +
         in_folder(folder) + ")";
}

/// Of the file "x" of the folder "f".
const std::string kTracksOfSheet =
    "(SELECT count(*) FROM virtual_info_track v WHERE v.cue_sheet_path = f.path || '/' || x.name)";

/// Changes by which rows go or are replaced.
const std::string kTouches = "what " + is_one_of(What::kChanged, What::kAgain, What::kGone,
                                                 What::kLeftOut, What::kGoneWith, What::kMovedAway);
/// Of these, the ones that take files away for good.
const std::string kRemovesFile = "what " + is_one_of(What::kGone, What::kLeftOut, What::kGoneWith);
const std::string kLosesFolder = "what " + is_one_of(What::kGoneFolder, What::kLeftOutFolder);
const std::string kIsAudio = "kind " + is_one_of(Kind::kMusic);
const std::string kIsSheet = "kind " + is_one_of(Kind::kCueSheet);

const std::string kTouchedAudio =
    "(SELECT path FROM scan.change WHERE " + kIsAudio + " AND " + kTouches + ")";
// Audio files that come, change or go, under each of their names.
const std::string kChangedAudio = "(SELECT path, folder FROM scan.change WHERE " + kIsAudio + ")";
const std::string kTouchedSheets =
    "(SELECT path FROM scan.change WHERE " + kIsSheet + " AND " + kTouches + ")";

}  // namespace

void ScanState::take_right(bool wait) {
  // A session that was cut, by a killed scan for one, gives it up in a moment.
  constexpr int kTries = 50;
  for (int i = 0; wait || i < kTries; ++i) {
    auto rows = database_.query("SELECT pg_try_advisory_lock(" + number(kScanRight) + ") AS taken");
    if (rows.next() && rows.flag("taken")) return;
    std::this_thread::sleep_for(std::chrono::milliseconds(100));
  }
  auto rows = database_.query(
      "SELECT a.application_name AS name FROM pg_locks l JOIN pg_stat_activity a ON a.pid = l.pid "
      "WHERE l.locktype = 'advisory' AND l.granted AND l.objid = " +
      number(kScanRight));
  throw AlreadyRunning("a scan is already running: " +
                       (rows.next() ? rows.text("name") : "in another session"));
}

void ScanState::count_tracks() {
  database_.run("UPDATE scan.file x SET tracks = " + kTracksOfSheet +
                " FROM scan.folder f WHERE x.folder = f.id AND x.kind = 4 AND x.tracks IS NULL "
                "AND x.size >= 0 AND x.failure IS NULL");
}

void ScanState::end() { database_.query("SELECT pg_advisory_unlock(" + number(kScanRight) + ")"); }

void ScanState::begin(bool wait) {
  std::array<char, 256> host{};
  gethostname(host.data(), host.size() - 1);
  database_.query("SELECT set_config('application_name', " +
                  literal("mediidx, process " + std::to_string(getpid()) + " on " + host.data()) +
                  ", false)");
  // First of all, so that what the server refuses is not taken for a lost connection.
  const auto now = std::chrono::steady_clock::now().time_since_epoch().count();
  token_ = std::to_string(getpid()) + "-" + std::to_string(now);
  database_.query("SELECT set_config('mediidx.scan', " + literal(token_) + ", false)");
  take_right(wait);
  database_.run("DELETE FROM scan.change");
}

bool ScanState::is_same_connection() {
  try {
    auto rows = database_.query("SELECT current_setting('mediidx.scan', true) AS token");
    return rows.next() && rows.text("token") == token_;
  } catch (const std::runtime_error&) {
    return false;
  }
}

KnownRoot ScanState::root(const std::string& path) {
  for (int attempt = 0; attempt < 2; ++attempt) {
    auto rows =
        database_.query("SELECT id, volume, away FROM scan.root WHERE path = " + literal(path) +
                        " ORDER BY id LIMIT 1");
    if (rows.next()) {
      return {static_cast<int>(rows.number("id")), rows.text("volume"), rows.flag("away")};
    }
    database_.run("INSERT INTO scan.root(path, volume) VALUES(" + literal(path) + ", '')");
  }
  throw std::runtime_error("a folder could not be noted: " + path);
}

void ScanState::set_root(int id, const std::string& volume, bool away) {
  database_.run("UPDATE scan.root SET volume = " + literal(volume) + ", away = " +
                (away ? "true" : "false") + ", scanned = now() WHERE id = " + number(id));
}

std::int64_t ScanState::count_files(const std::string& folder) {
  auto rows = database_.query(
      "SELECT count(*) AS files FROM scan.file x JOIN scan.folder f ON x.folder = f.id "
      "WHERE x.size <> -1 AND x.failure IS NULL AND " +
      in_folder(folder));
  return rows.next() ? rows.number("files") : 0;
}

ScanState::Holding ScanState::holding(const std::string& folder) {
  Holding out;
  auto files = database_.query(
      "SELECT x.kind, x.failure IS NULL AS is_held, count(*) AS files FROM scan.file x "
      "JOIN scan.folder f ON x.folder = f.id WHERE x.size <> -1 AND " +
      in_folder(folder) + " GROUP BY 1, 2");
  while (files.next()) {
    const auto count = files.number("files");
    if (files.flag("is_held")) {
      out.files.at(static_cast<std::size_t>(files.number("kind"))) = count;
    } else {
      out.left_alone += count;
    }
  }
  auto folders = database_.query("SELECT count(f.modified) AS folders FROM scan.folder f WHERE " +
                                 in_folder(folder));
  if (folders.next()) out.folders = folders.number("folders");
  return out;
}

bool ScanState::holds_anything(const std::string& folder) {
  const auto below = literal(folder + "/");
  auto folders =
      database_.query("SELECT 1 AS one FROM scan.folder WHERE path ^@ " + below + " LIMIT 1");
  return folders.next() || count_files(folder) > 0;
}

void ScanState::reconcile(const std::string& folder) {
  mark_poorer_sheets(folder);
  if (agrees(folder)) return;
  mark_lost(folder);
  take_up(folder);
}

/// Whether the library holds just what is known. Each table is compared by the number of its paths
/// and the sum of their hashes: to join them takes many times longer, and as a rule finds nothing.
bool ScanState::agrees(const std::string& folder) {
  struct Table {
    const char* name;
    const char* known;  ///< Which of the files or folders.
    const char* rows = "true";
  };
  constexpr Table kTables[] = {
      {"track", "kind = 0", "is_virtual = 'FALSE'"},
      {"music", "kind = 0 AND NOT personal"},
      {"photo", "kind = 1"},
      {"video", "kind = 2"},
      {"playlist", "kind IN (3, 4) AND NOT personal"},
      {"personal_playlist", "kind IN (3, 4) AND personal"},
      {"directory", "kind IS NULL AND NOT personal"},
      {"personal_directory", "kind IS NULL AND personal"},
  };
  const auto sum = [](const std::string& hash, const std::string& filter) {
    return "concat(count(*)" + filter + ", ' ', bit_xor(" + hash + ")" + filter + ")";
  };
  std::string known;
  std::string held;
  for (const auto& [name, is_known, rows] : kTables) {
    known +=
        (known.empty() ? "" : ", ") + sum("hash", std::string(" FILTER (WHERE ") + is_known + ")");
    held += (held.empty() ? "" : ", ") + std::string("(SELECT ") +
            sum("hashtextextended(path, 0)", "") + " FROM " + name + " f WHERE " + rows + " AND " +
            in_folder(folder) + ")";
  }
  // Of a sheet that failed, the row stays; of a file that is to be read again, whatever there is.
  auto answer = database_.query(
      "SELECT (SELECT ROW(" + known +
      ") FROM (SELECT x.kind, f.personal, hashtextextended(f.path || '/' || x.name, 0) AS hash "
      "FROM scan.file x JOIN scan.folder f ON x.folder = f.id WHERE x.size >= 0 AND "
      "(x.failure IS NULL OR x.kind = 4) AND " +
      in_folder(folder) +
      " UNION ALL SELECT NULL, f.personal, hashtextextended(f.path, 0) FROM scan.folder f "
      "WHERE f.modified IS NOT NULL AND " +
      in_folder(folder) + ") known) = ROW(" + held + ") AS agrees");
  return answer.next() && answer.flag("agrees");
}

/// A sheet whose tracks are gone has its row still.
void ScanState::mark_poorer_sheets(const std::string& folder) {
  database_.run("UPDATE scan.file x SET size = -2 FROM scan.folder f WHERE x.folder = f.id AND " +
                in_folder(folder) +
                " AND x.kind = 4 AND x.size >= 0 AND x.failure IS NULL AND x.tracks > " +
                kTracksOfSheet);
}

void ScanState::mark_lost(const std::string& folder) {
  struct Held {
    const char* files;  ///< Or folders, of one table.
    const char* table;
  };
  constexpr Held kHeld[] = {
      {"x.kind = 0", "track h WHERE h.is_virtual = 'FALSE' AND"},
      {"x.kind = 0 AND NOT f.personal", "music h WHERE"},
      {"x.kind = 1", "photo h WHERE"},
      {"x.kind = 2", "video h WHERE"},
      {"x.kind IN (3, 4) AND NOT f.personal", "playlist h WHERE"},
      {"x.kind IN (3, 4) AND f.personal", "personal_playlist h WHERE"},
  };
  for (const auto& held : kHeld) {
    database_.run("UPDATE scan.file x SET size = -1 FROM scan.folder f WHERE x.folder = f.id AND " +
                  in_folder(folder) + " AND x.size >= 0 AND x.failure IS NULL AND " + held.files +
                  " AND NOT EXISTS (SELECT 1 FROM " + held.table +
                  " h.path = f.path || '/' || x.name)");
  }
  constexpr Held kFolders[] = {
      {"NOT f.personal", "directory h WHERE"},
      {"f.personal", "personal_directory h WHERE"},
  };
  for (const auto& held : kFolders) {
    database_.run("UPDATE scan.folder f SET modified = NULL WHERE " + in_folder(folder) +
                  " AND f.modified IS NOT NULL AND " + held.files +
                  " AND NOT EXISTS (SELECT 1 FROM " + held.table + " h.path = f.path)");
  }
}

void ScanState::take_up(const std::string& folder) {
  const auto unknown = unknown_paths(folder);
  int taken = 0;
  if (database_.query("SELECT 1 AS one FROM " + unknown + " u LIMIT 1").next()) {
    // A song has a row in two tables: of a personal one, its own.
    const auto rows =
        "(SELECT path, min(kind) AS kind, bool_or(personal) AS personal, "
        "regexp_replace(path, '/[^/]*$', '') AS parent FROM " +
        rows_of_library(folder) + " r WHERE path IN (SELECT path FROM " + unknown +
        " u) GROUP BY path)";
    taken = database_.run(
        "INSERT INTO scan.folder(path, parent, personal) SELECT n.parent, "
        "regexp_replace(n.parent, '/[^/]*$', ''), bool_or(n.personal) FROM " +
        rows +
        " n WHERE NOT EXISTS (SELECT 1 FROM scan.folder f WHERE f.path = n.parent) "
        "GROUP BY n.parent");
    database_.run(
        "INSERT INTO scan.file(folder, name, kind, size, modified, device, inode) "
        "SELECT at.id, regexp_replace(n.path, '^.*/', ''), n.kind, -2, 0, 0, 0 FROM " +
        rows +
        " n JOIN scan.folder at ON at.path = n.parent "
        "WHERE octet_length(n.path) - octet_length(n.parent) <= 256 ON CONFLICT DO NOTHING");
  }
  for (const char* table : {"directory", "personal_directory"}) {
    taken += database_.run(
        "INSERT INTO scan.folder(path, parent, personal, modified) SELECT DISTINCT d.path, "
        "regexp_replace(d.path, '/[^/]*$', ''), " +
        std::string(table[0] == 'p' ? "true" : "false") + ", 0 FROM " + table +
        " d WHERE (d.path = " + literal(folder) + " OR d.path ^@ " + literal(folder + "/") +
        ") AND NOT EXISTS (SELECT 1 FROM scan.folder f WHERE f.path = d.path)");
  }
  // A folder that is gone is missed in its parent, which therefore has to be known.
  while (taken > 0) {
    taken = database_.run(
        "INSERT INTO scan.folder(path, parent, personal) SELECT DISTINCT f.parent, "
        "regexp_replace(f.parent, '/[^/]*$', ''), f.personal FROM scan.folder f WHERE f.parent ^@ " +
        literal(folder + "/") +
        " AND NOT EXISTS (SELECT 1 FROM scan.folder g WHERE g.path = f.parent)");
  }
}

std::map<std::string, KnownFolder> ScanState::look_up(std::span<const ListedFolder> folders) {
  std::map<std::string, KnownFolder> out;
  in_portions(folders, [&](std::span<const ListedFolder> portion) {
    RowArrays paths{"text"};
    for (const auto& folder : portion) paths.add(folder.found.path);
    const auto given = paths.unnest() + " v(path) JOIN scan.folder f ON ";
    auto rows = database_.query("SELECT f.path, f.id, f.mounted, f.away, f.modified FROM " + given +
                                "f.path = v.path");
    while (rows.next()) {
      auto& known = out[rows.text("path")];
      known.id = static_cast<int>(rows.number("id"));
      known.mounted = rows.flag("mounted");
      known.away = rows.flag("away");
      if (!rows.is_null("modified")) known.modified = rows.number("modified");
    }
    auto below = database_.query("SELECT f.path, f.parent FROM " + given + "f.parent = v.path");
    while (below.next()) out[below.text("parent")].subfolders.push_back(below.text("path"));
  });
  add_unknown(folders, out);
  std::map<int, KnownFolder*> by_id;
  std::vector<int> ids;
  for (auto& [path, known] : out) {
    by_id[known.id] = &known;
    ids.push_back(known.id);
  }
  in_portions(std::span<const int>(ids), [&](std::span<const int> portion) {
    RowArrays given{"integer"};
    for (const int id : portion) given.add(id);
    auto rows = database_.query(
        "SELECT x.folder, x.name, x.kind, x.size, x.modified, x.failure IS NOT NULL AS failed FROM " +
        given.unnest() + " v(id) JOIN scan.file x ON x.folder = v.id");
    while (rows.next()) {
      by_id.at(static_cast<int>(rows.number("folder")))
          ->files.push_back({rows.text("name"), static_cast<Kind>(rows.number("kind")),
                             rows.number("size"), rows.number("modified"), rows.flag("failed")});
    }
  });
  return out;
}

void ScanState::add_unknown(std::span<const ListedFolder> folders,
                            std::map<std::string, KnownFolder>& out) {
  std::vector<const ListedFolder*> unknown;
  for (const auto& folder : folders) {
    const auto known = out.find(folder.found.path);
    if (known == out.end() || known->second.id == 0) unknown.push_back(&folder);
  }
  in_portions(std::span<const ListedFolder* const>(unknown), [&](auto portion) {
    RowArrays given{"text", "text", "boolean"};
    for (const auto* folder : portion) {
      const auto& path = folder->found.path;
      given.add(path, path.substr(0, path.rfind('/')), folder->coverage.personal);
    }
    auto rows = database_.query("INSERT INTO scan.folder(path, parent, personal) SELECT * FROM " +
                                given.unnest() + " RETURNING id, path");
    while (rows.next()) out[rows.text("path")].id = static_cast<int>(rows.number("id"));
  });
}

void ScanState::set_folder(int id, bool mounted, bool away, std::optional<std::int64_t> modified) {
  database_.run("UPDATE scan.folder SET mounted = " + std::string(mounted ? "true" : "false") +
                ", away = " + (away ? "true" : "false") + ", modified = " +
                (modified ? number(*modified) : "NULL") + " WHERE id = " + number(id));
}

// -- The plan ------------------------------------------------------------------------------------

namespace {

Step step_of(const Change& change) {
  switch (change.what) {
    case What::kGone:
    case What::kLeftOut:
    case What::kGoneWith:
    case What::kGoneFolder:
    case What::kLeftOutFolder:
    case What::kMovedAway:
      return Step::kRemovals;
    case What::kNew:
    case What::kChanged:
    case What::kAgain:
    case What::kMoved:
      break;
  }
  if (change.is_folder) return Step::kFolders;
  if (change.kind == Kind::kCueSheet) return Step::kCueSheets;
  return change.kind == Kind::kPlaylist ? Step::kPlaylists : Step::kMedia;
}

}  // namespace

void ScanState::add(std::span<const Change> changes) {
  in_portions(changes, [&](std::span<const Change> portion) {
    RowArrays rows{"smallint", "smallint", "integer", "integer", "text",  "smallint",
                   "bigint",   "bigint",   "bigint",  "bigint",  "bigint"};
    for (const auto& change : portion) {
      const auto& status = change.status;
      rows.add(code(step_of(change)), code(change.what), change.root,
               change.folder != 0 ? std::optional(change.folder) : std::nullopt, change.path,
               change.is_folder ? std::nullopt : std::optional(code(change.kind)), change.known,
               status.size, status.modified, status.device, status.inode);
    }
    database_.run(
        "INSERT INTO scan.change(step, what, root, folder, path, kind, known, size, modified, "
        "device, inode) SELECT * FROM " +
        rows.unnest());
  });
}

void ScanState::add_files_of_lost_folders() {
  database_.run(
      "INSERT INTO scan.change(step, what, root, folder, path, kind, known, size, modified, device, "
      "inode) SELECT " +
      number(code(Step::kRemovals)) + ", " + number(code(What::kGoneWith)) +
      ", c.root, f.id, f.path || '/' || x.name, x.kind, "
      "CASE WHEN x.failure IS NULL THEN x.size ELSE -1 END, x.size, x.modified, x.device, x.inode "
      "FROM scan.change c JOIN scan.folder f ON f.path = c.path OR f.path ^@ (c.path || '/') "
      "JOIN scan.file x ON x.folder = f.id WHERE c." +
      kLosesFolder);
}

void ScanState::find_moves() {
  // Of several that went, or came, with one inode and size each is paired once.
  database_.run(
      "WITH pairs AS (SELECT went.id AS went, went.path, came.id AS came, "
      "row_number() OVER (PARTITION BY went.id ORDER BY came.id) AS first_came, "
      "row_number() OVER (PARTITION BY came.id ORDER BY went.id) AS first_went "
      "FROM scan.change went JOIN scan.file x ON x.folder = went.folder "
      "AND x.name = regexp_replace(went.path, '^.*/', '') JOIN scan.change came "
      "ON came.device = x.device AND came.inode = x.inode AND came.size = x.size "
      "AND came.kind = x.kind WHERE went.what " +
      is_one_of(What::kGone, What::kGoneWith) + " AND came.what " + is_one_of(What::kNew) +
      " AND x.size >= 0 AND x.failure IS NULL), "
      "chosen AS (SELECT * FROM pairs WHERE first_came = 1 AND first_went = 1), "
      "marked AS (UPDATE scan.change c SET what = " +
      number(code(What::kMovedAway)) +
      " FROM chosen p WHERE c.id = p.went) UPDATE scan.change c SET what = " +
      number(code(What::kMoved)) + ", source = p.path FROM chosen p WHERE c.id = p.came");
}

ScanState::Removal ScanState::removal_of(int root, const std::string& path) {
  auto rows = database_.query("SELECT count(*) AS removed FROM scan.change WHERE " + kRemovesFile +
                              " AND known <> -1 AND kind IS NOT NULL AND root = " + number(root));
  const auto removed = rows.next() ? rows.number("removed") : 0;
  return {removed, removed > 0 ? count_files(path) : 0};
}

void ScanState::withdraw_removals(int root) {
  database_.run("DELETE FROM scan.change WHERE (" + kRemovesFile + " OR " + kLosesFolder +
                ") AND root = " + number(root));
}

void ScanState::withdraw(int root) {
  database_.run("DELETE FROM scan.change WHERE root = " + number(root));
}

void ScanState::find_consequences() {
  database_.run(
      "INSERT INTO scan.change(step, what, root, folder, path, kind, known, size, modified, device, "
      "inode) SELECT " +
      number(code(Step::kCueSheets)) + ", " + number(code(What::kAgain)) +
      ", 0, f.id, f.path || '/' || x.name, x.kind, x.size, x.size, x.modified, "
      "x.device, x.inode FROM (SELECT v.cue_sheet_path AS path FROM " +
      kChangedAudio +
      " a JOIN track t ON t.path = a.path AND t.is_virtual = 'TRUE' "
      "JOIN virtual_info_track v ON v.track = t.id "
      "UNION SELECT f.path || '/' || x.name FROM " +
      kChangedAudio +
      " a JOIN scan.folder f ON f.id = a.folder JOIN scan.file x ON x.folder = f.id WHERE x." +
      kIsSheet +
      " AND x.failure IS NULL) s "
      "JOIN scan.folder f ON f.path = regexp_replace(s.path, '/[^/]*$', '') "
      "JOIN scan.file x ON x.folder = f.id AND x.name = regexp_replace(s.path, '^.*/', '') "
      "WHERE x." +
      kIsSheet + " AND NOT EXISTS (SELECT 1 FROM scan.change c WHERE c.path = s.path)");
  database_.run("UPDATE scan.file x SET size = -2 FROM scan.change c WHERE c.what " +
                is_one_of(What::kAgain) +
                " AND c.folder = x.folder AND x.name = regexp_replace(c.path, '^.*/', '')");
  database_.run(
      "INSERT INTO scan.unsettled(what, name) "
      "SELECT 0, a.album FROM " +
      kTouchedAudio +
      " c JOIN track t ON t.path = c.path "
      "AND t.is_virtual = 'FALSE' JOIN album_track a ON a.track = t.id WHERE a.album IS NOT NULL "
      "UNION SELECT 0, a.album FROM " +
      kTouchedSheets +
      " c JOIN virtual_info_track v ON v.cue_sheet_path = c.path JOIN album_track a "
      "ON a.track = v.track WHERE a.album IS NOT NULL "
      "UNION SELECT 1, t.path FROM " +
      kTouchedSheets +
      " c JOIN virtual_info_track v ON v.cue_sheet_path = c.path JOIN track t ON t.id = v.track");
}

std::int64_t ScanState::count_changes() {
  auto rows = database_.query("SELECT count(*) AS changes FROM scan.change");
  return rows.next() ? rows.number("changes") : 0;
}

std::vector<Change> ScanState::changes(const std::string& condition, int limit) {
  if (!is_same_connection()) throw DatabaseLost("the connection to the database was lost");
  std::vector<Change> out;
  auto rows = database_.query(kChangeColumns + condition + " ORDER BY id LIMIT " + number(limit));
  while (rows.next()) {
    Change change;
    change.id = rows.number("id");
    change.what = static_cast<What>(rows.number("what"));
    change.root = static_cast<int>(rows.number("root"));
    change.folder = static_cast<int>(rows.number("folder"));
    change.path = rows.text("path");
    change.is_folder = rows.is_null("kind");
    change.kind = static_cast<Kind>(rows.number("kind"));
    change.known = rows.number("known");
    change.status.size = rows.number("size");
    change.status.modified = rows.number("modified");
    change.status.device = rows.number("device");
    change.status.inode = rows.number("inode");
    change.source = rows.text("source");
    out.push_back(std::move(change));
  }
  return out;
}

std::vector<Change> ScanState::next(Step step, std::int64_t after, int limit) {
  return changes("WHERE step = " + number(code(step)) + " AND id > " + number(after), limit);
}

std::vector<Change> ScanState::moves(std::int64_t after, int limit) {
  return changes("WHERE what " + is_one_of(What::kMoved) + " AND id > " + number(after), limit);
}

// -- What was done -------------------------------------------------------------------------------

void ScanState::save(std::span<const FileState> files) {
  in_portions(files, [&](std::span<const FileState> portion) {
    RowArrays rows{"integer", "text", "smallint", "bigint", "bigint", "bigint", "bigint", "text"};
    for (const auto& [folder, name, kind, status, failure] : portion) {
      rows.add(folder, name, code(kind), status.size, status.modified, status.device, status.inode,
               failure.empty() ? std::nullopt : std::optional(failure));
    }
    database_.run(
        "INSERT INTO scan.file(folder, name, kind, size, modified, device, inode, failure) "
        "SELECT * FROM " +
        rows.unnest() +
        " ON CONFLICT (folder, name) DO UPDATE SET kind = excluded.kind, size = excluded.size, "
        "modified = excluded.modified, device = excluded.device, inode = excluded.inode, "
        "failure = excluded.failure, tracks = NULL");
  });
}

void ScanState::save_folders(std::span<const FolderState> folders) {
  in_portions(folders, [&](std::span<const FolderState> portion) {
    RowArrays rows{"integer", "bigint"};
    for (const auto& [id, modified] : portion) rows.add(id, modified);
    database_.run("UPDATE scan.folder SET modified = v.modified FROM " + rows.unnest() +
                  " v(id, modified) WHERE folder.id = v.id");
  });
}

void ScanState::forget_file(int folder, const std::string& name) {
  database_.run("DELETE FROM scan.file WHERE folder = " + number(folder) +
                " AND name = " + literal(name));
}

void ScanState::forget_path(const std::string& path) {
  const auto slash = path.rfind('/');
  database_.run("DELETE FROM scan.file x USING scan.folder f WHERE x.folder = f.id AND f.path = " +
                literal(path.substr(0, slash)) +
                " AND x.name = " + literal(path.substr(slash + 1)));
}

void ScanState::forget_folder(const std::string& path) {
  database_.run("DELETE FROM scan.folder f WHERE " + in_folder(path));
}

void ScanState::mark_unsure(int folder, const std::string& name) {
  database_.run("UPDATE scan.file SET size = -2, failure = NULL WHERE folder = " + number(folder) +
                " AND name = " + literal(name));
}

// -- Settling ------------------------------------------------------------------------------------

void ScanState::unsettle_below(const std::string& folder) {
  const auto below = " ^@ " + literal(folder + "/");
  // The tracks that sheets elsewhere cut out of its files go too.
  database_.run(
      "UPDATE scan.file x SET size = -2 FROM scan.folder f WHERE x.folder = f.id AND x.kind = 4 "
      "AND x.failure IS NULL AND f.path || '/' || x.name IN (SELECT v.cue_sheet_path "
      "FROM virtual_info_track v JOIN track t ON t.id = v.track WHERE t.path" +
      below + ")");
  database_.run(
      "INSERT INTO scan.unsettled(what, name) "
      "SELECT 0, a.album FROM track t JOIN album_track a ON a.track = t.id "
      "WHERE a.album IS NOT NULL AND t.path" +
      below +
      " UNION SELECT 0, a.album FROM virtual_info_track v JOIN album_track a ON a.track = v.track "
      "WHERE a.album IS NOT NULL AND v.cue_sheet_path" +
      below +
      " UNION SELECT 1, t.path FROM virtual_info_track v JOIN track t ON t.id = v.track "
      "WHERE v.cue_sheet_path" +
      below);
}

bool ScanState::has_unsettled() {
  return database_.query("SELECT 1 AS one FROM scan.unsettled LIMIT 1").next();
}

std::vector<std::string> ScanState::unsettled_albums() {
  // What a scan of an empty index leaves: a tagged album artist stays; without one the tracks share
  // their only artist, or, where they have several, none.
  auto rows = database_.query(
      "SELECT album FROM (SELECT a.album, r.artist, r.has_album_artist, a.album_artist, "
      "a.from_album_artist, min(r.artist) FILTER (WHERE r.has_album_artist = 'FALSE') "
      "OVER (PARTITION BY a.album) IS DISTINCT FROM max(r.artist) "
      "FILTER (WHERE r.has_album_artist = 'FALSE') OVER (PARTITION BY a.album) AS many "
      "FROM album_track a JOIN artist_track r ON r.track = a.track "
      "WHERE a.album IN (SELECT name FROM scan.unsettled WHERE what = 0)) s "
      "WHERE CASE WHEN has_album_artist = 'TRUE' THEN from_album_artist = 'FALSE' "
      "OR album_artist = '' WHEN many THEN from_album_artist = 'FALSE' OR album_artist <> '' "
      "ELSE from_album_artist = 'TRUE' OR album_artist <> artist END GROUP BY album ORDER BY album");
  std::vector<std::string> out;
  while (rows.next()) out.push_back(rows.text("album"));
  return out;
}

namespace {

/// Files in the index, by their paths, as changes to be made again.
std::string plan_again(const std::string& paths) {
  return "INSERT INTO scan.change(step, what, root, folder, path, kind, known, size, modified, "
         "device, inode) SELECT CASE WHEN x." +
         kIsSheet + " THEN " + number(code(Step::kCueSheets)) + " ELSE " +
         number(code(Step::kMedia)) + " END, " + number(code(What::kAgain)) +
         ", 0, f.id, p.path, x.kind, "
         "x.size, x.size, x.modified, x.device, x.inode FROM (" +
         paths +
         ") p "
         "JOIN scan.folder f ON f.path = regexp_replace(p.path, '/[^/]*$', '') "
         "JOIN scan.file x ON x.folder = f.id AND x.name = regexp_replace(p.path, '^.*/', '') "
         "WHERE x.failure IS NULL ORDER BY p.path";
}

}  // namespace

void ScanState::plan_unmarked_audio() {
  database_.run("DELETE FROM scan.change");
  database_.run(plan_again(
      "SELECT t.path FROM track t WHERE t.path IN (SELECT name FROM scan.unsettled WHERE what = 1) "
      "AND t.is_virtual = 'FALSE' AND t.has_virtual = 'TRUE' AND NOT EXISTS (SELECT 1 FROM track v "
      "WHERE v.path = t.path AND v.is_virtual = 'TRUE')"));
  find_consequences();
}

void ScanState::plan_albums(std::span<const std::string> albums) {
  database_.run("DELETE FROM scan.change");
  std::string list;
  for (const auto& album : albums) list += (list.empty() ? "" : ", ") + literal(album);
  database_.run(
      plan_again("SELECT DISTINCT coalesce(v.cue_sheet_path, t.path) AS path FROM album_track a "
                 "JOIN track t ON t.id = a.track LEFT JOIN virtual_info_track v ON v.track = t.id "
                 "WHERE a.album IN (" +
                 list + ")"));
  find_consequences();
}

void ScanState::settled() { database_.run("DELETE FROM scan.unsettled"); }

}  // namespace mediidx::tool
