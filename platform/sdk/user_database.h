// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The users of the system, or those of etc/passwd below a root that has its own.
#ifndef TAVOSDK_USER_DATABASE_H_
#define TAVOSDK_USER_DATABASE_H_

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace mediidx::platform {

struct User {
  std::string name;
  std::uint32_t uid = 0;
  std::uint32_t gid = 0;
  std::string home;
};

std::optional<User> find_user(const std::string& name);
std::optional<User> find_user(std::uint32_t uid);

/// Every user, in the order of the database. A root's own file is read anew when it has changed.
/// The system's database is asked again when /etc/passwd has changed, and now and then for the
/// sake of users that come from elsewhere (a directory server).
const std::vector<User>& all_users();

/// Grows by one whenever `all_users` has read anew.
unsigned all_users_generation();

}  // namespace mediidx::platform

#endif
