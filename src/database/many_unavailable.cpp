// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The appliance's own database library has no calls for many rows: everything is saved one by one.
#include "database/many.h"

namespace mediidx::many {

bool is_available() { return false; }

bool save_files(MEDIA_TABLE_TYPE /*type*/, std::span<File> /*files*/) { return false; }

bool save_folders(std::span<const DIR_INFO_REC* const> /*folders*/) { return false; }

std::optional<std::map<std::string, std::string>> find_durations(
    const std::set<std::string>& /*paths*/) {
  return std::nullopt;
}

}  // namespace mediidx::many
