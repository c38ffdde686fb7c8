// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavodb.h>

#include "fuzz.h"
#include "mediidx/cue_sheet.h"
#include "mediidx/playlist.h"

// No database: look-ups end before the network.
extern "C" TAVODB_EXPORT tavodb_connection* TAVODBConnect(const char*, const char*, const char*,
                                                          const char*) {
  return nullptr;
}
extern "C" __attribute__((visibility("default"))) void syslog(int, const char*, ...) {}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  MediaInfoCueParser parser;
  mediidx::fuzz::for_each_line(mediidx::fuzz::text(data, size), [&](std::string_view line) {
    parser.ParseCommand(std::string(line), "/music/album.cue");
  });
  _PLAYLIST_REC* list = nullptr;
  const bool done = parser.OutputResultLists(&list) == 1;
  mediidx::fuzz::check(done == parser.GetIsCueSheet());
  for (const auto* node = list; node; node = node->next) mediidx::fuzz::check_texts(node->info);
  TAVOPlaylistRecFree(list);
  return 0;
}
