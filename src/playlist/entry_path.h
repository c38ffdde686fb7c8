// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// From the text of a playlist entry to an absolute path.
#ifndef MEDIIDX_PLAYLIST_ENTRY_PATH_H_
#define MEDIIDX_PLAYLIST_ENTRY_PATH_H_

#include <optional>
#include <string>
#include <string_view>

namespace mediidx {

/// The target of the link to the default music share, for entries of other machines; empty when it
/// cannot be read.
std::optional<std::string> read_music_link();

/// True for internet streams, whatever their case.
bool begins_with_http(std::string_view entry);

/// Resolves an entry against its playlist's folder. Network paths and drive letters lead below the
/// music link. Empty when a part is missing or the result does not fit a path.
std::optional<std::string> resolve_entry(std::string_view entry, std::string_view playlist_path,
                                         const std::optional<std::string>& music_link);

/// The simpler resolution of ABSPlayListPath, for an entry with its backslashes turned.
std::string join_entry(std::string_view entry, std::string_view playlist_path);

}  // namespace mediidx

#endif
