// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavoindex.h>

#include <cstring>
#include <string_view>

#include "extension_table.h"

namespace {

namespace platform = mediidx::platform;

int is_of(platform::ExtensionTable table, const char* extension) {
  return extension && platform::has_extension(table, extension) ? 1 : 0;
}

}  // namespace

extern "C" const char* TAVOIndexExtGet(const char* path) {
  if (!path) return nullptr;
  const char* slash = std::strrchr(path, '/');
  const char* name = slash ? slash + 1 : path;
  const char* dot = std::strrchr(name, '.');
  return dot && dot != name && dot[1] != '\0' ? dot + 1 : nullptr;
}

extern "C" int BlTAVOIndexIsMusic(const char* extension) {
  return is_of(platform::kMusicExtensions, extension);
}

extern "C" int BlTAVOIndexIsPhoto(const char* extension) {
  return is_of(platform::kPhotoExtensions, extension);
}

extern "C" int BlTAVOIndexIsVideo(const char* extension) {
  return is_of(platform::kVideoExtensions, extension);
}

extern "C" int BlTAVOIndexIsPlaylist(const char* extension) {
  return is_of(platform::kPlaylistExtensions, extension);
}

extern "C" int BlTAVOIndexIsMusicFile(const char* path) {
  return BlTAVOIndexIsMusic(TAVOIndexExtGet(path));
}
