// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "whole_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cerrno>

#include "descriptor.h"

namespace mediidx::platform {

std::optional<std::string> read_whole_file(const char* path, std::size_t limit) {
  const Descriptor file(open(path, O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY));
  struct stat info{};
  if (!file || fstat(file.get(), &info) != 0 || !S_ISREG(info.st_mode)) return std::nullopt;
  if (static_cast<std::size_t>(info.st_size) > limit) return std::nullopt;
  std::string content;
  std::array<char, 8192> piece;
  for (;;) {
    const ssize_t count = read(file.get(), piece.data(), piece.size());
    if (count == 0) return content;
    if (count < 0 && errno == EINTR) continue;
    if (count < 0 || content.size() + static_cast<std::size_t>(count) > limit) return std::nullopt;
    content.append(piece.data(), static_cast<std::size_t>(count));
  }
}

}  // namespace mediidx::platform
