// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Files named on the command line.
#ifndef MEDIIDX_TOOL_CLI_FILE_OPERAND_H_
#define MEDIIDX_TOOL_CLI_FILE_OPERAND_H_

#include <stdexcept>
#include <string>

namespace mediidx::tool {

/// The absolute path of a file that can be read. Throws std::runtime_error for anything else.
std::string readable_file(const std::string& named);

/// The complaint about a file whose name does not end as such a file's does.
std::runtime_error no_such_kind(const std::string& file, const std::string& kind);

}  // namespace mediidx::tool

#endif
