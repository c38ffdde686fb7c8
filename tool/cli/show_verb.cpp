// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// All that the index holds of one path.
#include <json/reader.h>

#include <filesystem>
#include <sstream>

#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "store/query.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

using Text = const char*;

// One row of the result a column: whatever columns the table has, in their order.
constexpr Template<Text, Text, Text> kSelectRows{
    "SELECT found.id, field.key, field.value "
    "FROM @TAVO:NEVAR AS found, "
    "json_each(row_to_json(found)) WITH ORDINALITY AS field(key, value, position) "
    "WHERE found.@TAVO:NEVAR = '@TAVO:VAR' "
    "ORDER BY found.id, field.position"};

// The tracks of an audio file, those that cue sheets cut out of it too; the tracks of a cue sheet.
constexpr Template<Text, Text> kSelectTracks{
    "SELECT found.id, field.key, field.value "
    "FROM ("
    "SELECT t.*, "
    "(SELECT json_agg(g.genre ORDER BY g.genre_sort, g.genre) "
    "FROM genre_track g WHERE g.track = t.id) AS genres, "
    "c.composer, a.artist, b.album, b.album_artist, b.from_album_artist, "
    "v.cue_sheet_path, v.audio_offset, "
    "r.rg_track_gain, r.rg_track_peak, r.rg_album_gain, r.rg_album_peak, "
    "(SELECT json_agg(json_build_object('userid', s.userid, 'star', s.star) ORDER BY s.userid) "
    "FROM rating_track s WHERE s.track = t.id) AS ratings "
    "FROM track t "
    "LEFT JOIN composer_track c ON c.track = t.id "
    "LEFT JOIN artist_track a ON a.track = t.id "
    "LEFT JOIN album_track b ON b.track = t.id "
    "LEFT JOIN virtual_info_track v ON v.track = t.id "
    "LEFT JOIN replaygain_track r ON r.track = t.id "
    "WHERE t.id IN (SELECT id FROM track WHERE path = '@TAVO:VAR' "
    "UNION SELECT track FROM virtual_info_track WHERE cue_sheet_path = '@TAVO:VAR')"
    ") AS found, "
    "json_each(row_to_json(found)) WITH ORDINALITY AS field(key, value, position) "
    "ORDER BY found.id, field.position"};

struct Source {
  const char* table;
  const char* path_column;
};

constexpr Source kSources[] = {
    {"music", "path"},
    {"virtual_music", "path"},
    {"video", "path"},
    {"photo", "path"},
    {"video_convert", "video_path"},
    {"playlist", "path"},
    {"personal_playlist", "path"},
    {"directory", "path"},
    {"personal_directory", "path"},
};
constexpr const char* kTrackTable = "track";

Json::Value parse_json(const std::string& text) {
  Json::Value value;
  std::istringstream in(text);
  Json::CharReaderBuilder builder;
  std::string errors;
  if (!Json::parseFromStream(builder, in, &value, &errors)) throw std::runtime_error(errors);
  return value;
}

/// A value as people read it: the elements of a list one after another.
std::string shown(const Json::Value& value) {
  if (value.isNull()) return "";
  if (value.isArray()) {
    std::string out;
    for (const auto& element : value) out += (out.empty() ? "" : "; ") + shown(element);
    return out;
  }
  if (value.isObject()) {
    return value["star"].asString() + " stars from user " + value["userid"].asString();
  }
  return value.asString();
}

/// Everything found, as a table's lines and as JSON.
class Findings {
 public:
  void take(const char* table, Rows rows) {
    auto& list = json_[table] = Json::Value(Json::arrayValue);
    std::string last_id;
    while (rows.next()) {
      const auto id = rows.text("id");
      if (id != last_id) list.append(Json::Value(Json::objectValue));
      last_id = id;
      const auto key = rows.text("key");
      const auto value = parse_json(rows.text("value"));
      list[list.size() - 1][key] = value;
      if (const auto text = shown(value); !text.empty()) {
        lines_.push_back({std::string(table) + " " + id, key, text});
      }
    }
  }
  bool empty() const { return lines_.empty(); }
  const std::vector<TableRow>& lines() const { return lines_; }
  const Json::Value& json() const { return json_; }

 private:
  std::vector<TableRow> lines_;
  Json::Value json_{Json::objectValue};
};

Findings find(Database& database, const std::string& path) {
  Findings out;
  for (const auto& source : kSources) {
    out.take(source.table,
             database.query(filled(kSelectRows, source.table, source.path_column, path.c_str())));
  }
  out.take(kTrackTable, database.query(filled(kSelectTracks, path.c_str(), path.c_str())));
  return out;
}

/// The name that a path has without symbolic links, where the file system knows it.
std::string real_path(const std::string& path) {
  std::error_code error;
  const auto real = std::filesystem::canonical(path, error);
  return error || !is_utf8(real.native()) ? path : real.string();
}

}  // namespace

int run_show(const Arguments& arguments) {
  auto path = stored_path(arguments.operands[0]);
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  auto found = find(database, path);
  if (found.empty()) {
    // Indexed under the folder's own name, asked for by way of a link.
    if (const auto real = real_path(path); real != path) {
      path = real;
      found = find(database, path);
    }
  }
  if (found.empty()) {
    throw std::runtime_error("the index holds nothing of " +
                             escape_for_display(path.empty() ? "/" : path));
  }
  if (arguments.has("--json")) {
    auto object = found.json();
    object["path"] = path;
    put_json(object);
  } else {
    put_table({{"Row"}, {"Column"}, {"Value"}}, found.lines());
  }
  return kExitDone;
}

}  // namespace mediidx::tool
