// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Star ratings within media files: POPM frames of ID3, FMPS_Rating elsewhere.
#ifndef MEDIIDX_TOOL_RATINGS_RATING_TAG_H_
#define MEDIIDX_TOOL_RATINGS_RATING_TAG_H_

#include <optional>
#include <string>
#include <string_view>

namespace mediidx::tool {

/// 1 to 5 for the 1 to 255 of a POPM frame; empty for 0, which is not rated.
std::optional<int> stars_of_popm(int rating);
/// The other way round, as most players write them: 1, 64, 128, 196, 255.
int popm_of_stars(int stars);
/// 1 to 5 for an FMPS_Rating of "0.0" to "1.0"; empty for what is none, and for less than half a
/// star.
std::optional<int> stars_of_fmps(std::string_view rating);
std::string fmps_of_stars(int stars);

/// The stars in a file's tags: of several POPM frames that of `user`, else the first that rates.
/// Empty when there are none, and for files that hold no such tags. Throws std::runtime_error with
/// the reason for a file that cannot be read.
std::optional<int> read_rating_tag(const std::string& path, const std::string& user);

/// Writes the stars (1 to 5) into the tags, and keeps everything else in them. False for a file
/// that cannot hold such a tag. Throws std::runtime_error.
bool write_rating_tag(const std::string& path, const std::string& user, int stars);

}  // namespace mediidx::tool

#endif
