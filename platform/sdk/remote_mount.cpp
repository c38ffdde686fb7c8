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
  for (std::size_t end = path.size();;) {
    const std::string existing = end == 0 ? "/" : path.substr(0, end);
    const std::unique_ptr<char, decltype(&std::free)> resolved(realpath(existing.c_str(), nullptr),
                                                               std::free);
    if (resolved) return (existing == "/" ? "" : resolved.get()) + path.substr(end);
    const auto slash = end == 0 ? std::string::npos : path.rfind('/', end - 1);
    if (slash == std::string::npos) return path;
    end = slash;
  }
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
