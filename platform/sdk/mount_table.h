// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The types of the file systems that are mounted.
#ifndef TAVOSDK_MOUNT_TABLE_H_
#define TAVOSDK_MOUNT_TABLE_H_

#include <cstdint>
#include <optional>
#include <string_view>
#include <unordered_map>

namespace mediidx::platform {

/// The type ("ext4", "nfs4", "fuse.sshfs") of the mount with this id in a list such as
/// /proc/self/mountinfo; empty when it is not there.
std::string_view find_mount_type(std::string_view mountinfo, int id);

/// Whether files of this type of file system come over a network.
bool is_remote_type(std::string_view type);

/// Which mounts are remote, by the unique number of each. A mount keeps its type for as long as it
/// is there, and its number is never given again: nothing that is known grows old.
class RemoteMounts {
 public:
  /// Nothing for one that is not known yet, or has no unique number.
  std::optional<bool> find(std::optional<std::uint64_t> mount) const;
  /// Whether a mount of this type is remote. One without a type, which was just unmounted, is not
  /// remembered.
  bool learn(std::optional<std::uint64_t> mount, std::string_view type);

 private:
  static constexpr std::size_t kMostMounts = 1000;
  std::unordered_map<std::uint64_t, bool> remote_;
};

}  // namespace mediidx::platform

#endif
