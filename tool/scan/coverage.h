// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the library wants of a folder.
#ifndef MEDIIDX_TOOL_SCAN_COVERAGE_H_
#define MEDIIDX_TOOL_SCAN_COVERAGE_H_

#include <array>
#include <string>
#include <vector>

#include "tags/media_file.h"

namespace mediidx::tool {

/// Files of one folder are wanted by their kind alone, so that the library is asked once a folder.
struct Coverage {
  std::array<bool, kKinds> kinds{};
  bool folder = false;
  bool personal = false;  ///< In a user's own library.

  bool wants(Kind kind) const { return kinds[static_cast<std::size_t>(kind)]; }
};

Coverage coverage_of(const std::string& folder);

/// True for the folder itself too.
bool is_below(const std::string& path, const std::string& folder);

/// The index folders that lie in no other one: where a scan begins.
std::vector<std::string> outermost_index_folders();

}  // namespace mediidx::tool

#endif
