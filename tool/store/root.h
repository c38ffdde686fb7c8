// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Where code that the command shares with the library looks for the system's files.
#ifndef MEDIIDX_TOOL_STORE_ROOT_H_
#define MEDIIDX_TOOL_STORE_ROOT_H_

#include <string>

namespace mediidx::tool {

/// From now on mediidx::below_root gives paths below this folder.
void set_own_root(const std::string& root);

}  // namespace mediidx::tool

#endif
