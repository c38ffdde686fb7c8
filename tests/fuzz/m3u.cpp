// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "fuzz.h"
#include "mediidx/playlist.h"
#include "playlist/entry_readers.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  static __tag_TAVO_MEDIA_INFO info;
  M3uReader reader;
  fuzz::for_each_line(fuzz::text(data, size), [&](std::string_view raw) {
    const auto line = clean_line(raw, PlaylistFormat::kM3u);
    fuzz::check(!line.ends_with('\r'));
    const auto entry = reader.read_line(line);
    fuzz::check(!entry || (!entry->empty() && !entry->starts_with('#')));
    if (entry) {
      reader.take_tags().fill(info);
      fuzz::check_texts(info);
    }
    const bool is_tag = GetExtInfoM3U(std::string(line).c_str(), &info) == 1;
    fuzz::check(is_tag == line.starts_with('#'));
    fuzz::check_texts(info);
  });
  return 0;
}
