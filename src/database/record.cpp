// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/record.h"

#include <tavocore.h>

#include <climits>
#include <cmath>

#include "mediidx/request.h"

namespace mediidx {

void trim_texts(__tag_TAVO_MEDIA_INFO& info) {
  for (char* text :
       {info.title, info.album, info.artist, info.album_artist, info.genre, info.composer,
        info.comment, info.camera_make, info.camera_model, info.exposure, info.aperture}) {
    StringTrim(text);
  }
}

void trim_texts(VIDEO_CONVERT_REC& record) {
  for (char* text : {record.vcodec, record.container_type, record.acodec, record.convert_type}) {
    StringTrim(text);
  }
}

int whole_seconds(float seconds) {
  if (std::isnan(seconds)) return 0;
  if (seconds >= static_cast<float>(INT_MAX)) return INT_MAX;
  if (seconds <= static_cast<float>(INT_MIN)) return INT_MIN;
  return static_cast<int>(seconds);
}

std::int64_t owner_of(const char* path) {
  return static_cast<std::int64_t>(TAVOMediaIndexGetUserIdFromPath(path));
}

}  // namespace mediidx
