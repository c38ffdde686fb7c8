// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The programs that the library starts when the configuration changes. They are the command itself
/// under other names, linked into "usr/tavo/bin" below the root.
///
///   tavoindex -A FOLDER -P MediaIndex   index a folder as far as it is chosen for indexing
///   tavoindex -D FOLDER -P MediaIndex   forget what a folder holds
///   tavoindex_mgr --check-indexbit      mark the shares that hold a folder chosen for indexing
#ifndef MEDIIDX_TOOL_FOLDERS_PROGRAMS_H_
#define MEDIIDX_TOOL_FOLDERS_PROGRAMS_H_

#include <string>
#include <vector>

namespace mediidx::tool {

/// Runs with the path that the program was started by, which tells its root and data folder, and
/// the words behind it; the exit status. Throws std::exception.
using Program = int (*)(const std::string& path, const std::vector<std::string>& words);

/// The program of this name, with or without folders before it; null for any other name.
Program program_named(const std::string& path);

}  // namespace mediidx::tool

#endif
