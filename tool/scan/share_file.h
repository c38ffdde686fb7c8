// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The file that says which shares there are.
#ifndef MEDIIDX_TOOL_SCAN_SHARE_FILE_H_
#define MEDIIDX_TOOL_SCAN_SHARE_FILE_H_

#include <json/value.h>

#include <filesystem>
#include <string>

#include "scan/share_names.h"

namespace mediidx::tool {

/// The share file below a root: read, changed, and written where it changed. What it holds beside
/// names and folders is kept. Edited with the data folder's "lock" held.
class ShareFile {
 public:
  /// Throws std::runtime_error for a file that cannot be understood; a missing one has no shares.
  explicit ShareFile(const std::filesystem::path& root);

  const Shares& shares() const { return shares_; }
  /// True for shares that are marked as holding an index folder.
  bool is_indexed(const std::string& name) const;
  void add(const std::string& name, const std::string& folder, bool indexed);
  void remove(const std::string& name);
  /// The folder as entries of the configuration name it; in a new share when none holds it.
  std::string path_of(const std::string& folder);
  /// Replaces the file as a whole. Throws std::runtime_error.
  void save();

 private:
  std::filesystem::path file_;
  Json::Value top_;
  Shares shares_;
  bool is_changed_ = false;
};

}  // namespace mediidx::tool

#endif
