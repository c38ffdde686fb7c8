// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The rows of the track table: one per audio file ("actual"), and one per track that a cue sheet
/// cuts out of an audio file ("virtual").
///
/// An actual row is known by its path, a virtual one by its path, which is the audio file's, and
/// its track number.
#ifndef MEDIIDX_DATABASE_TRACK_ROW_H_
#define MEDIIDX_DATABASE_TRACK_ROW_H_

#include <cstdint>
#include <optional>

#include "database/catalogue_connection.h"

namespace mediidx::catalogue {

/// Inserts a virtual row when a cue sheet is given, else an actual one.
bool insert_track_row(const Connection& conn, const Record& info, const Record* cue_sheet,
                      std::int64_t userid);
/// Rewrites the actual row `info.id`; container, codec, owner and flags stay.
bool update_track_row(const Connection& conn, const Record& info);
/// Stores the row's id into the record and returns it, or 0 for one that is no positive number.
/// Empty, and the record unchanged, when the query fails or finds no row.
std::optional<int> find_inserted_track_id(const Connection& conn, Record& info, bool is_virtual);
/// Counts the virtual rows of an actual record's path, or the actual ones of a virtual record's.
std::optional<int> count_counterparts(const Connection& conn, const Record& info, bool is_virtual);
/// Marks the actual row of the record's path as having virtual ones.
bool mark_actual_row(const Connection& conn, const Record& info);
/// Copies channels, frequency, bitrate, container and codec: from an actual record to the virtual
/// rows of its path, or from the actual row into the virtual row `info.id`.
bool copy_audio_properties(const Connection& conn, const Record& info, bool is_virtual);

}  // namespace mediidx::catalogue

#endif
