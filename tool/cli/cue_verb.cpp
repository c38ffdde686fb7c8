// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The tracks of a cue sheet.
#include <strings.h>
#include <tavoindex.h>

#include <optional>

#include "cli/file_operand.h"
#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "mediidx/cue_sheet.h"
#include "mediidx/index_folder.h"
#include "mediidx/playlist.h"
#include "playlist/cue_charset.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "support/owned.h"

namespace mediidx::tool {
namespace {

using Records = Owned<_PLAYLIST_REC, TAVOPlaylistRecFree>;

/// The last track of a file that is not indexed has none.
bool has_duration(const __tag_TAVO_MEDIA_INFO& info) { return info.duration > 0; }

Json::Value track_json(const __tag_TAVO_MEDIA_INFO& info) {
  Json::Value object;
  object["track"] = info.track;
  object["start"] = json_text(info.comment);
  object["duration"] = has_duration(info) ? Json::Value(info.duration) : Json::Value();
  object["title"] = json_text(info.title);
  object["artist"] = json_text(info.artist);
  object["album"] = json_text(info.album);
  object["album_artist"] = json_text(info.album_artist);
  object["composer"] = json_text(info.composer);
  object["genre"] = json_text(info.genre);
  object["year"] = info.year;
  object["path"] = json_text(info.path);
  return object;
}

void print_json(const _PLAYLIST_REC* records, const std::optional<std::string>& charset) {
  Json::Value out;
  out["charset"] = charset ? Json::Value(*charset) : Json::Value();
  auto& tracks = out["tracks"] = Json::Value(Json::arrayValue);
  for (const auto* record = records; record; record = record->next) {
    tracks.append(track_json(record->info));
  }
  put_json(out);
}

/// The character set stands above the table; in lines for programs, at the end of each.
void print_table(const _PLAYLIST_REC* records, const std::optional<std::string>& charset) {
  const auto charset_text = charset.value_or("unknown");
  if (is_on_terminal()) put("Character set: " + charset_text + "\n");
  std::vector<TableRow> lines;
  for (const auto* record = records; record; record = record->next) {
    const auto& info = record->info;
    lines.push_back({std::to_string(info.track), info.comment,
                     has_duration(info) ? clock_text(info.duration) : "", info.title, info.artist,
                     info.path});
    if (!is_on_terminal()) lines.back().push_back(charset_text);
  }
  put_table({{"No.", true},
             {"Start", true},
             {"Time", true},
             {"Title"},
             {"Artist"},
             {"Path", false, true}},
            lines);
}

}  // namespace

int run_cue_show(const Arguments& arguments) {
  const auto file = readable_file(arguments.operands[0]);
  const char* extension = TAVOIndexExtGet(file.c_str());
  if (!extension || strcasecmp(extension, "cue") != 0) throw no_such_kind(file, "cue sheet");
  const DataFolder folder(arguments.value("--data-dir"));
  // The index knows how long the audio files are, of folders that are indexed.
  IndexFolderInit();
  const Database database(folder);
  Records records;
  if (TAVOParseCueByPath(out(records), file.c_str()) != 0) {
    throw std::runtime_error("the cue sheet cannot be understood");
  }
  const auto charset = detect_cue_charset(file.c_str());
  if (arguments.has("--json")) {
    print_json(records.get(), charset);
  } else {
    print_table(records.get(), charset);
  }
  return kExitDone;
}

}  // namespace mediidx::tool
