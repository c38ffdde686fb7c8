// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/coverage.h"

#include <algorithm>
#include <array>

#include "mediidx/index_folder.h"
#include "mediidx/record.h"
#include "mediidx/request.h"

namespace mediidx::tool {

bool is_below(const std::string& path, const std::string& folder) {
  return path == folder || path.starts_with(folder + "/");
}

std::vector<std::string> outermost_index_folders() {
  std::vector<std::string> out;
  std::array<char, MEDIIDX_PATH_SIZE> path;
  for (int i = 0; i < IndexFolderSizeGet(); ++i) {
    if (IndexFolderPathAt(static_cast<unsigned>(i), path.data(), static_cast<int>(path.size())) ==
        1) {
      out.emplace_back(path.data());
    }
  }
  std::ranges::sort(out);
  std::vector<std::string> roots;
  for (auto& folder : out) {
    const bool is_inner =
        std::ranges::any_of(roots, [&folder](const auto& root) { return is_below(folder, root); });
    if (!is_inner) roots.push_back(std::move(folder));
  }
  return roots;
}

Coverage coverage_of(const std::string& folder) {
  Coverage out;
  const auto file = folder + "/x";
  for (const auto kind : {Kind::kMusic, Kind::kPhoto, Kind::kVideo, Kind::kPlaylist}) {
    out.kinds[static_cast<std::size_t>(kind)] =
        TAVOMediaIndexIsIndexPath(file.c_str(), table_of(kind)) > 0;
  }
  out.kinds[static_cast<std::size_t>(Kind::kCueSheet)] = out.wants(Kind::kPlaylist);
  out.folder = TAVOMediaIndexIsIndexPath(folder.c_str(), MEDIA_TABLE_DIRECTORY) > 0;
  out.personal = TAVOMediaIndexGetUserIdFromPath(file.c_str()) != 0;
  return out;
}

}  // namespace mediidx::tool
