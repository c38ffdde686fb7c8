// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Replacing a file's content so that a reader sees the old one or the new one, never a part.
#ifndef TAVOCORE_REPLACE_FILE_H_
#define TAVOCORE_REPLACE_FILE_H_

#include <string>
#include <string_view>

namespace mediidx::platform {

/// Writes a temporary file beside the existing file (beside what a link leads to), flushes it and
/// renames it over the file. Mode is kept, and the owner where that is allowed. On failure nothing
/// has changed.
bool replace_file(const std::string& path, std::string_view content);

}  // namespace mediidx::platform

#endif
