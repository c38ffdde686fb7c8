// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The index-folder configuration as its file holds it.
#ifndef MEDIIDX_TOOL_FOLDERS_CONFIGURED_FOLDERS_H_
#define MEDIIDX_TOOL_FOLDERS_CONFIGURED_FOLDERS_H_

#include <json/value.h>

#include <filesystem>
#include <string>
#include <vector>

namespace mediidx::tool {

/// One entry of the configuration.
struct ConfiguredFolder {
  Json::Value entry;   ///< As in the file: the path is relative to the volume.
  std::string folder;  ///< Absolute; empty when the entry's share is not known.

  /// False for a folder on a disk that is away.
  bool is_there() const;
  /// The folder for people; the entry's own path when its share is not known.
  std::string shown() const;
};

/// The entries in the file's order, without those that cannot be used. What is no list has none.
std::vector<ConfiguredFolder> configured_folders();

/// True when it is known of every entry which folder it means. Only then is a folder that no entry
/// names one that somebody took out on purpose.
bool is_configuration_whole(const std::filesystem::path& root);

}  // namespace mediidx::tool

#endif
