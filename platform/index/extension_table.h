// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Kinds of media files by extension.
#ifndef TAVOINDEX_EXTENSION_TABLE_H_
#define TAVOINDEX_EXTENSION_TABLE_H_

#include <algorithm>
#include <array>
#include <span>
#include <string_view>

namespace mediidx::platform {

/// Lower case, sorted.
using ExtensionTable = std::span<const std::string_view>;

constexpr std::size_t kLongestExtension = 8;

inline constexpr auto kMusicExtensions = std::to_array<std::string_view>({
    "3ga", "aac",  "ac3",  "aif", "aifc", "aiff", "alac", "amr", "ape", "au",  "dff",
    "dsf", "dts",  "flac", "m4a", "m4b",  "m4r",  "mka",  "mp2", "mp3", "mpc", "oga",
    "ogg", "opus", "ra",   "spx", "tak",  "tta",  "wav",  "wma", "wv",
});

inline constexpr auto kPhotoExtensions = std::to_array<std::string_view>({
    "3fr",  "arw", "avif", "bmp", "cr2", "cr3", "crw", "dcr", "dng",  "erf",  "gif", "heic",
    "heif", "jpe", "jpeg", "jpg", "kdc", "mef", "mos", "mrw", "nef",  "nrw",  "orf", "pef",
    "png",  "raf", "raw",  "rw2", "sr2", "srf", "srw", "tif", "tiff", "webp", "x3f",
});

inline constexpr auto kPlaylistExtensions =
    std::to_array<std::string_view>({"cue", "m3u", "m3u8", "pls", "wpl"});

inline constexpr auto kVideoExtensions = std::to_array<std::string_view>({
    "3g2", "3gp", "asf",  "avi", "divx", "f4v", "flv",  "m1v",  "m2t", "m2ts",
    "m2v", "m4v", "mkv",  "mov", "mp4",  "mpe", "mpeg", "mpg",  "mts", "ogv",
    "qt",  "rm",  "rmvb", "tp",  "trp",  "ts",  "vob",  "webm", "wmv", "xvid",
});

static_assert(std::ranges::is_sorted(kMusicExtensions));
static_assert(std::ranges::is_sorted(kPhotoExtensions));
static_assert(std::ranges::is_sorted(kPlaylistExtensions));
static_assert(std::ranges::is_sorted(kVideoExtensions));

/// Whether the extension, in any case, stands in the table.
constexpr bool has_extension(ExtensionTable table, std::string_view extension) {
  if (extension.size() > kLongestExtension) return false;
  std::array<char, kLongestExtension> folded{};
  std::ranges::transform(extension, folded.begin(), [](char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
  });
  return std::ranges::binary_search(table, std::string_view(folded.data(), extension.size()));
}

}  // namespace mediidx::platform

#endif
