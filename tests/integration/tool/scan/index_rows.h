// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Everything that the library's tables hold, ids aside.
#ifndef MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_INDEX_ROWS_H_
#define MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_INDEX_ROWS_H_

#include <filesystem>
#include <map>
#include <set>
#include <string>

#include "database.h"

namespace mediidx::test {

/// By table: its rows as JSON, a line each, sorted. A row that belongs to a track names the track
/// by its user, path, kind and number.
std::map<std::string, std::string> index_rows(
    const std::filesystem::path& server = TestServer::get().socket_folder());

/// What the index holds at and below a folder, "" for all, as "table path".
std::multiset<std::string> rows_below(
    const std::string& folder,
    const std::filesystem::path& server = TestServer::get().socket_folder());
/// Whether a row at or below the folder is online.
bool any_online(const std::string& folder);

}  // namespace mediidx::test

#endif
