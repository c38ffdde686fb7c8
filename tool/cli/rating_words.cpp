// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/rating_words.h"

#include "cli/row_output.h"

namespace mediidx::tool {

RatingUser asked_user(const Arguments& arguments) {
  const auto named = arguments.value("--user");
  if (!named) throw UsageError(std::string(arguments.verb->name) + " needs --user NAME|ID");
  return find_user(*named);
}

Json::Value song_json(const Song& song) {
  Json::Value out;
  out["path"] = json_text(song.path);
  out["track"] = song.track ? Json::Value(*song.track) : Json::Value();
  return out;
}

}  // namespace mediidx::tool
