// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/entry_path.h"

#include <array>
#include <vector>

#include "fuzz.h"
#include "mediidx/playlist.h"

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
  std::vector<char> text(entry.begin(), entry.end());
  text.push_back('\0');
  std::array<char, MEDIIDX_PATH_SIZE> out;
  out.fill('x');
  ABSPlayListPath(std::string(playlist).c_str(), text.data(), out.data());
  fuzz::check(std::memchr(out.data(), '\0', out.size()) != nullptr);
  return 0;
}
