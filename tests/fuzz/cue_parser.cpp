// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The lines of a sheet. Its first line says what the database does when it is asked for the length
// of an audio file: it gives the number that stands there, knows no such file, or fails in one way
// or another.
#include <tavodb.h>
#include <tavosdk.h>

#include <memory>
#include <vector>

#include "fuzz.h"
#include "mediidx/cue_sheet.h"
#include "mediidx/index_folder.h"
#include "mediidx/playlist.h"
#include "playlist/cue_durations.h"
#include "support/owned.h"

namespace {

using namespace mediidx;

constexpr const char* kSheet = "/music/album.cue";
constexpr const char* kUnknown = "?";
constexpr const char* kNoConnection = "-";
constexpr const char* kNoResult = "!";
constexpr const char* kNoRow = "#";
constexpr const char* kNoField = "~";

std::string g_length;  ///< Of every audio file.

}  // namespace

extern "C" {
TAVODB_EXPORT tavodb_connection* TAVODBConnect(const char*, const char*, const char*, const char*) {
  static int connection;
  return g_length == kNoConnection ? nullptr : reinterpret_cast<tavodb_connection*>(&connection);
}
TAVODB_EXPORT void TAVODBClose(tavodb_connection*) {}
TAVODB_EXPORT const char* TAVODBErrorGet(tavodb_connection*) { return ""; }
TAVODB_EXPORT int TAVODBDatabaseTypeGet(tavodb_connection*) { return TAVODB_TYPE_POSTGRESQL; }
TAVODB_EXPORT int TAVODBExecute(tavodb_connection*, const char*, tavodb_result** result) {
  *result = nullptr;
  return g_length == kNoResult ? -1 : 0;
}
TAVODB_EXPORT int TAVODBNumRows(tavodb_result*) { return g_length == kUnknown ? 0 : 1; }
TAVODB_EXPORT int TAVODBFetchRow(tavodb_result*, std::uint32_t*) {
  return g_length == kNoRow ? -1 : 0;
}
TAVODB_EXPORT const char* TAVODBFetchField(tavodb_result*, std::uint32_t, const char*) {
  return g_length == kNoField ? nullptr : g_length.c_str();
}
TAVODB_EXPORT void TAVODBFreeResult(tavodb_result*) {}

TAVOSDK_EXPORT int TAVOServiceHomePathCheck(const char*, int, int, TAVOHOMECHECK**) { return 0; }
TAVOSDK_EXPORT int IndexIsPathRemoteMount(const char*) { return 0; }
}

namespace {

struct Parsed {
  bool is_done = false;
  std::vector<std::unique_ptr<__tag_TAVO_MEDIA_INFO>> tracks;
};

Parsed parsed(bool is_done, _PLAYLIST_REC* list) {
  using OwnedRecords = Owned<_PLAYLIST_REC, TAVOPlaylistRecFree>;
  const OwnedRecords owner(list);
  Parsed out{is_done, {}};
  for (const auto* node = list; node; node = node->next) {
    fuzz::check_texts(node->info);
    out.tracks.push_back(std::make_unique<__tag_TAVO_MEDIA_INFO>(node->info));
  }
  return out;
}

Parsed parse(const std::vector<std::string>& lines) {
  MediaInfoCueParser parser;
  bool is_done = true;
  for (const auto& line : lines) {
    is_done = is_done && parser.ParseCommand(line, kSheet) != 0;
  }
  _PLAYLIST_REC* list = nullptr;
  is_done = is_done && parser.OutputResultLists(&list) == 1;
  fuzz::check(!is_done || parser.GetIsCueSheet());
  return parsed(is_done, list);
}

/// The same with the lengths of the files that the sheet names, known from before.
Parsed parse_with_lengths(const std::vector<std::string>& lines) {
  KnownDurations known;
  {
    CueDurations durations(known);
    parse(lines);
    if (g_length != kUnknown) {
      for (const auto& path : durations.asked()) known.emplace(path, g_length);
    }
  }
  _PLAYLIST_REC* list = nullptr;
  const bool is_done = parse_again(lines, kSheet, known, &list);
  return parsed(is_done, list);
}

bool is_failure(const std::string& length) {
  return length == kNoConnection || length == kNoResult || length == kNoRow || length == kNoField;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (IndexFolderSizeGet() == 0) {
    gIndexFolderConf.append(createRule("music", "/music", false, true, false, false));
  }
  fuzz::Input input(data, size);
  g_length = input.text();
  std::vector<std::string> lines;
  fuzz::for_each_line(input.rest(), [&](std::string_view line) {
    lines.emplace_back(line.substr(0, line.find('\0')));
  });
  const auto asked = parse(lines);
  if (is_failure(g_length)) return 0;
  const auto known = parse_with_lengths(lines);
  fuzz::check(asked.is_done == known.is_done && asked.tracks.size() == known.tracks.size());
  for (std::size_t i = 0; i < asked.tracks.size(); ++i) {
    fuzz::check(std::memcmp(asked.tracks[i].get(), known.tracks[i].get(),
                            sizeof(__tag_TAVO_MEDIA_INFO)) == 0);
  }
  return 0;
}
