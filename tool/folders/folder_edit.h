// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// One change of the folders chosen for indexing.
#ifndef MEDIIDX_TOOL_FOLDERS_FOLDER_EDIT_H_
#define MEDIIDX_TOOL_FOLDERS_FOLDER_EDIT_H_

#include <map>
#include <string>
#include <vector>

#include "folders/configured_folders.h"
#include "scan/share_file.h"
#include "store/data_folder.h"
#include "store/settings_lock.h"

namespace mediidx::tool {

/// What happens to one folder.
struct FolderChange {
  enum class What { kAdded, kRemoved, kChanged };
  What what;
  Json::Value entry;
  std::string folder;
};

/// "music", "photo" and "video", those that are to be switched.
using KindFlags = std::map<std::string, bool>;

/// Reads, changes and applies the configuration with the data folder's "lock" held. Everything
/// throws std::runtime_error.
class FolderEdit {
 public:
  /// Applying gives folders up that are not there, which would empty the index of a disk that is
  /// merely away: refused here, naming the folder, unless they shall be dropped.
  FolderEdit(const DataFolder& data, bool drop_missing);

  /// Adds a folder, as real_folder gives it; kinds that are not named are off.
  void add(const std::string& folder, const std::string& name, const KindFlags& kinds);
  void set(const std::string& named, const KindFlags& kinds);
  void remove(const std::string& named);

  /// What applying will do, in the order in which it is done.
  std::vector<FolderChange> changes() const;
  /// Saves the configuration and has the folders concerned indexed again; the database has to be
  /// reachable by the programs that are run for it.
  void apply();

 private:
  /// The configured folder that is meant, as a path or through links.
  std::string find(const std::string& named) const;
  Json::Value new_entries() const;

  const DataFolder& data_;
  SettingsLock lock_;
  ShareFile share_file_;
  std::vector<ConfiguredFolder> before_;
  std::vector<ConfiguredFolder> after_;
};

}  // namespace mediidx::tool

#endif
