// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// One file into the index once more.
#ifndef MEDIIDX_TOOL_EXPLAIN_SAVE_AGAIN_H_
#define MEDIIDX_TOOL_EXPLAIN_SAVE_AGAIN_H_

#include <string>

#include "store/database.h"
#include "tags/media_file.h"

namespace mediidx::tool {

/// Reads a file's tags anew and has the library replace its rows, those of a cue sheet's tracks and
/// the song's ratings too. A path that does not belong in the index is left alone. Throws
/// std::runtime_error with the reason.
void save_again(const Database& database, const std::string& path, Kind kind);

}  // namespace mediidx::tool

#endif
