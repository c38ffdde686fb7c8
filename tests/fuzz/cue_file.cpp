// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <sys/mman.h>
#include <tavocore.h>
#include <tavodb.h>
#include <unistd.h>

#include <string>

#include "fuzz.h"
#include "mediidx/cue_sheet.h"
#include "mediidx/playlist.h"

// No database, and a converter that hands the file on as it is.
extern "C" {
TAVODB_EXPORT tavodb_connection* TAVODBConnect(const char*, const char*, const char*, const char*) {
  return nullptr;
}
TAVOCORE_EXPORT FILE* TLIBCPopen(const char*, const char*, const char*, ...);
TAVOCORE_EXPORT int TLIBCPclose(FILE* stream) { return std::fclose(stream); }
__attribute__((visibility("default"))) void syslog(int, const char*, ...) {}
}

namespace {
std::string g_path;
}

FILE* TLIBCPopen(const char*, const char*, const char*, ...) {
  return std::fopen(g_path.c_str(), "re");
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const int file = memfd_create("cue", MFD_CLOEXEC);
  g_path = "/proc/self/fd/" + std::to_string(file);
  mediidx::fuzz::check(ftruncate(file, 0) == 0 &&
                       pwrite(file, data, size, 0) == static_cast<ssize_t>(size));
  _PLAYLIST_REC* list = nullptr;
  TAVOParseCueByPath(&list, g_path.c_str());
  for (const auto* node = list; node; node = node->next) mediidx::fuzz::check_texts(node->info);
  TAVOPlaylistRecFree(list);
  return 0;
}
