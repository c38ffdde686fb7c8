// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mount_table.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <optional>

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

std::optional<int> parse_id(std::string_view word) {
  int id = 0;
  const auto read = std::from_chars(word.data(), word.data() + word.size(), id);
  const bool whole = read.ec == std::errc() && read.ptr == word.data() + word.size();
  return whole ? std::optional(id) : std::nullopt;
}

bool is_octal(char c) { return c >= '0' && c <= '7'; }

/// Undoes the kernel's "\040" for blanks, tabs, line ends and backslashes.
std::string unescaped(std::string_view word) {
  std::string text;
  for (std::size_t at = 0; at < word.size(); ++at) {
    const auto code = word.substr(at, 4);
    if (code.size() == 4 && code[0] == '\\' && std::ranges::all_of(code.substr(1), is_octal)) {
      text += static_cast<char>((code[1] - '0') * 64 + (code[2] - '0') * 8 + (code[3] - '0'));
      at += 3;
    } else {
      text += word[at];
    }
  }
  return text;
}

// id parent device root point options [optional…] - type source options
std::optional<Mount> parse_mount(std::string_view line) {
  const auto id = parse_id(next_word(line));
  const auto parent = parse_id(next_word(line));
  next_word(line);
  next_word(line);
  Mount mount;
  mount.point = unescaped(next_word(line));
  next_word(line);
  while (!line.empty() && next_word(line) != "-") {
  }
  mount.type = next_word(line);
  if (!id || !parent || !mount.point.starts_with('/') || mount.type.empty()) return std::nullopt;
  mount.id = *id;
  mount.parent = *parent;
  return mount;
}

bool holds(std::string_view point, std::string_view path) {
  if (point == "/") return path.starts_with('/');
  return path.starts_with(point) && (path.size() == point.size() || path[point.size()] == '/');
}

/// Whether `mount` hangs below `above`, or, with null, below nothing in the list.
bool is_child(const std::vector<Mount>& mounts, const Mount& mount, const Mount* above) {
  if (above) return mount.parent == above->id && mount.id != above->id;
  return mount.parent == mount.id ||
         std::ranges::find(mounts, mount.parent, &Mount::id) == mounts.end();
}

/// Of the mounts on `above` the first that a walk along the path enters; among equals the last.
const Mount* next_on_the_way(const std::vector<Mount>& mounts, const Mount* above,
                             std::string_view path) {
  const Mount* next = nullptr;
  for (const Mount& mount : mounts) {
    if (!holds(mount.point, path) || !is_child(mounts, mount, above)) continue;
    if (!next || mount.point.size() <= next->point.size()) next = &mount;
  }
  return next;
}

}  // namespace

std::vector<Mount> parse_mounts(std::string_view mountinfo) {
  std::vector<Mount> mounts;
  while (!mountinfo.empty()) {
    const auto line = mountinfo.substr(0, mountinfo.find('\n'));
    mountinfo.remove_prefix(std::min(mountinfo.size(), line.size() + 1));
    if (auto mount = parse_mount(line)) mounts.push_back(std::move(*mount));
  }
  return mounts;
}

const Mount* find_mount(const std::vector<Mount>& mounts, std::string_view path) {
  const Mount* reached = nullptr;
  // Each step enters another mount; a list that runs in circles ends with its length.
  for (std::size_t step = 0; step < mounts.size(); ++step) {
    const Mount* next = next_on_the_way(mounts, reached, path);
    if (!next) break;
    reached = next;
  }
  return reached;
}

bool is_remote_type(std::string_view type) {
  return std::ranges::binary_search(kRemoteTypes, type);
}

bool is_remote(std::string_view mountinfo, std::string_view path) {
  const auto mounts = parse_mounts(mountinfo);
  const Mount* mount = find_mount(mounts, path);
  return mount && is_remote_type(mount->type);
}

}  // namespace mediidx::platform
