// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/playlist_file.h"

#include <tavocore.h>
#include <tavoindex.h>

#include <array>

#include "fuzz.h"
#include "mediidx/record.h"

namespace {
const char* g_code_page = "";
}

extern "C" TAVOINDEX_EXPORT const char* TAVOIndexCodePageGet(void) { return g_code_page; }

/// The first byte chooses format and code page.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  constexpr std::array kPages{"", "enu", "jpn", "cht", "rus", "utf8", "UTF-16", "none"};
  static const fuzz::MemoryFile file;
  fuzz::Input input(data, size);
  const auto choice = input.byte();
  const auto format = static_cast<PlaylistFormat>(choice % 3);
  g_code_page = kPages[choice / 3 % kPages.size()];
  file.write(input.rest());
  int count = 0;
  fuzz::check(read_playlist(file.path(), format, [&](const std::string& path, const auto& tags) {
    fuzz::check(!path.empty() && path.size() < MEDIIDX_PATH_SIZE);
    fuzz::check(path.find('\0') == path.npos && path.find('\\') == path.npos);
    fuzz::check(tags.title.find('\0') == tags.title.npos);
    fuzz::check(IsUnicodeString(path.c_str()) == 1);
    fuzz::check(IsUnicodeString(tags.title.c_str()) == 1);
    ++count;
  }));
  fuzz::check(count_playlist_entries(file.path(), format) == count);
  return 0;
}
