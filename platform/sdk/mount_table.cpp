// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mount_table.h"

#include <algorithm>
#include <array>
#include <charconv>

namespace mediidx::platform {

namespace {

// Sorted. FUSE programs that show local disks (ntfs-3g, mergerfs, bindfs, exfat) are not among
// them.
constexpr std::array<std::string_view, 41> kRemoteTypes{
    "9p",
    "afs",
    "beegfs",
    "ceph",
    "cifs",
    "coda",
    "davfs",
    "davfs2",
    "fuse.afpfs",
    "fuse.ceph",
    "fuse.ceph-fuse",
    "fuse.cifs",
    "fuse.curlftpfs",
    "fuse.davfs",
    "fuse.davfs2",
    "fuse.fuse-nfs",
    "fuse.gcsfuse",
    "fuse.glusterfs",
    "fuse.goofys",
    "fuse.gvfsd-fuse",
    "fuse.juicefs",
    "fuse.mfs",
    "fuse.mfsmount",
    "fuse.rclone",
    "fuse.s3fs",
    "fuse.seaweedfs",
    "fuse.smbnetfs",
    "fuse.sshfs",
    "fuse.wdfs",
    "glusterfs",
    "gpfs",
    "lustre",
    "ncp",
    "ncpfs",
    "nfs",
    "nfs4",
    "orangefs",
    "panfs",
    "pvfs2",
    "smb3",
    "smbfs",
};
static_assert(std::ranges::is_sorted(kRemoteTypes));

std::string_view next_word(std::string_view& line) {
  const auto word = line.substr(0, line.find(' '));
  line.remove_prefix(std::min(line.size(), word.size() + 1));
  return word;
}

bool is_number(std::string_view word, int number) {
  int read_number = 0;
  const auto read = std::from_chars(word.data(), word.data() + word.size(), read_number);
  return read.ec == std::errc() && read.ptr == word.data() + word.size() && read_number == number;
}

// id parent device root point options [optional…] - type source options
std::string_view type_in(std::string_view line) {
  while (!line.empty() && next_word(line) != "-") {
  }
  return next_word(line);
}

}  // namespace

std::string_view find_mount_type(std::string_view mountinfo, int id) {
  while (!mountinfo.empty()) {
    auto line = mountinfo.substr(0, mountinfo.find('\n'));
    mountinfo.remove_prefix(std::min(mountinfo.size(), line.size() + 1));
    if (is_number(next_word(line), id)) return type_in(line);
  }
  return {};
}

bool is_remote_type(std::string_view type) {
  return std::ranges::binary_search(kRemoteTypes, type);
}

std::optional<bool> RemoteMounts::find(std::optional<std::uint64_t> mount) const {
  if (!mount) return std::nullopt;
  const auto known = remote_.find(*mount);
  return known == remote_.end() ? std::nullopt : std::optional(known->second);
}

bool RemoteMounts::learn(std::optional<std::uint64_t> mount, std::string_view type) {
  const bool remote = is_remote_type(type);
  if (!mount || type.empty()) return remote;
  if (remote_.size() >= kMostMounts) remote_.clear();
  remote_[*mount] = remote;
  return remote;
}

}  // namespace mediidx::platform
