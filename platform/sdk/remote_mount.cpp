// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <border.h>
#include <descriptor.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <tavosdk.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <charconv>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "mount_table.h"

namespace mediidx::platform {

namespace {

std::string read_whole(const std::string& path) {
  std::string text;
  const Descriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC));
  std::array<char, 16384> piece;
  while (file) {
    const ssize_t count = read(file.get(), piece.data(), piece.size());
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) break;
    text.append(piece.data(), static_cast<std::size_t>(count));
  }
  return text;
}

/// The number of the file's mount that no other mount ever gets; none before Linux 6.8, and where
/// there is no such file. Does not ask the server of a network mount.
std::optional<std::uint64_t> unique_mount(int folder, const char* path, int flags) {
  constexpr unsigned kMountIdUnique = 0x4000;  // STATX_MNT_ID_UNIQUE, which Debian 12 does not name
  struct statx status;
  const int how = flags | AT_NO_AUTOMOUNT | AT_STATX_DONT_SYNC;
  if (statx(folder, path, how, kMountIdUnique, &status) != 0) return std::nullopt;
  if (!(status.stx_mask & kMountIdUnique)) return std::nullopt;
  return status.stx_mnt_id;
}

/// The type of the mount that an open file is on, as the mount list has it; empty when it is not
/// listed. The mount list goes by numbers that are given again.
std::string mount_type(const Descriptor& file) {
  constexpr std::string_view kKey = "mnt_id:\t";
  const auto info = read_whole("/proc/self/fdinfo/" + std::to_string(file.get()));
  const auto key = info.find(kKey);
  if (key == info.npos) return {};
  const char* number = info.data() + key + kKey.size();
  int id = 0;
  if (std::from_chars(number, info.data() + info.size(), id).ec != std::errc()) return {};
  return std::string(find_mount_type(read_whole("/proc/self/mountinfo"), id));
}

RemoteMounts& known_mounts() {
  static auto& known = *new RemoteMounts;
  return known;
}

/// Nothing when there is no such path, or none that can be reached.
std::optional<bool> is_remote(const char* path) {
  auto& known = known_mounts();
  if (const auto remote = known.find(unique_mount(AT_FDCWD, path, 0))) return remote;
  // Held open, so that number and type are those of one mount.
  const Descriptor file(open(path, O_PATH | O_CLOEXEC));
  if (!file) return std::nullopt;
  return known.learn(unique_mount(file.get(), "", AT_EMPTY_PATH), mount_type(file));
}

/// By the path or, where it does not exist or cannot be reached (a network mount whose server is
/// gone), the nearest folder above.
bool is_existing_remote(std::string path) {
  for (;;) {
    if (const auto answer = is_remote(path.c_str())) return *answer;
    if (path.size() == 1) return false;
    path.resize(std::max<std::size_t>(path.rfind('/'), 1));
  }
}

}  // namespace

}  // namespace mediidx::platform

extern "C" int IndexIsPathRemoteMount(const char* path) {
  namespace platform = mediidx::platform;
  if (!path || *path != '/') return 0;
  return platform::no_throw(0, "remote_mount.cpp", 1,
                            [&] { return platform::is_existing_remote(path) ? 1 : 0; });
}
