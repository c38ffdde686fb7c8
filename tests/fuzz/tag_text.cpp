// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavoindex.h>

#include <array>

#include "fuzz.h"
#include "tags/musepack_gain.h"
#include "tags/replay_gain.h"
#include "text/legacy_text.h"
#include "text/utf8.h"

/// What the command makes of the bytes of a tag. The first byte chooses code page and width.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  constexpr std::array kPages{"", "enu", "jpn", "cht", "rus", "utf8", "UTF-16"};
  fuzz::Input input(data, size);
  const auto choice = input.byte();
  const auto text = input.rest();

  tool::set_code_page(kPages[choice % kPages.size()]);
  const auto decoded = tool::decode_legacy(text);
  fuzz::check(tool::is_utf8(decoded) && decoded.find('\0') == decoded.npos);

  const auto cleaned = tool::clean_text(text);
  fuzz::check(tool::is_utf8(cleaned) && tool::clean_text(cleaned) == cleaned);
  fuzz::check(!cleaned.starts_with(' ') && !cleaned.ends_with(' '));
  const auto shown = tool::escape_for_display(text);
  fuzz::check(tool::is_utf8(shown));
  fuzz::check(std::ranges::none_of(shown, [](char c) { return (c >= 0 && c < ' ') || c == 0x7F; }));
  const int width = static_cast<int>(choice % 40) + 1;
  for (const bool keep_end : {false, true}) {
    const auto cut = tool::cut_to_width(cleaned, width, keep_end);
    fuzz::check(tool::is_utf8(cut) && tool::display_width(cut) <= width);
  }

  if (const auto gain = tool::parse_gain(text)) fuzz::check(*gain >= -128 && *gain <= 128);
  if (const auto peak = tool::parse_peak(text)) fuzz::check(*peak >= 0 && *peak <= 1000);
  if (const auto gain = tool::parse_r128_gain(text)) fuzz::check(*gain >= -123 && *gain <= 133);
  if (const auto gain = tool::parse_musepack_gain(text)) {
    fuzz::check(gain->track_peak >= 0 && gain->track_peak <= 0xFFFF && gain->album_peak >= 0);
  }
  return 0;
}
