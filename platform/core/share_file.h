// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The share file: a JSON object from a share's name to {"path": folder, "status": flags}.
#ifndef TAVOCORE_SHARE_FILE_H_
#define TAVOCORE_SHARE_FILE_H_

#include <tavocore.h>

#include <string_view>
#include <vector>

namespace mediidx::platform {

/// The shares of the file. Empty when it is missing, cannot be read or is no JSON object; entries
/// without a name and an absolute folder that fit their fields, or with wrong types, are not there.
/// Folders lose their trailing slashes.
std::vector<TAVOSHARE> read_shares();

/// Writes folder and flags of a share that the file holds, everything else in it kept; the file is
/// replaced at once or not at all. False, with the platform error set, when that fails.
bool write_share(const TAVOSHARE& share);

}  // namespace mediidx::platform

#endif
