// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The album artist of the tracks that stay when a file leaves.
///
/// An audio file is named by its path, a cue sheet, which stands for all its virtual tracks, by the
/// path of the sheet.
#ifndef MEDIIDX_DATABASE_ALBUM_ARTIST_RECOVERY_H_
#define MEDIIDX_DATABASE_ALBUM_ARTIST_RECOVERY_H_

#include <optional>

#include "database/catalogue_connection.h"

namespace mediidx::catalogue {

enum class Leaving { kAudioFile, kCueSheet };

/// Gives the collapsed albums of a leaving file the one artist that the other tracks name; with
/// none or several left nothing changes. To be called while the file's rows are still there.
bool recover_album_artists(const Connection& conn, const char* path, Leaving leaving);

/// Counts the file's rows whose album is collapsed. Empty on failure, as the next one.
std::optional<int> count_collapsed_rows(const Connection& conn, const char* path, Leaving leaving);
/// Counts the artists that the other tracks of those albums name.
std::optional<int> count_remaining_artists(const Connection& conn, const char* path,
                                           Leaving leaving);
/// Writes the artist of those tracks into every row of those albums that takes none from its own
/// artist, tagged rows included.
bool recover_single_artist(const Connection& conn, const char* path, Leaving leaving);

}  // namespace mediidx::catalogue

#endif
