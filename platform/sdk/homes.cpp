// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "homes.h"

#include <algorithm>
#include <cstdlib>
#include <memory>

namespace mediidx::platform {

namespace {

std::string_view without_trailing_slashes(std::string_view path) {
  while (path.size() > 1 && path.ends_with('/')) path.remove_suffix(1);
  return path;
}

std::string resolve(const std::string& folder) {
  const std::unique_ptr<char, decltype(&std::free)> path(realpath(folder.c_str(), nullptr),
                                                         std::free);
  return path ? path.get() : "";
}

/// Length of the folder when it is the path or holds it, else 0.
std::size_t depth(std::string_view folder, std::string_view path) {
  // A home that leads to "/" would hold every file of the system.
  if (folder.size() < 2 || !path.starts_with(folder)) return 0;
  return path.size() == folder.size() || path[folder.size()] == '/' ? folder.size() : 0;
}

}  // namespace

bool is_real_user(const User& user) {
  constexpr std::uint32_t kFirstRealUser = 1000;
  constexpr std::uint32_t kNobody = 65534;
  return user.uid >= kFirstRealUser && user.uid != kNobody && user.home.starts_with('/') &&
         without_trailing_slashes(user.home) != "/";
}

std::vector<Home> homes_of(std::span<const User> users) {
  std::vector<Home> homes;
  for (const User& user : users) {
    if (!is_real_user(user)) continue;
    std::string folder(without_trailing_slashes(user.home));
    std::string resolved = resolve(folder);
    homes.push_back({user.name, std::move(folder), std::move(resolved)});
  }
  return homes;
}

const Home* find_home(std::span<const Home> homes, std::string_view path) {
  const Home* deepest = nullptr;
  std::size_t deepest_depth = 0;
  for (const Home& home : homes) {
    const auto reached = std::max(depth(home.folder, path), depth(home.resolved, path));
    if (reached <= deepest_depth) continue;
    deepest = &home;
    deepest_depth = reached;
  }
  return deepest;
}

}  // namespace mediidx::platform
