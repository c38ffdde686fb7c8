// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Small configuration files, read whole.
#ifndef TAVOCORE_WHOLE_FILE_H_
#define TAVOCORE_WHOLE_FILE_H_

#include <cstddef>
#include <optional>
#include <string>

namespace mediidx::platform {

/// What a regular file holds. Empty when it cannot be opened or read, is no regular file (a FIFO
/// would wait for ever) or is larger than `limit`.
std::optional<std::string> read_whole_file(const char* path,
                                           std::size_t limit = std::size_t{64} << 20);

}  // namespace mediidx::platform

#endif
