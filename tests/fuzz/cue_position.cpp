// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/cue_position.h"

#include <vector>

#include "fuzz.h"
#include "mediidx/cue_sheet.h"

/// Two positions, and the words of a command.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  fuzz::Input input(data, size);
  const auto first = input.text();
  const auto second = input.text();
  MediaInfoCueParser parser;
  for (const auto& position : {first, second}) {
    const auto frames = frames_from_position(position);
    const auto written = position_from_frames(frames);
    fuzz::check(parser.GetFramesFromPos(position) == frames);
    fuzz::check(parser.GetPosFromFrames(frames) == written);
    fuzz::check(frames_from_position(written) == frames);
  }
  // What is added is taken away again.
  auto there = first;
  parser.CalPosition(there, second, "+");
  parser.CalPosition(there, second, "-");
  fuzz::check(frames_from_position(there) == frames_from_position(first));

  const int index = static_cast<int>(input.byte()) - 8;
  const int count = static_cast<int>(input.byte()) - 8;
  std::vector<std::string> words;
  while (!input.is_at_end()) words.push_back(input.text());
  std::string value = "unchanged";
  parser.GetString(value, words, index, count);
  const bool is_there = index >= 0 && static_cast<std::size_t>(index) < words.size();
  fuzz::check(is_there || value == "unchanged");
  return 0;
}
