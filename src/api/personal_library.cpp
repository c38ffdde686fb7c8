// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "api/personal_library.h"

#include <limits.h>
#include <strings.h>
#include <tavocore.h>
#include <tavosdk.h>

#include <array>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>

#include "mediidx/request.h"
#include "support/log.h"
#include "support/no_throw.h"
#include "support/owned.h"

namespace mediidx {
namespace {

constexpr int kNoLibraryPath = 201;
constexpr int kNoUserName = 202;
constexpr int kUserUnknown = 203;
constexpr int kHomeNotChecked = 204;

std::string resolved(const char* folder) {
  std::array<char, PATH_MAX> buffer;
  return realpath(folder, buffer.data()) ? buffer.data() : folder;
}

bool is_under_library_path(std::string_view home, std::string_view path) {
  constexpr std::string_view kMusic = "music";
  if (!path.starts_with(home)) return false;
  const auto rest = path.substr(home.size());
  if (rest.size() < kMusic.size() || strncasecmp(rest.data(), kMusic.data(), kMusic.size()) != 0) {
    return false;
  }
  return rest.size() == kMusic.size() || rest[kMusic.size()] == '/';
}

std::uint32_t user_id(const char* name) {
  std::uint32_t uid = 0;
  if (TAVOUserGetUGID(name, &uid, nullptr) >= 0) return uid;
  TLIBCErrSetEx(TAVO_ERR_USER_NOT_FOUND, "mediidx", kUserUnknown);
  return 0;
}

}  // namespace

bool is_in_personal_library(const char* home, const char* path) {
  return is_under_library_path(resolved(home) + "/", path);
}

}  // namespace mediidx

using mediidx::kRequestLog;
using mediidx::no_throw;

extern "C" int TAVOMediaIndexIsUnderPersonalLibPath(const char* home, const char* path) {
  if (home && path) return mediidx::is_under_library_path(home, path) ? 1 : 0;
  kRequestLog.colon(mediidx::kNoLibraryPath, "Bad Parameters.");
  return 0;
}

extern "C" uint32_t TAVOMediaIndexGetUserIdFromName(const char* name) {
  return no_throw(kRequestLog, std::uint32_t{0}, [&] {
    if (name) return mediidx::user_id(name);
    kRequestLog.colon(mediidx::kNoUserName, "Bad Parameters.");
    return std::uint32_t{0};
  });
}

extern "C" uint32_t TAVOMediaIndexGetUserIdFromPath(const char* path) {
  return no_throw(kRequestLog, std::uint32_t{0}, [&]() -> std::uint32_t {
    mediidx::OwnedHomeCheck check;
    const int answer = TAVOServiceHomePathCheck(path, 1, 1, mediidx::out(check));
    if (answer == -1) {
      kRequestLog.colon(mediidx::kHomeNotChecked, "TAVOServiceHomePathCheck(%s) fail",
                        path ? path : "(null)");
      return 0;
    }
    return answer > 0 && check ? TAVOMediaIndexGetUserIdFromName(check->user) : 0;
  });
}
