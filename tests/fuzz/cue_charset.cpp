// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/cue_charset.h"

#include <array>

#include "fuzz.h"

// The first byte chooses the code page.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  constexpr std::array kCodes{"", "enu", "cht", "chs", "jpn", "rus", "plk", "csy", "hun", "utf8"};
  if (size == 0) return 0;
  const auto sample = mediidx::fuzz::text(data + 1, size - 1);
  const auto charset = mediidx::detect_charset(sample, kCodes[data[0] % kCodes.size()]);
  mediidx::fuzz::check(!charset || (!charset->empty() && !sample.empty()));
  return 0;
}
