// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Replay gain as tags write it.
#ifndef MEDIIDX_TOOL_TAGS_REPLAY_GAIN_H_
#define MEDIIDX_TOOL_TAGS_REPLAY_GAIN_H_

#include <optional>
#include <string_view>

namespace mediidx::tool {

/// "-6.20 dB", "+3" and the like in decibels; empty for what is no number or no sensible gain.
std::optional<double> parse_gain(std::string_view text);
/// "0.988525"; empty for what is no number or no sensible peak.
std::optional<double> parse_peak(std::string_view text);
/// Opus writes whole 1/256 dB against -23 LUFS; replay gain is 5 dB louder.
std::optional<double> parse_r128_gain(std::string_view text);

}  // namespace mediidx::tool

#endif
