// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Positions in audio files as cue sheets write them: minutes, seconds and frames, 75 a second.
#ifndef MEDIIDX_PLAYLIST_CUE_POSITION_H_
#define MEDIIDX_PLAYLIST_CUE_POSITION_H_

#include <cstdint>
#include <string>
#include <string_view>

namespace mediidx {

inline constexpr std::int32_t kFramesPerSecond = 75;
inline constexpr std::int32_t kFramesPerMinute = 60 * kFramesPerSecond;

/// The number that a text begins with, as strtol reads it: behind white space and with a sign; 0
/// when there is none, the nearest there is when it is too large.
std::int64_t leading_number(std::string_view text);

/// "mm:ss:ff" as frames. Minutes end at the first ":", frames begin after the last, so with one ":"
/// the text after it counts as seconds and as frames, and without one the text counts three times.
std::int32_t frames_from_position(std::string_view position);

/// Frames as "mm:ss:ff", each number of two digits at least.
std::string position_from_frames(std::int32_t frames);

/// Sum and difference that wrap, as positions from a sheet may hold any number.
std::int32_t add_frames(std::int32_t a, std::int32_t b);
std::int32_t subtract_frames(std::int32_t a, std::int32_t b);

}  // namespace mediidx

#endif
