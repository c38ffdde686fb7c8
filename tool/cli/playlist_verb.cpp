// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// What a playlist names, and what of it the index knows.
#include <strings.h>
#include <tavoindex.h>

#include "cli/file_operand.h"
#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "mediidx/playlist.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "support/owned.h"

namespace mediidx::tool {
namespace {

using Records = Owned<_PLAYLIST_REC, TAVOPlaylistRecFree>;

constexpr int kEveryEntry = MEDIIDX_KEEP_KNOWN | MEDIIDX_KEEP_UNKNOWN | MEDIIDX_KEEP_STREAMS;

bool is_stream(const char* path) { return strncasecmp(path, "http", 4) == 0; }

const char* kind_of_entry(const __tag_TAVO_MEDIA_INFO& info) {
  if (info.id != 0) return "known";
  return is_stream(info.path) ? "stream" : "unknown";
}

void print_json(const _PLAYLIST_REC* records) {
  JsonList out;
  int number = 0;
  for (const auto* record = records; record; record = record->next) {
    const auto& info = record->info;
    Json::Value object;
    object["entry"] = ++number;
    object["index"] = kind_of_entry(info);
    object["id"] = info.id == 0 ? Json::Value() : Json::Value(info.id);
    object["title"] = json_text(info.title);
    object["path"] = json_text(info.path);
    out.add(object);
  }
  out.finish();
}

void print_table(const _PLAYLIST_REC* records) {
  std::vector<TableRow> lines;
  for (const auto* record = records; record; record = record->next) {
    const auto& info = record->info;
    lines.push_back({std::to_string(lines.size() + 1), kind_of_entry(info), info.title, info.path});
  }
  put_table({{"No.", true}, {"Index"}, {"Title"}, {"Path", false, true}}, lines);
}

}  // namespace

int run_playlist_show(const Arguments& arguments) {
  const auto file = readable_file(arguments.operands[0]);
  const char* extension = TAVOIndexExtGet(file.c_str());
  if (!extension || !BlTAVOIndexIsPlaylist(extension)) throw no_such_kind(file, "playlist");
  if (strcasecmp(extension, "cue") == 0) {
    throw UsageError("a cue sheet is shown by mediidx cue show");
  }
  const DataFolder folder(arguments.value("--data-dir"));
  const Database database(folder);
  int count = 0;
  const Records records(
      ParsePlayListByFieldGivenPath(file.c_str(), &count, 0, 0, "id, path, title", kEveryEntry));
  if (!records) {
    if (const auto reason = database.last_error(); !reason.empty()) {
      throw std::runtime_error("the entries could not be looked up: " + reason);
    }
  }
  if (arguments.has("--json")) {
    print_json(records.get());
  } else {
    print_table(records.get());
  }
  return kExitDone;
}

}  // namespace mediidx::tool
