// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Replay gain as tags write it.
#ifndef MEDIIDX_TOOL_TAGS_REPLAY_GAIN_H_
#define MEDIIDX_TOOL_TAGS_REPLAY_GAIN_H_

#include <map>
#include <optional>
#include <string>
#include <string_view>

#include "tags/media_file.h"

namespace mediidx::tool {

/// "-6.20 dB", "+3" and the like in decibels; empty for what is no number or no sensible gain.
std::optional<double> parse_gain(std::string_view text);
/// "0.988525"; empty for what is no number or no sensible peak.
std::optional<double> parse_peak(std::string_view text);
/// Opus writes whole 1/256 dB against -23 LUFS; replay gain is 5 dB louder.
std::optional<double> parse_r128_gain(std::string_view text);

/// The gains among tags named in upper case. Replay gain's own tags come before those of Opus.
ReplayGain replay_gain_of(const std::map<std::string, std::string>& tags);

}  // namespace mediidx::tool

#endif
