// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The file system that holds a file.
#ifndef MEDIIDX_TOOL_TAGS_VOLUME_ID_H_
#define MEDIIDX_TOOL_TAGS_VOLUME_ID_H_

#include <string>

namespace mediidx::tool {

/// A name for the file system of a path that stays the same when it is mounted elsewhere: the UUID
/// that /dev/disk/by-uuid gives its device (found by device number, or through the mount table
/// where files carry another number than their device); otherwise "fsid-" and the file system's own
/// id; otherwise "dev-" and the device number. Empty when the path cannot be looked at. Answers are
/// kept for the life of the process.
std::string volume_id(const std::string& path);

}  // namespace mediidx::tool

#endif
