// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The mounts of this process, as /proc/self/mountinfo lists them.
#ifndef TAVOSDK_MOUNT_TABLE_H_
#define TAVOSDK_MOUNT_TABLE_H_

#include <string>
#include <string_view>
#include <vector>

namespace mediidx::platform {

struct Mount {
  int id = 0;
  int parent = 0;
  std::string point;  ///< Where it is mounted, escapes undone.
  std::string type;   ///< "ext4", "nfs4", "fuse.sshfs"
};

/// Reads a mount list; lines that are none are passed over.
std::vector<Mount> parse_mounts(std::string_view mountinfo);

/// The mount that an absolute, resolved path lies on: from the root each mount that is mounted on
/// the one before is entered, as the kernel walks, so that what a later mount hides does not count.
/// Null when none holds the path.
const Mount* find_mount(const std::vector<Mount>& mounts, std::string_view path);

/// Whether files of this type of file system come over a network.
bool is_remote_type(std::string_view type);

/// Whether a resolved path lies on a network mount of that mount list.
bool is_remote(std::string_view mountinfo, std::string_view path);

}  // namespace mediidx::platform

#endif
