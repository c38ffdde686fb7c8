// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <border.h>
#include <share_file.h>
#include <tavosdk.h>
#include <utf8.h>

#include <algorithm>
#include <optional>
#include <string>
#include <string_view>

namespace mediidx::platform {

namespace {

std::optional<TAVOSHARE> find_share(const char* name) {
  const auto shares = read_shares();
  const auto exact = std::ranges::find_if(
      shares, [&](const TAVOSHARE& share) { return std::string_view(share.name) == name; });
  if (exact != shares.end()) return *exact;
  const auto like = std::ranges::find_if(shares, [&](const TAVOSHARE& share) {
    return TLIBCUnicodeUTF8StrCaseCmp(share.name, name) == 0;
  });
  if (like != shares.end()) return *like;
  return std::nullopt;
}

bool holds(std::string_view folder, std::string_view path) {
  return path.starts_with(folder) && (path.size() == folder.size() || path[folder.size()] == '/');
}

/// The folder of the deepest share that holds the path; empty when none does.
std::string share_folder_of(std::string_view path) {
  std::string deepest;
  for (const TAVOSHARE& share : read_shares()) {
    const std::string_view folder = share.path;
    if (folder.size() > deepest.size() && holds(folder, path)) deepest = folder;
  }
  return deepest;
}

/// What stands before a path's second slash; empty for "/" and for names directly behind slashes.
std::string_view first_part(std::string_view path) {
  const auto part = path.substr(0, path.find('/', 1));
  return part == "/" ? std::string_view() : part;
}

std::string volume_root(std::string_view path) {
  if (!path.starts_with('/')) return {};
  const auto share = share_folder_of(path);
  return share.empty() ? std::string(first_part(path)) : share.substr(0, share.rfind('/'));
}

}  // namespace

}  // namespace mediidx::platform

namespace platform = mediidx::platform;

extern "C" int TAVOShareGet(const char* name, TAVOSHARE** share) {
  if (!name || !share) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "share.cpp", 101);
  *share = nullptr;
  return platform::no_throw(-1, "share.cpp", 102, [&] {
    const auto found = platform::find_share(name);
    if (!found) return platform::failed(-1, TAVO_ERR_SHARE_NOT_FOUND, "share.cpp", 103);
    *share = new TAVOSHARE(*found);
    return 0;
  });
}

extern "C" void TAVOShareFree(TAVOSHARE* share) { delete share; }

extern "C" int TAVOShareBinPathGet(const char* path, char* buffer, int size) {
  if (!path || !buffer || size < 1) {
    return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "share.cpp", 104);
  }
  return platform::no_throw(-1, "share.cpp", 105, [&] {
    const auto root = platform::volume_root(path);
    const bool written =
        !root.empty() && platform::copy_whole({buffer, static_cast<std::size_t>(size)}, root);
    return written ? 0 : platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "share.cpp", 106);
  });
}

extern "C" int ShareIndexStatusClear(const char* name) {
  if (!name) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "share.cpp", 107);
  return platform::no_throw(-1, "share.cpp", 108, [&] {
    auto share = platform::find_share(name);
    if (!share) return platform::failed(-1, TAVO_ERR_SHARE_NOT_FOUND, "share.cpp", 109);
    share->status &= ~static_cast<uint32_t>(TAVOSHARE_STATUS_INDEXED);
    return TLIBShareUpdate(&*share);
  });
}
