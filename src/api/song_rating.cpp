// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The star ratings that the audio player keeps beside a song.
#include <limits.h>
#include <tavocore.h>
#include <tavosdk.h>

#include <array>
#include <string>

#include "mediidx/request.h"
#include "support/log.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

constexpr const char* kRatingFile = "TAVOAUDIO_SONG_RATING";

constexpr int kNoAttributeFolder = 401;
constexpr int kRatingsNotRead = 402;

int read_ratings(const char* path, tlib_szhash* ratings) {
  std::array<char, PATH_MAX> folder{};
  if (TAVOEADirPath(0, path, folder.data(), static_cast<int>(folder.size()) - 1) < 0) {
    kRequestLog.colon(kNoAttributeFolder, "Failed to get @eaDir [path=%s]", path);
    return 0;
  }
  const auto file = std::string(folder.data()) + "/" + kRatingFile;
  if (!TLIBCFileExist(file.c_str())) return 1;
  if (TLIBCFileGetKeys(file.c_str(), nullptr, ratings, "=") != -1) return 1;
  kRequestLog.colon(kRatingsNotRead, "Failed to get song rating from path[%s]", file.c_str());
  return 0;
}

}  // namespace
}  // namespace mediidx

extern "C" int TAVOMediaIndexGetAllUserDefinedSongRating(const char* path, tlib_szhash* ratings) {
  if (!path || !ratings) return 0;
  return mediidx::no_throw(mediidx::kRequestLog, 0,
                           [&] { return mediidx::read_ratings(path, ratings); });
}
