// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/volume_id.h"

#include <sys/stat.h>
#include <sys/statfs.h>
#include <sys/sysmacros.h>

#include <array>
#include <bit>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <map>
#include <sstream>

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

/// Device number to UUID, as udev's links tell.
std::map<dev_t, std::string> read_uuids() {
  std::map<dev_t, std::string> uuids;
  std::error_code ignored;
  for (const auto& entry : fs::directory_iterator("/dev/disk/by-uuid", ignored)) {
    struct stat status{};
    if (stat(entry.path().c_str(), &status) == 0 && S_ISBLK(status.st_mode)) {
      uuids[status.st_rdev] = entry.path().filename().string();
    }
  }
  return uuids;
}

/// The block device behind a file's device number where the two differ, as for subvolumes.
dev_t mounted_device(dev_t number) {
  const auto wanted = std::to_string(major(number)) + ":" + std::to_string(minor(number));
  std::ifstream table("/proc/self/mountinfo");
  for (std::string line; std::getline(table, line);) {
    std::istringstream words(line);
    std::string word;
    words >> word >> word >> word;
    if (word != wanted) continue;
    while (words >> word && word != "-") {
    }
    words >> word >> word;
    struct stat status{};
    if (stat(word.c_str(), &status) == 0 && S_ISBLK(status.st_mode)) return status.st_rdev;
  }
  return number;
}

std::string find_id(const std::string& path, dev_t device) {
  static const auto uuids = read_uuids();
  for (const auto number : {device, mounted_device(device)}) {
    if (const auto found = uuids.find(number); found != uuids.end()) return found->second;
  }
  std::array<char, 64> text;
  struct statfs status{};
  static_assert(sizeof(status.f_fsid) == sizeof(std::uint64_t));
  const bool known = statfs(path.c_str(), &status) == 0;
  if (const auto id = std::bit_cast<std::uint64_t>(status.f_fsid); known && id != 0) {
    std::snprintf(text.data(), text.size(), "fsid-%016llx", static_cast<unsigned long long>(id));
  } else {
    std::snprintf(text.data(), text.size(), "dev-%u:%u", major(device), minor(device));
  }
  return text.data();
}

}  // namespace

std::string volume_id(const std::string& path) {
  static std::map<dev_t, std::string> known;
  struct stat status{};
  if (stat(path.c_str(), &status) != 0) return {};
  auto& id = known[status.st_dev];
  if (id.empty()) id = find_id(path, status.st_dev);
  return id;
}

}  // namespace mediidx::tool
