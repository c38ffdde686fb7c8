// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "converter/text_converter.h"

#include <array>

#include "fuzz.h"
#include "text/utf8.h"

/// The first byte chooses the character set, the second where the text is cut in two.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  constexpr std::array kSets{"UTF-8",  "CP1252", "CP932",    "CP950",    "CP936",
                             "CP1258", "UCS-2",  "UTF-16LE", "UTF-16BE", "EUC-JP"};
  fuzz::Input input(data, size);
  const auto* from = kSets[input.byte() % kSets.size()];
  const auto cut = input.byte();
  const auto text = input.rest();
  tool::TextConverter converter(from, "UTF-8");
  auto whole = converter.convert(text);
  whole += converter.finish();
  fuzz::check(tool::is_utf8(whole));
  tool::TextConverter again(from, "UTF-8");
  auto pieces = again.convert(text.substr(0, cut));
  pieces += again.convert(text.substr(std::min<std::size_t>(cut, text.size())));
  pieces += again.finish();
  fuzz::check(pieces == whole);
  return 0;
}
