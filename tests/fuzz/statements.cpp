// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The same request twice: with the input's texts, and with these texts less what is special to
// literals and patterns. The library has to send the same statements but for the values of their
// literals, and these have to be the texts.
#include <tavocore.h>
#include <tavodb.h>
#include <tavosdk.h>

#include <array>
#include <memory>
#include <vector>

#include "fuzz.h"
#include "mediidx/catalogue.h"
#include "mediidx/database.h"
#include "mediidx/index_folder.h"
#include "mediidx/playlist.h"
#include "mediidx/root.h"
#include "sql_tokens.h"
#include "support/owned.h"

struct tavodb_result {
  unsigned rows;
};

namespace {

using namespace mediidx;
using Info = __tag_TAVO_MEDIA_INFO;

/// What stands behind the library in one run.
struct Behind {
  std::vector<std::string> sent;
  unsigned answers = 0;     ///< A bit a result, the lowest first: whether it has a row.
  std::size_t failing = 0;  ///< The number of the statement that fails; 0 for none.
  bool is_home = false;     ///< All files lie in a user's library.
  std::string row_text;     ///< Every text that a row holds.
};
Behind g_behind;

int answer(const char* sql, tavodb_result** result) {
  g_behind.sent.emplace_back(sql);
  if (g_behind.sent.size() == g_behind.failing) return -1;
  if (result) {
    *result = new tavodb_result{g_behind.answers & 1U};
    g_behind.answers >>= 1U;
  }
  return 0;
}

}  // namespace

extern "C" {
TAVODB_EXPORT tavodb_connection* TAVODBConnect(const char*, const char*, const char*, const char*) {
  static int connection;
  return reinterpret_cast<tavodb_connection*>(&connection);
}
TAVODB_EXPORT void TAVODBClose(tavodb_connection*) {}
TAVODB_EXPORT const char* TAVODBErrorGet(tavodb_connection*) { return ""; }
TAVODB_EXPORT int TAVODBDatabaseTypeGet(tavodb_connection*) { return TAVODB_TYPE_POSTGRESQL; }
TAVODB_EXPORT int TAVODBExecute(tavodb_connection*, const char* sql, tavodb_result** result) {
  return sql ? answer(sql, result) : -1;
}
TAVODB_EXPORT int TAVODBSelectLimit(tavodb_connection*, const char* sql, std::uint32_t,
                                    std::uint32_t, tavodb_result** result) {
  return sql ? answer(sql, result) : -1;
}
TAVODB_EXPORT int TAVODBAffectedRows(tavodb_connection*, tavodb_result*) { return 1; }
TAVODB_EXPORT int TAVODBNumRows(tavodb_result* result) { return static_cast<int>(result->rows); }
TAVODB_EXPORT int TAVODBFetchRow(tavodb_result* result, std::uint32_t* row) {
  *row = 1;
  return result->rows-- > 0 ? 0 : (result->rows = 0, -1);
}
TAVODB_EXPORT const char* TAVODBFetchField(tavodb_result*, std::uint32_t, const char* column) {
  return std::strcmp(column, "id") == 0 ? "7" : g_behind.row_text.c_str();
}
TAVODB_EXPORT int TAVODBSetRowCursor(tavodb_result*, std::uint32_t) { return 0; }
TAVODB_EXPORT void TAVODBFreeResult(tavodb_result* result) { delete result; }

TAVOSDK_EXPORT int TAVOServiceHomePathCheck(const char*, int, int, TAVOHOMECHECK** result) {
  if (!g_behind.is_home) return 0;
  *result = new TAVOHOMECHECK{"user", "/m"};
  return 1;
}
TAVOSDK_EXPORT void TAVOHomeCheckResultFree(TAVOHOMECHECK* result) { delete result; }
TAVOSDK_EXPORT int TAVOUserGetUGID(const char*, std::uint32_t* uid, std::uint32_t*) {
  *uid = 1000;
  return 0;
}
TAVOSDK_EXPORT int IndexIsPathRemoteMount(const char*) { return 0; }
}

namespace {

constexpr std::size_t kLongest = 100;  // None is cut anywhere on its way.

/// What a request is made of.
struct Request {
  unsigned verb = 0;
  unsigned answers = 0;
  unsigned failing = 0;
  bool is_home = false;
  unsigned number = 0;
  std::array<std::string, 12> texts;
};

constexpr std::string_view kSpecial = "'\\%_";

/// Each special character for another that means nothing, so that different texts stay different.
char harmless(char c) {
  const auto at = kSpecial.find(c);
  return at == kSpecial.npos ? c : static_cast<char>(1 + at);
}

std::string harmless(std::string text) {
  std::ranges::transform(text, text.begin(), [](char c) { return harmless(c); });
  return text;
}

/// The same for a pattern, whose own wildcards stay; empty for one that is none.
std::string harmless_pattern(std::string_view pattern) {
  std::string text;
  for (std::size_t at = 0; at < pattern.size(); ++at) {
    const bool is_escaped = pattern[at] == '\\' && at + 1 < pattern.size();
    const bool is_wildcard = pattern[at] == '%' || pattern[at] == '_';
    if (is_escaped) ++at;
    text += is_wildcard ? pattern[at] : harmless(pattern[at]);
  }
  return text;
}

Request read(fuzz::Input& input) {
  Request request;
  request.verb = input.byte();
  request.answers = input.byte();
  request.failing = input.byte();
  request.number = input.byte();
  request.is_home = request.number % 2 == 1;
  for (auto& text : request.texts) {
    text = input.text(kLongest);
    std::ranges::replace_if(text, [](char c) { return c > 0 && c < 5; }, 'x');
  }
  return request;
}

template <std::size_t Size>
void set(char (&field)[Size], const std::string& text) {
  std::snprintf(field, Size, "%s", text.c_str());
}

std::unique_ptr<Info> record(const Request& request) {
  const auto& texts = request.texts;
  auto info = std::make_unique<Info>();
  set(info->path, "/m/" + texts[0]);
  set(info->title, texts[1]);
  set(info->album, texts[2]);
  set(info->artist, texts[3]);
  set(info->album_artist, texts[4]);
  set(info->genre, texts[5]);
  set(info->composer, texts[6]);
  set(info->comment, texts[7]);
  set(info->date, texts[8].substr(0, 20));
  set(info->mdate, texts[8].substr(0, 20));
  set(info->timetaken, texts[8].substr(0, 20));
  set(info->fs_uuid, texts[9]);
  for (auto* text : {&info->video_codec, &info->audio_codec, &info->container_type}) {
    set(*text, texts[10]);
  }
  set(info->camera_make, texts[11].substr(0, 90));
  set(info->camera_model, texts[11].substr(0, 90));
  set(info->exposure, texts[11].substr(0, 15));
  set(info->aperture, texts[11].substr(0, 15));
  info->id = 7;
  info->track = static_cast<int>(request.number);
  info->duration = static_cast<float>(request.number);
  return info;
}

void save_folder(const Request& request) {
  const auto dir = std::make_unique<DIR_INFO_REC>();
  set(dir->path, "/m/" + request.texts[0]);
  set(dir->title, request.texts[1]);
  set(dir->date, request.texts[8].substr(0, 20));
  set(dir->fs_uuid, request.texts[9]);
  DirInfoDBSave(dir.get());
}

void save_cue_sheet(const Request& request) {
  const auto cue = record(request);
  set(cue->path, "/m/" + request.texts[9]);
  auto track = std::make_unique<_PLAYLIST_REC>();
  track->info = *record(request);
  MediaInfoVirtualDBSave(track.get(), cue.get());
}

void save_copy(const Request& request) {
  const auto& texts = request.texts;
  const auto copy = std::make_unique<VIDEO_CONVERT_REC>();
  set(copy->video_path, texts[0]);
  set(copy->convert_file_path, texts[1]);
  set(copy->vcodec, texts[2]);
  set(copy->container_type, texts[3]);
  set(copy->acodec, texts[4]);
  set(copy->convert_type, texts[5]);
  MediaInfoVideoConvertDBSave(copy.get());
}

void find_in_batch(const Request& request) {
  const OwnedList list(TLIBCSzListAlloc(64));
  for (const auto& text : request.texts) MediaInfoDBBatchPara(list.get(), text.c_str());
  auto* handle = MediaInfoDBBatchOpen(MEDIA_TABLE_MUSIC, "path", "path", list.get(), "", "", 0, 0);
  const auto info = std::make_unique<Info>();
  const OwnedHash hash(TLIBCSzHashAlloc(64));
  MediaInfoDBGenHash(handle, "path", hash.get());
  MediaInfoDBBatchClose(handle);
}

void query(const Request& request) {
  const auto path = "/m/" + request.texts[0];
  const auto type = request.number % 5;
  const auto info = std::make_unique<Info>();
  MediaInfoDBGetOne(type, path.c_str(), info.get(), 0);
  MediaInfoDBGetOneEx2(type, path.c_str(), info.get(), 1);
  MediaInfoDBGetOneByField(type, path.c_str(), "id, path", info.get());
  MediaInfoDBGetCount(type, "*", (" path='" + path + "' ").c_str(), "path", 1);
  MediaInfoDBClose(
      MediaInfoDBOpen(type, "", ("title = '" + path + "'").c_str(), "", "id", 0, 0, 1));
  ParsePlayList(request.texts[1].c_str(), nullptr, 0, 0);
}

void mark(const Request& request) {
  const auto path = "/m/" + request.texts[0];
  MediaInfoDBSetOnline(path.c_str(), static_cast<int>(request.number % 2), 1);
  MediaInfoDBUUIDDropOffline(request.texts[0].c_str());
  const std::array<float, 4> gains{1, 2, 3, 4};
  MediaInfoAudioRGMetadataDBSave(gains.data(), 7);
}

void carry_out(const Request& request) {
  constexpr unsigned kSaves = 4;
  constexpr unsigned kDeletes = 7;
  const auto path = "/m/" + request.texts[0];
  unsigned verb = request.verb % (2 * kSaves + kDeletes + 7);
  if (verb < kSaves) {
    MediaInfoDBSave(verb, record(request).get());
  } else if ((verb -= kSaves) < kSaves) {
    MediaInfoDBUpdate(verb, record(request).get());
  } else if ((verb -= kSaves) < kDeletes) {
    MediaInfoDBDelete(verb, path.c_str());
  } else if ((verb -= kDeletes) == 0) {
    save_folder(request);
  } else if (verb == 1) {
    save_cue_sheet(request);
  } else if (verb == 2) {
    MediaInfoVirtualDBDelete(path.c_str());
  } else if (verb == 3) {
    save_copy(request);
  } else if (verb == 4) {
    find_in_batch(request);
  } else if (verb == 5) {
    query(request);
  } else {
    mark(request);
  }
}

std::vector<std::vector<test::SqlToken>> statements_of(const Request& request) {
  g_behind = {{}, request.answers, request.failing, request.is_home, request.texts[3]};
  carry_out(request);
  std::vector<std::vector<test::SqlToken>> statements;
  for (const auto& sql : g_behind.sent) statements.push_back(test::sql_tokens(sql));
  return statements;
}

void check_token(const test::SqlToken& sent, const test::SqlToken& plain) {
  fuzz::check(sent.kind == plain.kind && sent.kind != test::SqlToken::Kind::kBroken);
  const bool is_same =
      sent.kind == test::SqlToken::Kind::kLiteral
          ? harmless(sent.text) == plain.text || harmless_pattern(sent.text) == plain.text
          : sent.text == plain.text;
  fuzz::check(is_same);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (IndexFolderSizeGet() == 0) {
    TAVOMediaIndexRootSet("/nowhere");
    TAVOPlatformRootSet("/nowhere");
    gIndexFolderConf.append(createRule("m", "/m", true, true, true, false));
  }
  fuzz::Input input(data, size);
  auto request = read(input);
  const auto sent = statements_of(request);
  for (auto& text : request.texts) text = harmless(text);
  const auto plain = statements_of(request);
  fuzz::check(sent.size() == plain.size());
  for (std::size_t i = 0; i < sent.size(); ++i) {
    fuzz::check(sent[i].size() == plain[i].size());
    for (std::size_t k = 0; k < sent[i].size(); ++k) check_token(sent[i][k], plain[i][k]);
  }
  return 0;
}
