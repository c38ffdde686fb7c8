// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Volumes that go away and come back, and what to do about those that do not.
#include <tavosdk.h>

#include <algorithm>
#include <array>

#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "mediidx/database.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "store/query.h"
#include "support/owned.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

using Text = const char*;

constexpr Template<Text, Text, Text> kCountBelow{
    "SELECT count(*) FILTER (WHERE fs_online) AS online, "
    "count(*) FILTER (WHERE NOT fs_online) AS offline "
    "FROM @TAVO:NEVAR "
    "WHERE path = '@TAVO:VAR' OR path LIKE '@TAVO:LVAR/%'"};
// The same rows as a purge takes.
constexpr Template<Text> kCountOffline{
    "SELECT count(*) AS number FROM @TAVO:NEVAR WHERE fs_online = false"};
constexpr Template<Text, Text> kCountOfflineOfShare{
    "SELECT count(*) AS number FROM @TAVO:NEVAR "
    "WHERE fs_online = false AND path LIKE '/volume%/@TAVO:LVAR/%'"};
constexpr Template<Text, Text> kFindShare{
    "SELECT 1 AS found FROM @TAVO:NEVAR WHERE path LIKE '/volume%/@TAVO:LVAR/%' LIMIT 1"};

/// A table whose rows have an online state.
struct StateTable {
  const char* table;
  const char* kind;
};
constexpr std::array kTables{
    StateTable{"music", "music"},       StateTable{"video", "videos"},
    StateTable{"photo", "photos"},      StateTable{"playlist", "playlists"},
    StateTable{"directory", "folders"},
};
using Counts = std::array<long, kTables.size()>;

long number_in(const Rows& rows, const char* column) {
  return static_cast<long>(number_of(rows.text(column)));
}

long sum(const Counts& counts) {
  long total = 0;
  for (const auto count : counts) total += count;
  return total;
}

void print(const Counts& counts, const char* title, Json::Value object, bool json) {
  std::vector<TableRow> lines;
  for (std::size_t i = 0; i < kTables.size(); ++i) {
    object[kTables[i].kind] = Json::Int64{counts[i]};
    lines.push_back({kTables[i].kind, std::to_string(counts[i])});
  }
  if (json) {
    put_json(object);
  } else {
    put_table({{"Kind"}, {title, true}}, lines);
  }
}

/// Rows of a path and of what is below it, in one state.
Counts count_below(Database& database, const std::string& path, bool online) {
  Counts counts{};
  for (std::size_t i = 0; i < kTables.size(); ++i) {
    auto rows = database.query(filled(kCountBelow, kTables[i].table, path.c_str(), path.c_str()));
    rows.next();
    counts[i] = number_in(rows, online ? "online" : "offline");
  }
  return counts;
}

int set_online(const Arguments& arguments, bool online) {
  const auto path = stored_path(arguments.operands[0]);
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  // The slash keeps /volume10 out of what begins with /volume1. The folder's own row has none.
  MediaInfoDBSetOnline((path + "/").c_str(), 1, online ? 1 : 0);
  if (!path.empty()) MediaInfoDBSetOnline(path.c_str(), 0, online ? 1 : 0);
  if (sum(count_below(database, path, !online)) > 0) {
    throw std::runtime_error("not every row could be changed; the system log says why");
  }
  const auto counts = count_below(database, path, online);
  const auto shown_path = path.empty() ? "/" : path;
  if (sum(counts) == 0) complain("the index holds nothing below " + escape_for_display(shown_path));
  Json::Value object;
  object["path"] = shown_path;
  print(counts, online ? "Online" : "Offline", object, arguments.has("--json"));
  return kExitDone;
}

Counts count_offline(Database& database, const std::string& share) {
  Counts counts{};
  for (std::size_t i = 0; i < kTables.size(); ++i) {
    auto rows = database.query(share.empty()
                                   ? filled(kCountOffline, kTables[i].table)
                                   : filled(kCountOfflineOfShare, kTables[i].table, share.c_str()));
    rows.next();
    counts[i] = number_in(rows, "number");
  }
  return counts;
}

void check_name(const std::string& share) {
  if (share.empty() || share == "." || share == ".." || share.find('/') != share.npos ||
      !is_utf8(share)) {
    throw UsageError("\"" + escape_for_display(share) + "\" is no name of a share");
  }
}

bool has_rows(Database& database, const std::string& share) {
  return std::ranges::any_of(kTables, [&](const StateTable& table) {
    return database.query(filled(kFindShare, table.table, share.c_str())).next();
  });
}

/// The folder of a share that is known by this very name; empty when there is none.
std::string folder_of(const std::string& name) {
  OwnedShare share;
  if (TAVOShareGet(name.c_str(), out(share)) != 0) return "";
  return share->path;
}

/// "/volume1/NAME" and the like.
bool lies_on_a_volume(const std::string& folder, const std::string& name) {
  constexpr std::string_view kVolume = "/volume";
  if (!folder.starts_with(kVolume) || !folder.ends_with("/" + name)) return false;
  const auto middle = folder.substr(0, folder.size() - name.size() - 1);
  return middle.find('/', 1) == middle.npos;
}

/// A purge finds a share by its name within paths: of any other it would take nothing, in silence.
void check_can_match(Database& database, const std::string& share) {
  if (has_rows(database, share)) return;
  const auto folder = folder_of(share);
  if (lies_on_a_volume(folder, share)) return;
  const auto name = escape_for_display(share);
  throw std::runtime_error(
      "no path of the index looks like /volumeN/" + name + "/..., so a purge of " + name +
      " cannot find anything" +
      (folder.empty() ? "" : " (it lies at " + escape_for_display(folder) + ")"));
}

}  // namespace

int run_volume_offline(const Arguments& arguments) { return set_online(arguments, false); }
int run_volume_online(const Arguments& arguments) { return set_online(arguments, true); }

int run_volume_purge(const Arguments& arguments) {
  const bool of_share = !arguments.operands.empty();
  const auto share = of_share ? arguments.operands[0] : std::string();
  if (of_share) check_name(share);
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  if (of_share) check_can_match(database, share);
  const auto counts = count_offline(database, share);
  const bool dry = arguments.has("--dry-run");
  if (!dry) {
    MediaInfoDBUUIDDropOffline(share.c_str());
    if (sum(count_offline(database, share)) > 0) {
      throw std::runtime_error("not every row could be deleted; the system log says why");
    }
  }
  Json::Value object;
  object["dry_run"] = dry;
  if (of_share) object["share"] = share;
  print(counts, dry ? "To be purged" : "Purged", object, arguments.has("--json"));
  return kExitDone;
}

}  // namespace mediidx::tool
