// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "folders/configured_folders.h"

#include <json/reader.h>

#include <algorithm>
#include <filesystem>
#include <fstream>

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

bool is_configuration_whole(const std::filesystem::path& root) {
  const auto file = root / "usr/tavo/etc/index_folder.conf";
  std::error_code ignored;
  // Without an entry there is no file either.
  if (std::filesystem::symlink_status(file, ignored).type() ==
      std::filesystem::file_type::not_found) {
    return true;
  }
  std::ifstream in(file, std::ios::binary);
  Json::Value top;
  try {
    if (!Json::parseFromStream(Json::CharReaderBuilder(), in, &top, nullptr)) return false;
  } catch (const Json::Exception&) {  // nested too deeply
    return false;
  }
  return top.isArray() && std::ranges::all_of(top, [](const auto& entry) {
           return is_usable_entry(entry) && absolute_folder(entry["path"].asString());
         });
}

}  // namespace mediidx::tool
