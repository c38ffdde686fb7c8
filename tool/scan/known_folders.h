// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The folders that the library knows as indexed: shares and index-folder entries.
#ifndef MEDIIDX_TOOL_SCAN_KNOWN_FOLDERS_H_
#define MEDIIDX_TOOL_SCAN_KNOWN_FOLDERS_H_

#include <filesystem>
#include <string>
#include <vector>

#include "store/data_folder.h"

namespace mediidx::tool {

/// The real absolute path of a folder that can be indexed. Throws std::runtime_error for anything
/// else, with a message that names the folder: missing, no folder, "/", on a network mount (which
/// the library never indexes), or not to be stored as text.
std::string real_folder(const std::string& named);

/// Throws std::exception when the file holds anything but a list: to the library it is an empty
/// one, and changing that would overwrite what is there.
void check_configuration(const std::filesystem::path& root);

/// Makes folders (as real_folder gives them) known and loads the configuration: each lies in a
/// share, a new one when no share holds it, and has an entry with every kind of media switched on.
/// What is known already is left as it is, but for kinds that are switched off. Throws
/// std::runtime_error when the settings cannot be read or written.
void make_known(const DataFolder& data, const std::vector<std::string>& folders);

}  // namespace mediidx::tool

#endif
