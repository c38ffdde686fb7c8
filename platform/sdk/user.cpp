// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <border.h>
#include <tavosdk.h>
#include <utf8.h>

#include <memory>

#include "user_database.h"

namespace platform = mediidx::platform;

namespace {

/// A record of a user; null when the name does not fit. A home that does not fit is left empty
/// rather than cut to another folder.
std::unique_ptr<TAVOUSER> to_record(const platform::User& user) {
  auto record = std::make_unique<TAVOUSER>();
  record->uid = user.uid;
  record->gid = user.gid;
  platform::copy_whole(record->home, user.home);
  return platform::copy_whole(record->name, user.name) ? std::move(record) : nullptr;
}

}  // namespace

extern "C" int TAVOUserGetUGID(const char* name, uint32_t* uid, uint32_t* gid) {
  if (!name) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "user.cpp", 1);
  return platform::no_throw(-1, "user.cpp", 2, [&] {
    const auto user = platform::find_user(std::string(name));
    if (!user) return platform::failed(-1, TAVO_ERR_USER_NOT_FOUND, "user.cpp", 3);
    if (uid) *uid = user->uid;
    if (gid) *gid = user->gid;
    return 0;
  });
}

extern "C" int TAVOUserGetByUID(uint32_t uid, TAVOUSER** user) {
  if (!user) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "user.cpp", 4);
  *user = nullptr;
  return platform::no_throw(-1, "user.cpp", 5, [&] {
    const auto found = platform::find_user(uid);
    auto record = found ? to_record(*found) : nullptr;
    if (!record) return platform::failed(-1, TAVO_ERR_USER_NOT_FOUND, "user.cpp", 6);
    *user = record.release();
    return 0;
  });
}

extern "C" void TAVOUserFree(TAVOUSER* user) { delete user; }
