// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The star ratings that stand beside a song, a line for each user.
#ifndef MEDIIDX_TOOL_RATINGS_RATING_FILE_H_
#define MEDIIDX_TOOL_RATINGS_RATING_FILE_H_

#include <cstdint>
#include <map>
#include <string>
#include <string_view>

namespace mediidx::tool {

inline constexpr int kMostStars = 5;

/// User id to stars.
using Ratings = std::map<std::uint32_t, int>;

/// The ratings of a song, or of a virtual track under the song's path, "_" and its number. Lines
/// that hold no rating are left out. Throws std::runtime_error for a file that cannot be read.
Ratings read_ratings(const std::string& song);

/// Gives a song these stars of one user; 0 removes them. Other lines stay as they are; the file is
/// replaced as a whole, made with its folder when it is missing and removed when nothing is left.
/// Links in place of the folder are not followed. Throws std::runtime_error.
void write_rating(const std::string& song, std::uint32_t user, int stars);

/// The text of a rating file with another rating of one user: the first of the user's lines is
/// replaced, any others go; 0 stars remove them all.
std::string with_rating(std::string_view text, std::uint32_t user, int stars);

}  // namespace mediidx::tool

#endif
