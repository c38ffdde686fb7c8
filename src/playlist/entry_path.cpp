// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/entry_path.h"

#include <strings.h>
#include <unistd.h>

#include <algorithm>
#include <array>

#include "mediidx/record.h"
#include "support/root.h"

namespace mediidx {
namespace {

bool begins_without_case(std::string_view text, std::string_view prefix) {
  return text.size() >= prefix.size() &&
         strncasecmp(text.data(), prefix.data(), prefix.size()) == 0;
}

/// The text without its last "/" and what follows; the whole text when it has none.
std::string_view parent_folder(std::string_view path) {
  const auto slash = path.rfind('/');
  return slash == path.npos ? path : path.substr(0, slash);
}

/// "\\server\share\rest" gives "rest"; empty when a part is missing.
std::optional<std::string_view> below_network_share(std::string_view entry) {
  entry.remove_prefix(2);
  for (int part = 0; part < 2; ++part) {
    const auto end = entry.find('\\');
    if (end == entry.npos || end == 0) return std::nullopt;
    entry.remove_prefix(end + 1);
  }
  if (entry.empty()) return std::nullopt;
  return entry;
}

std::string below_folder(std::string_view entry, std::string_view folder) {
  if (entry.starts_with("./") || entry.starts_with(".\\")) entry.remove_prefix(2);
  while (entry.starts_with("../") || entry.starts_with("..\\")) {
    entry.remove_prefix(3);
    folder = parent_folder(folder);
  }
  return std::string(folder) + "/" + std::string(entry);
}

std::optional<std::string> locate(std::string_view entry, std::string_view playlist_path,
                                  const std::optional<std::string>& music_link) {
  if (entry.starts_with("/volumeUSB") || entry.starts_with("/volumeSATA") ||
      begins_without_case(entry, "http://")) {
    return std::string(entry);
  }
  if (entry.starts_with("\\\\")) {
    const auto rest = below_network_share(entry);
    if (!music_link || !rest) return std::nullopt;
    return *music_link + "/" + std::string(*rest);
  }
  if (entry.size() >= 3 && entry.substr(1, 2) == ":\\") {
    if (!music_link) return std::nullopt;
    return *music_link + "/" + std::string(entry.substr(3));
  }
  if (music_link && entry.starts_with(*music_link)) return std::string(entry);
  return below_folder(entry, parent_folder(playlist_path));
}

}  // namespace

std::optional<std::string> read_music_link() {
  std::array<char, MEDIIDX_PATH_SIZE> target;
  const auto length =
      readlink(below_root(kMusicLinkPath).c_str(), target.data(), target.size() - 1);
  if (length < 0) return std::nullopt;
  return std::string(target.data(), static_cast<std::size_t>(length));
}

bool begins_with_http(std::string_view entry) { return begins_without_case(entry, "http"); }

std::optional<std::string> resolve_entry(std::string_view entry, std::string_view playlist_path,
                                         const std::optional<std::string>& music_link) {
  auto path = locate(entry, playlist_path, music_link);
  if (!path || path->size() >= MEDIIDX_PATH_SIZE) return std::nullopt;
  std::ranges::replace(*path, '\\', '/');
  return path;
}

std::string join_entry(std::string_view entry, std::string_view playlist_path) {
  constexpr std::string_view kUp = "../";
  auto folder = parent_folder(playlist_path);
  if (const auto up = entry.find(kUp); up != entry.npos) {
    entry.remove_prefix(up);
    while (entry.starts_with(kUp)) {
      entry.remove_prefix(kUp.size());
      folder = parent_folder(folder);
    }
  }
  return std::string(folder) + "/" + std::string(entry);
}

}  // namespace mediidx
