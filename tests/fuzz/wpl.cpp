// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "fuzz.h"
#include "playlist/entry_readers.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  fuzz::for_each_line(fuzz::text(data, size), [](std::string_view raw) {
    const auto line = clean_line(raw, PlaylistFormat::kWpl);
    const auto entry = read_wpl_line(line);
    if (!entry) return;
    fuzz::check(!entry->empty() && entry->size() < line.size());
    fuzz::check(entry->find("&amp;") == entry->npos && entry->find("&apos;") == entry->npos);
    fuzz::check(entry->find("\xEF\x80\xA0") == entry->npos);
  });
  return 0;
}
