// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/file_operand.h"

#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>

#include "text/utf8.h"

namespace mediidx::tool {

std::string readable_file(const std::string& named) {
  if (named.empty()) throw std::runtime_error("an empty path names nothing");
  const auto path = std::filesystem::absolute(named).lexically_normal().string();
  if (std::filesystem::is_directory(path)) {
    throw std::runtime_error(escape_for_display(path) + " is a folder");
  }
  if (access(path.c_str(), R_OK) != 0) {
    throw std::runtime_error(escape_for_display(path) + ": " + std::strerror(errno));
  }
  return path;
}

std::runtime_error no_such_kind(const std::string& file, const std::string& kind) {
  return std::runtime_error(escape_for_display(file) + " is no " + kind + ", by its name");
}

}  // namespace mediidx::tool
