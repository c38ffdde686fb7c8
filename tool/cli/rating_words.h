// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the verbs about ratings are told and tell.
#ifndef MEDIIDX_TOOL_CLI_RATING_WORDS_H_
#define MEDIIDX_TOOL_CLI_RATING_WORDS_H_

#include <json/value.h>

#include "cli/arguments.h"
#include "ratings/rated_songs.h"

namespace mediidx::tool {

/// The user of --user. Throws UsageError without one, std::runtime_error for one that is not there.
RatingUser asked_user(const Arguments& arguments);

/// {"path", "track"}
Json::Value song_json(const Song& song);

}  // namespace mediidx::tool

#endif
