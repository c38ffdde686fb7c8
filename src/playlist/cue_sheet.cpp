// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mediidx/cue_sheet.h"

#include <array>
#include <cstdio>
#include <fstream>
#include <string_view>

#include "playlist/cue_charset.h"
#include "playlist/cue_durations.h"
#include "support/log.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

using LineBuffer = std::array<char, 1024>;

bool parse_line(MediaInfoCueParser& parser, const char* line, const char* cue_path, int log_line) {
  if (auto* durations = CueDurations::current()) durations->keep_line(line);
  if (parse_cue_line(parser, line, cue_path) != 0) return true;
  kCueLog.colon(log_line, "Failed to parse command [%s]", line);
  return false;
}

/// Feeds the converter's output; a line that is too long comes in pieces.
bool parse_converted(MediaInfoCueParser& parser, const char* cue_path, const std::string& charset) {
  const auto pipe = open_cue_converter(cue_path, charset);
  if (!pipe) return false;
  LineBuffer buffer{};
  while (std::fgets(buffer.data(), static_cast<int>(buffer.size()), pipe.get())) {
    if (!parse_line(parser, buffer.data(), cue_path, 498)) return false;
    buffer.fill('\0');
  }
  return true;
}

/// Feeds the file itself; a line that is too long ends the reading, and what came before it counts.
bool parse_directly(MediaInfoCueParser& parser, const char* cue_path, std::istream& file) {
  constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";
  LineBuffer buffer;
  for (bool is_first = true; !file.eof(); is_first = false) {
    if (!file.getline(buffer.data(), buffer.size(), '\n')) break;
    const char* line = buffer.data();
    if (is_first && std::string_view(line).starts_with(kByteOrderMark)) {
      line += kByteOrderMark.size();
    }
    if (!parse_line(parser, line, cue_path, 514)) return false;
  }
  return true;
}

bool parse_cue_sheet(_PLAYLIST_REC** out, const char* cue_path) {
  MediaInfoCueParser parser;
  std::ifstream file(cue_path);
  if (!file) {
    kCueLog.colon(483, "open cue file error");
    return false;
  }
  const auto charset = detect_cue_charset(cue_path);
  if (charset && *charset != "UTF-8" && !parse_converted(parser, cue_path, *charset)) return false;
  if (!parser.GetIsCueSheet() && !parse_directly(parser, cue_path, file)) return false;
  if (parser.OutputResultLists(out) != 0) return true;
  kCueLog.colon(521, "Failed to output result list of [%s]", cue_path);
  return false;
}

}  // namespace
}  // namespace mediidx

extern "C" int TAVOParseCueByPath(_PLAYLIST_REC** out, const char* cuePath) {
  if (!out || !cuePath) return -1;
  return mediidx::no_throw(mediidx::kCueLog, -1,
                           [&] { return mediidx::parse_cue_sheet(out, cuePath) ? 0 : -1; });
}
