// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "folders/configured_folders.h"

#include <filesystem>

#include "indexfolder/entry.h"
#include "mediidx/index_folder.h"
#include "text/utf8.h"

namespace mediidx::tool {

bool ConfiguredFolder::is_there() const {
  std::error_code ignored;
  return !folder.empty() && std::filesystem::is_directory(folder, ignored);
}

std::string ConfiguredFolder::shown() const {
  return escape_for_display(folder.empty() ? entry["path"].asString() : folder);
}

std::vector<ConfiguredFolder> configured_folders() {
  std::vector<ConfiguredFolder> out;
  for (const auto& entry : IndexFolderConfOpen()) {
    if (!is_usable_entry(entry)) continue;
    auto folder = absolute_folder(entry["path"].asString()).value_or("");
    while (folder.size() > 1 && folder.ends_with('/')) folder.pop_back();
    out.push_back({entry, folder});
  }
  return out;
}

}  // namespace mediidx::tool
