// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// How much of everything is in the index.
#include <cmath>

#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "store/data_folder.h"
#include "store/database.h"

namespace mediidx::tool {
namespace {

// Rows of the users' own libraries carry a user id; they have no online state.
constexpr const char* kSelectKinds =
    "SELECT 'music' AS kind, 0 AS userid, count(*) AS number, sum(duration) AS duration, "
    "sum(filesize) AS bytes, count(*) FILTER (WHERE NOT fs_online) AS offline FROM music "
    "UNION ALL "
    "SELECT 'virtual_tracks', 0, count(*), sum(duration), 0, 0 FROM virtual_music "
    "UNION ALL "
    "SELECT 'videos', 0, count(*), sum(duration), sum(filesize), "
    "count(*) FILTER (WHERE NOT fs_online) FROM video "
    "UNION ALL "
    "SELECT 'photos', 0, count(*), 0, sum(filesize), "
    "count(*) FILTER (WHERE NOT fs_online) FROM photo "
    "UNION ALL "
    "SELECT 'playlists', 0, count(*), 0, sum(filesize), "
    "count(*) FILTER (WHERE NOT fs_online) FROM playlist "
    "UNION ALL "
    "SELECT 'folders', 0, count(*), 0, 0, "
    "count(*) FILTER (WHERE NOT fs_online) FROM directory "
    "UNION ALL "
    "(SELECT 'music', userid, count(*), sum(duration::double precision), sum(filesize), 0 "
    "FROM track WHERE userid <> 0 AND is_virtual = 'FALSE' GROUP BY userid ORDER BY userid) "
    "UNION ALL "
    "(SELECT 'virtual_tracks', userid, count(*), sum(duration::double precision), 0, 0 "
    "FROM track WHERE userid <> 0 AND is_virtual = 'TRUE' GROUP BY userid ORDER BY userid) "
    "UNION ALL "
    "(SELECT 'playlists', userid, count(*), 0, sum(filesize), 0 "
    "FROM personal_playlist GROUP BY userid ORDER BY userid) "
    "UNION ALL "
    "(SELECT 'folders', userid, count(*), 0, 0, 0 "
    "FROM personal_directory GROUP BY userid ORDER BY userid)";

// As "list" counts them.
constexpr const char* kSelectNames =
    "SELECT "
    "(SELECT count(*) FROM (SELECT DISTINCT album, album_artist FROM album_track "
    "WHERE album <> '') AS a) AS albums, "
    "(SELECT count(DISTINCT artist) FROM artist_track WHERE artist <> '') AS artists, "
    "(SELECT count(DISTINCT genre) FROM genre_track WHERE genre <> '') AS genres, "
    "(SELECT count(*) FROM video_convert) AS converted_videos";

constexpr RowColumn kNumbers[] = {
    {"number", "Number", ValueType::kNumber},
    {"duration", "Time", ValueType::kSeconds},
    {"bytes", "Bytes", ValueType::kNumber},
    {"offline", "Offline", ValueType::kNumber},
};
constexpr RowColumn kNames[] = {
    {"albums", "albums", ValueType::kNumber},
    {"artists", "artists", ValueType::kNumber},
    {"genres", "genres", ValueType::kNumber},
    {"converted_videos", "converted videos", ValueType::kNumber},
};

/// {"kinds": {kind: numbers}, "total": numbers, "personal": {userid: {kind: numbers}}, names}
Json::Value count_everything(Database& database) {
  Json::Value out;
  out["personal"] = Json::Value(Json::objectValue);
  auto& total = out["total"];
  double duration = 0;
  for (auto rows = database.query(kSelectKinds); rows.next();) {
    const auto userid = rows.text("userid");
    const auto numbers = json_object(rows, kNumbers);
    auto& place = userid == "0" ? out["kinds"] : out["personal"][userid];
    place[rows.text("kind")] = numbers;
    // A virtual track is a part of a file that was counted.
    if (rows.text("kind") == "virtual_tracks") continue;
    duration += numbers["duration"].asDouble();
    for (const char* name : {"number", "bytes", "offline"}) {
      total[name] = total[name].asInt64() + numbers[name].asInt64();
    }
  }
  total["duration"] = duration;
  auto names = database.query(kSelectNames);
  names.next();
  for (const auto& name : kNames) {
    out[name.name] = Json::Int64{std::llround(number_of(names.text(name.name)))};
  }
  return out;
}

TableRow line_of(const std::string& name, const Json::Value& numbers) {
  const auto seconds = numbers["duration"].asDouble();
  const auto or_empty = [](const Json::Value& number) {
    return number.asInt64() == 0 ? std::string() : number.asString();
  };
  return {name, numbers["number"].asString(), seconds > 0 ? clock_text(seconds) : "",
          or_empty(numbers["bytes"]), or_empty(numbers["offline"])};
}

std::string with_spaces(std::string name) {
  if (const auto at = name.find('_'); at != name.npos) name[at] = ' ';
  return name;
}

void print(const Json::Value& counted) {
  std::vector<TableRow> lines;
  for (const char* kind : {"music", "virtual_tracks", "videos", "photos", "playlists", "folders"}) {
    lines.push_back(line_of(with_spaces(kind), counted["kinds"][kind]));
  }
  const auto& personal = counted["personal"];
  for (const auto& userid : personal.getMemberNames()) {
    for (const auto& kind : personal[userid].getMemberNames()) {
      lines.push_back(line_of(with_spaces(kind) + " of user " + userid, personal[userid][kind]));
    }
  }
  lines.push_back(line_of("total", counted["total"]));
  for (const auto& name : kNames) {
    lines.push_back({name.title, counted[name.name].asString(), "", "", ""});
  }
  put_table({{"Kind"}, {"Number", true}, {"Time", true}, {"Bytes", true}, {"Offline", true}},
            lines);
}

}  // namespace

int run_stats(const Arguments& arguments) {
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  const auto counted = count_everything(database);
  if (arguments.has("--json")) {
    put_json(counted);
  } else {
    print(counted);
  }
  return kExitDone;
}

}  // namespace mediidx::tool
