// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/cue_durations.h"

#include "mediidx/cue_sheet.h"

namespace mediidx {
namespace {

CueDurations* g_current = nullptr;

}  // namespace

CueDurations::CueDurations(const KnownDurations& known) : known_(known) { g_current = this; }
CueDurations::~CueDurations() { g_current = nullptr; }
CueDurations* CueDurations::current() { return g_current; }

std::optional<std::string> CueDurations::find(const std::string& audio_path) {
  asked_.insert(audio_path);
  const auto found = known_.find(audio_path);
  return found == known_.end() ? std::nullopt : std::optional(found->second);
}

bool parse_again(std::span<const std::string> lines, const char* cue_path,
                 const KnownDurations& known, _PLAYLIST_REC** out) {
  const CueDurations durations(known);
  MediaInfoCueParser parser;
  for (const auto& line : lines) {
    if (parse_cue_line(parser, line, cue_path) == 0) return false;
  }
  return parser.OutputResultLists(out) != 0;
}

}  // namespace mediidx
