// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The marker file by which other programs learn that music or video rows changed.
#include <tavocore.h>

#include <cstdio>

#include "mediidx/database.h"
#include "support/log.h"
#include "support/no_throw.h"
#include "support/root.h"

namespace {

/// Music and video share one marker.
int set_marker() {
  return mediidx::no_throw(mediidx::kPlaylistLog, 0, [] {
    return TAVOIndexTableDirtySet(mediidx::below_root(mediidx::kTableMarkerPath).c_str());
  });
}

}  // namespace

extern "C" int TAVOIndexTableDirtySet(const char* markerPath) {
  if (!markerPath) return 0;
  if (const int exists = IsFileExist(markerPath, 0)) return exists;
  std::FILE* marker = fopen64(markerPath, "w");
  return marker ? std::fclose(marker) : 0;
}

extern "C" int TAVOIndexMusicTableDirtySet(int /*flag*/) { return set_marker(); }
extern "C" int TAVOIndexVideoTableDirtySet(int /*flag*/) { return set_marker(); }
