// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Shares as names and folders.
#ifndef MEDIIDX_TOOL_SCAN_SHARE_NAMES_H_
#define MEDIIDX_TOOL_SCAN_SHARE_NAMES_H_

#include <map>
#include <optional>
#include <string>

namespace mediidx::tool {

/// Share name to absolute folder, without a trailing slash.
using Shares = std::map<std::string, std::string>;

/// The folder as an index-folder entry names it, "/share" or "/share/sub", below the deepest share
/// that holds it; empty when none does.
std::optional<std::string> path_in_share(const Shares& shares, const std::string& folder);

/// A name for a share of this folder: its base name, with "-2", "-3" and so on where that is taken.
/// Names are looked up without regard to case, so they are told apart that way here. One path part,
/// short enough for a share's record.
std::string name_for_share(const Shares& shares, const std::string& folder);

}  // namespace mediidx::tool

#endif
