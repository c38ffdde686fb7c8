// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/entry_path.h"

#include <strings.h>

#include <array>
#include <vector>

#include "fuzz.h"
#include "mediidx/playlist.h"
#include "mediidx/root.h"
#include "scratch.h"

namespace {

/// As other programs resolve an entry.
void resolve_simply(const std::string& playlist, std::string_view entry) {
  std::vector<char> text(entry.begin(), entry.end());
  text.push_back('\0');
  std::array<char, MEDIIDX_PATH_SIZE> out;
  out.fill('x');
  ABSPlayListPath(playlist.c_str(), text.data(), out.data());
  mediidx::fuzz::check(std::memchr(out.data(), '\0', out.size()) != nullptr);
}

}  // namespace

// Two lines: the playlist's path and the entry.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  const auto input = fuzz::text(data, size);
  const auto border = input.find('\n');
  const auto playlist = input.substr(0, border);
  const auto entry = border == input.npos ? std::string_view() : input.substr(border + 1);
  for (const auto& link :
       {std::optional<std::string>("/volume1/music"), std::optional<std::string>()}) {
    const auto path = resolve_entry(entry, playlist, link);
    fuzz::check(!path || (path->size() < MEDIIDX_PATH_SIZE && path->find('\\') == path->npos));
  }
  fuzz::check(begins_with_http(entry) ==
              (entry.size() >= 4 && strncasecmp(entry.data(), "http", 4) == 0));
  // With the link to the music, and without it.
  static const test::ScratchRoot root;
  static const auto link = root.make_link("var/services/music", "/volume1/music");
  for (const char* top : {root.path().c_str(), "/nowhere"}) {
    TAVOMediaIndexRootSet(top);
    resolve_simply(std::string(playlist), entry);
  }
  return 0;
}
