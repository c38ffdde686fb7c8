// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Replay gain as the JSON form of a media file brings it.
#ifndef MEDIIDX_API_REPLAY_GAIN_H_
#define MEDIIDX_API_REPLAY_GAIN_H_

#include <json/value.h>

#include <array>
#include <optional>

namespace mediidx {

/// Track gain, track peak, album gain and album peak (gains in dB, peaks linear); nothing when
/// `json` has no track gain. A value that is neither a number nor a decimal text is 0, one beyond a
/// float's range the nearest float.
std::optional<std::array<float, 4>> find_replay_gain(const Json::Value& json);

}  // namespace mediidx

#endif
