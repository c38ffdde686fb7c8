// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Rows that a save or delete left behind half done.
#ifndef MEDIIDX_TOOL_EXPLAIN_HALF_WRITTEN_H_
#define MEDIIDX_TOOL_EXPLAIN_HALF_WRITTEN_H_

#include <string>
#include <vector>

#include "store/database.h"

namespace mediidx::tool {

enum class Fault {
  kTrackWithoutSideRows,  ///< No genre, composer, artist or album row.
  kTrackWithoutMusicRow,  ///< Outside the personal libraries every audio file has one.
  kMusicRowWithoutTrack,
  kFileTwice,                  ///< Two rows of one audio file.
  kVirtualTrackWithoutOrigin,  ///< A virtual track that does not know its cue sheet.
  kVirtualTrackWithoutSheet,   ///< Its cue sheet has no playlist row.
  kVirtualTrackWithoutMusicRow,
  kVirtualMusicRowWithoutTrack,
  kHasVirtualNotSet,  ///< An audio file that does not say that it has virtual tracks.
  kSideRowWithoutTrack,
};
/// For programs: "track_without_side_rows", …
const char* name_of(Fault fault);
/// For people.
const char* text_of(Fault fault);

struct HalfWritten {
  Fault fault;
  unsigned id = 0;        ///< Of the track, or the row where there is none.
  std::string path;       ///< Of the audio file; empty for a side row without a track.
  std::string cue_sheet;  ///< Of a virtual track, as far as it is known.
  std::string detail;     ///< The tables that lack a row, or that have one too many.
  std::string start;      ///< Of a virtual track that does not know its cue sheet: mm:ss:ff.
  bool is_virtual = false;
};

/// Everything half written, in an order of its own that stays the same.
std::vector<HalfWritten> find_half_written(Database& database);

}  // namespace mediidx::tool

#endif
