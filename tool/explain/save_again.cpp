// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "explain/save_again.h"

#include "mediidx/request.h"

namespace mediidx::tool {

void save_again(const Database& database, const std::string& path, Kind kind) {
  const auto json = to_json(read_media_file(path, kind));
  if (TAVOMediaIndexAdd_Json(json, table_of(kind)) == 0) return;
  const auto reason = database.last_error();
  throw std::runtime_error(!reason.empty()           ? reason
                           : kind == Kind::kCueSheet ? "the cue sheet cannot be understood"
                                                     : "it could not be saved");
}

}  // namespace mediidx::tool
