// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <memory>

#include "fuzz.h"
#include "mediidx/playlist.h"

namespace {

using Info = __tag_TAVO_MEDIA_INFO;

/// Everything but the fields that a line's tag names.
Info without(std::string_view line, const Info& info) {
  Info left = info;
  const auto names = [&](std::string_view tag) { return line.starts_with(tag); };
  if (names("#EXTINF:")) left.duration = 0;
  if (names("#EXTINF:")) std::memset(left.title, 0, sizeof left.title);
  if (names("#EXTINFARTIST:")) std::memset(left.artist, 0, sizeof left.artist);
  if (names("#EXTINFALBUM:")) std::memset(left.album, 0, sizeof left.album);
  if (names("#EXTINFGENRE:")) std::memset(left.genre, 0, sizeof left.genre);
  if (names("#EXTINFYEAR:")) left.year = 0;
  if (names("#EXTINFDISC:")) left.disc = 0;
  if (names("#EXTINFTRACK:")) left.track = 0;
  return left;
}

}  // namespace

/// Each line changes what its tag names, and nothing else.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  static const auto info = std::make_unique<Info>();
  *info = {};
  const auto before = std::make_unique<Info>();
  for (fuzz::Input input(data, size); !input.is_at_end();) {
    const auto line = input.text();
    *before = without(line, *info);
    fuzz::check((GetExtInfoM3U(line.c_str(), info.get()) == 1) == line.starts_with('#'));
    fuzz::check_texts(*info);
    const auto after = std::make_unique<Info>(without(line, *info));
    for (char* text : {before->title, after->title, before->artist, after->artist, before->album,
                       after->album, before->genre, after->genre}) {
      // What stands behind a text's end is no part of it.
      std::fill(text + std::strlen(text), text + MEDIIDX_TEXT_SIZE, '\0');
    }
    fuzz::check(std::memcmp(before.get(), after.get(), sizeof(Info)) == 0);
  }
  return 0;
}
