// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Saving many files or folders at once: in one transaction, and in as many round trips for a
/// thousand records as for one.
///
/// What a batch leaves is, ids aside, what saving its records one by one in their order would
/// leave. A batch that cannot be saved as a whole leaves nothing, and is the caller's to save one
/// by one.
#ifndef MEDIIDX_DATABASE_MANY_H_
#define MEDIIDX_DATABASE_MANY_H_

#include <array>
#include <map>
#include <optional>
#include <set>
#include <span>
#include <string>

#include "mediidx/record.h"

namespace mediidx::many {

/// How much of a record was saved.
enum class Outcome {
  kWhole,
  kPart,  ///< What a failure that the database has no part in, and that was logged, left of it.
};

/// One file to be saved.
struct File {
  __tag_TAVO_MEDIA_INFO* info;                ///< Its texts are trimmed; a song gets its id.
  std::optional<std::array<float, 4>> gains;  ///< The replay gain of a song.
  bool is_cue_sheet = false;                  ///< That was read, whatever it held.
  _PLAYLIST_REC* tracks = nullptr;            ///< Of a cue sheet; their texts are trimmed.
  Outcome outcome = Outcome::kWhole;
};

/// False when the platform's database library cannot: then nothing below succeeds.
bool is_available();

/// Saves files of one type, a playlist at most. False when nothing was saved; the reason is in the
/// log where the database gave one.
bool save_files(MEDIA_TABLE_TYPE type, std::span<File> files);
/// The same for folders.
bool save_folders(std::span<const DIR_INFO_REC* const> folders);

/// The lengths that the index has of songs, in seconds as the database writes them. Empty when it
/// could not be asked.
std::optional<std::map<std::string, std::string>> find_durations(
    const std::set<std::string>& paths);

}  // namespace mediidx::many

#endif
