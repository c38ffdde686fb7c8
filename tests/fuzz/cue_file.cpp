// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>
#include <tavodb.h>
#include <tavosdk.h>

#include <string>

#include "fuzz.h"
#include "mediidx/cue_sheet.h"
#include "mediidx/index_folder.h"
#include "mediidx/playlist.h"

// No database, or one that fails where the sheet ends in "!", and a converter that hands the file
// on as it is.
namespace {
bool g_fails;
}

extern "C" {
TAVODB_EXPORT tavodb_connection* TAVODBConnect(const char*, const char*, const char*, const char*) {
  static int connection;
  return g_fails ? reinterpret_cast<tavodb_connection*>(&connection) : nullptr;
}
TAVODB_EXPORT void TAVODBClose(tavodb_connection*) {}
TAVODB_EXPORT const char* TAVODBErrorGet(tavodb_connection*) { return ""; }
TAVODB_EXPORT int TAVODBDatabaseTypeGet(tavodb_connection*) { return TAVODB_TYPE_POSTGRESQL; }
TAVODB_EXPORT int TAVODBExecute(tavodb_connection*, const char*, tavodb_result**) { return -1; }
TAVOCORE_EXPORT FILE* TLIBCPopen(const char*, const char*, const char*, ...);
TAVOCORE_EXPORT int TLIBCPclose(FILE* stream) { return std::fclose(stream); }
TAVOSDK_EXPORT int TAVOServiceHomePathCheck(const char*, int, int, TAVOHOMECHECK**) { return 0; }
TAVOSDK_EXPORT int IndexIsPathRemoteMount(const char*) { return 0; }
}

namespace {
const mediidx::fuzz::MemoryFile& sheet() {
  static const mediidx::fuzz::MemoryFile file;
  return file;
}
}  // namespace

FILE* TLIBCPopen(const char*, const char*, const char*, ...) {
  return std::fopen(sheet().path().c_str(), "re");
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (IndexFolderSizeGet() == 0) {
    gIndexFolderConf.append(createRule("all", "/", false, true, false, false));
  }
  const auto text = mediidx::fuzz::text(data, size);
  g_fails = text.ends_with('!');
  sheet().write(text);
  _PLAYLIST_REC* list = nullptr;
  mediidx::fuzz::check(TAVOParseCueByPath(&list, "/nowhere/a.cue") == -1 && !list);
  TAVOParseCueByPath(&list, sheet().path().c_str());
  for (const auto* node = list; node; node = node->next) mediidx::fuzz::check_texts(node->info);
  TAVOPlaylistRecFree(list);
  return 0;
}
