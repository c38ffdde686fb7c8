// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "fuzz.h"
#include "playlist/entry_readers.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  fuzz::for_each_line(fuzz::text(data, size), [](std::string_view raw) {
    const auto line = clean_line(raw, PlaylistFormat::kPls);
    const auto entry = read_pls_line(line);
    if (!entry) return;
    fuzz::check(!entry->empty() && line.find(*entry) != line.npos);
    fuzz::check(!entry->starts_with(' ') && !entry->ends_with('\t'));
  });
  return 0;
}
