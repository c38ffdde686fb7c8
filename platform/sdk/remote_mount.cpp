// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <border.h>
#include <descriptor.h>
#include <fcntl.h>
#include <tavosdk.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdlib>
#include <memory>
#include <string>
#include <string_view>

#include "mount_table.h"

namespace mediidx::platform {

namespace {

/// Read anew for each question: mounts come and go, and a descriptor kept open to watch the list
/// would be closed, and its number given away, under a program that turns itself into a daemon.
std::string read_mountinfo() {
  std::string text;
  const Descriptor file(open("/proc/self/mountinfo", O_RDONLY | O_CLOEXEC));
  std::array<char, 16384> piece;
  while (file) {
    const ssize_t count = read(file.get(), piece.data(), piece.size());
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) break;
    text.append(piece.data(), static_cast<std::size_t>(count));
  }
  return text;
}

/// The path with links resolved as far as it exists. What does not exist, or cannot be reached (a
/// network mount whose server is gone), is kept as text behind it.
std::string resolve_existing(const std::string& path) {
  for (std::size_t end = path.size(); end > 0;) {
    const std::unique_ptr<char, decltype(&std::free)> resolved(
        realpath(path.substr(0, end).c_str(), nullptr), std::free);
    if (resolved) {
      const std::string_view folder = resolved.get();
      const auto rest = path.substr(end);
      return folder == "/" && !rest.empty() ? rest : std::string(folder) + rest;
    }
    end = path.rfind('/', end - 1);
  }
  return path;
}

}  // namespace

}  // namespace mediidx::platform

extern "C" int IndexIsPathRemoteMount(const char* path) {
  namespace platform = mediidx::platform;
  if (!path || *path != '/') return 0;
  return platform::no_throw(0, "remote_mount.cpp", 1, [&] {
    return platform::is_remote(platform::read_mountinfo(), platform::resolve_existing(path)) ? 1
                                                                                             : 0;
  });
}
