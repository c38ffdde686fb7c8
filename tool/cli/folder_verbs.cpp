// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The folders chosen for indexing.
#include <array>
#include <filesystem>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "folders/folder_edit.h"
#include "indexfolder/entry.h"
#include "scan/known_folders.h"
#include "store/database.h"
#include "store/query.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

using Text = const char*;

constexpr Template<Text, Text, Text> kCountBelow{
    "SELECT count(*) AS number FROM @TAVO:NEVAR "
    "WHERE path = '@TAVO:VAR' OR path LIKE '@TAVO:LVAR/%'"};

constexpr std::array<const char*, 3> kFlags{"music", "photo", "video"};

struct CountedTable {
  const char* table;
  const char* kind;
};
constexpr std::array kTables{
    CountedTable{"music", "music"},       CountedTable{"photo", "photos"},
    CountedTable{"video", "videos"},      CountedTable{"playlist", "playlists"},
    CountedTable{"directory", "folders"},
};

KindFlags kinds_to_add(const Arguments& arguments) {
  KindFlags kinds;
  for (const std::string kind : kFlags) {
    if (arguments.has("--" + kind)) kinds[kind] = true;
  }
  if (!kinds.empty()) return kinds;
  for (const std::string kind : kFlags) kinds[kind] = true;
  return kinds;
}

KindFlags kinds_to_set(const Arguments& arguments) {
  KindFlags kinds;
  for (const std::string kind : kFlags) {
    const bool on = arguments.has("--" + kind);
    const bool off = arguments.has("--no-" + kind);
    if (on && off) throw UsageError("--" + kind + " and --no-" + kind + " exclude each other");
    if (on || off) kinds[kind] = on;
  }
  if (kinds.empty()) throw UsageError("folder set needs a kind, such as --music or --no-photo");
  return kinds;
}

const char* beginning(FolderChange::What what) {
  switch (what) {
    case FolderChange::What::kAdded:
      return "Indexing ";
    case FolderChange::What::kRemoved:
      return "Taking out of the index: ";
    case FolderChange::What::kChanged:
      break;
  }
  return "Indexing again: ";
}

/// "/music: 12 music, 3 photos, …": what the index holds below a folder.
std::string count_line(Database& database, const std::string& folder) {
  std::string line;
  for (const auto& [table, kind] : kTables) {
    auto rows = database.query(filled(kCountBelow, table, folder.c_str(), folder.c_str()));
    rows.next();
    line += (line.empty() ? ": " : ", ") + rows.text("number") + " " + kind;
  }
  return escape_for_display(folder) + line + "\n";
}

/// Applies the edit, telling what is done about which folder and what came of it.
int apply(const DataFolder& data, FolderEdit& edit) {
  const auto changes = edit.changes();
  if (changes.empty()) {
    put("Nothing changes.\n");
    return kExitDone;
  }
  Database database(data);
  for (const auto& change : changes) {
    const auto& shown = change.folder.empty() ? change.entry["path"].asString() : change.folder;
    put(beginning(change.what) + escape_for_display(shown) + "\n");
  }
  // The programs that are run write to the same terminal.
  flush_output();
  edit.apply();
  for (const auto& change : changes) {
    if (!change.folder.empty()) put(count_line(database, change.folder));
  }
  return noted_signal() ? kExitSignal + noted_signal() : kExitDone;
}

Json::Value json_of(const ConfiguredFolder& configured) {
  Json::Value object;
  object["path"] = configured.folder.empty() ? Json::Value() : json_text(configured.folder);
  object["share_path"] = configured.entry["path"];
  object["name"] = configured.entry["name"].isString() ? configured.entry["name"] : Json::Value("");
  for (const char* kind : kFlags) object[kind] = entry_flag(configured.entry, kind);
  object["exists"] = configured.is_there();
  return object;
}

TableRow line_of(const Json::Value& object, const std::string& shown) {
  TableRow line{shown, object["name"].asString()};
  for (const char* kind : kFlags) line.emplace_back(object[kind].asBool() ? "yes" : "no");
  line.emplace_back(object["exists"].asBool() ? "yes" : "away");
  return line;
}

}  // namespace

int run_folder_list(const Arguments& arguments) {
  const DataFolder data(arguments.value("--data-dir"));
  JsonList list;
  std::vector<TableRow> lines;
  for (const auto& configured : configured_folders()) {
    const auto object = json_of(configured);
    if (arguments.has("--json")) list.add(object);
    lines.push_back(line_of(
        object, configured.folder.empty() ? object["share_path"].asString() : configured.folder));
  }
  if (arguments.has("--json")) {
    list.finish();
  } else {
    put_table({{"Folder", false, true}, {"Name"}, {"Music"}, {"Photos"}, {"Videos"}, {"There"}},
              lines);
  }
  return kExitDone;
}

int run_folder_add(const Arguments& arguments) {
  const auto folder = real_folder(arguments.operands[0]);
  const auto name =
      arguments.value("--name").value_or(std::filesystem::path(folder).filename().string());
  if (!is_utf8(name)) throw UsageError("the name is not valid UTF-8");
  const DataFolder data(arguments.value("--data-dir"));
  FolderEdit edit(data, arguments.has("--drop-missing"));
  edit.add(folder, name, kinds_to_add(arguments));
  return apply(data, edit);
}

int run_folder_set(const Arguments& arguments) {
  const auto kinds = kinds_to_set(arguments);
  const DataFolder data(arguments.value("--data-dir"));
  FolderEdit edit(data, arguments.has("--drop-missing"));
  edit.set(arguments.operands[0], kinds);
  return apply(data, edit);
}

int run_folder_remove(const Arguments& arguments) {
  const DataFolder data(arguments.value("--data-dir"));
  FolderEdit edit(data, arguments.has("--drop-missing"));
  edit.remove(arguments.operands[0]);
  return apply(data, edit);
}

}  // namespace mediidx::tool
