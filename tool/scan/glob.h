// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Patterns of paths as git writes them.
#ifndef MEDIIDX_TOOL_SCAN_GLOB_H_
#define MEDIIDX_TOOL_SCAN_GLOB_H_

#include <optional>
#include <string>
#include <string_view>

namespace mediidx::tool {

/// The pattern as a regular expression over bytes: "*", "?" and "[…]" stay within one name, "**"
/// between slashes stands for any folders, a backslash for itself. Empty when the pattern can match
/// nothing, such as one with an open class.
std::optional<std::string> regex_of_glob(std::string_view glob);

}  // namespace mediidx::tool

#endif
