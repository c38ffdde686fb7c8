// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Paths as texts. A path's first separator is the first slash behind its leading character.
#include <string>
#include <utility>

#include "mediidx/index_folder.h"

namespace {

std::size_t first_separator(const std::string& path) { return path.find('/', 1); }

}  // namespace

std::string getShareName(std::string path) { return path.substr(1, first_separator(path) - 1); }

std::string getVolumePath(std::string path) {
  path.resize(std::min(path.size(), first_separator(path)));
  return path;
}

std::string getFolderPath(std::string path) {
  const auto separator = first_separator(path);
  return separator == std::string::npos ? std::string() : path.substr(separator + 1);
}

std::string appendPath(std::string first, std::string second) {
  if (second.empty()) return first;
  // Two slashes that meet get a third between them: callers know it so.
  if (first.ends_with('/') == second.starts_with('/')) first += '/';
  return std::move(first) + second;
}

bool IsEqualOrSubPath(const std::string& path, const std::string& parent) {
  if (!path.starts_with(parent)) return false;
  return path.size() == parent.size() || path[parent.size()] == '/';
}
