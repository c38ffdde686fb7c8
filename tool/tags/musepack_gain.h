// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The replay gain of Musepack streams of version 8, which TagLib does not come to.
#ifndef MEDIIDX_TOOL_TAGS_MUSEPACK_GAIN_H_
#define MEDIIDX_TOOL_TAGS_MUSEPACK_GAIN_H_

#include <optional>
#include <string_view>

namespace mediidx::tool {

/// In the stream's own units: gains below 64.82 dB, peaks in decibels of one sample step, each in
/// 1/256; 0 for none.
struct MusepackGain {
  int track_gain = 0;
  int track_peak = 0;
  int album_gain = 0;
  int album_peak = 0;
};

/// The gains in the beginning of a file; empty when there are none.
std::optional<MusepackGain> parse_musepack_gain(std::string_view beginning);

}  // namespace mediidx::tool

#endif
