// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Whether what the scan believes of the index is so.
#ifndef MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_SCAN_CLAIMS_H_
#define MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_SCAN_CLAIMS_H_

#include <filesystem>
#include <string>
#include <vector>

#include "database.h"

namespace mediidx::test {

/// Files and folders that the scan would leave alone though the library's tables do not hold them
/// as it knows them.
std::vector<std::string> false_claims(
    const std::filesystem::path& server = TestServer::get().socket_folder());

}  // namespace mediidx::test

#endif
