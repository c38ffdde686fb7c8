// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/coverage.h"

#include "mediidx/request.h"

namespace mediidx::tool {

Coverage coverage_of(const std::string& folder) {
  Coverage out;
  const auto file = folder + "/x";
  for (const auto kind :
       {Kind::kMusic, Kind::kPhoto, Kind::kVideo, Kind::kPlaylist, Kind::kCueSheet}) {
    out.kinds[static_cast<std::size_t>(kind)] =
        TAVOMediaIndexIsIndexPath(file.c_str(), table_of(kind)) > 0;
  }
  out.folder = TAVOMediaIndexIsIndexPath(folder.c_str(), MEDIA_TABLE_DIRECTORY) > 0;
  out.personal = TAVOMediaIndexGetUserIdFromPath(file.c_str()) != 0;
  return out;
}

}  // namespace mediidx::tool
