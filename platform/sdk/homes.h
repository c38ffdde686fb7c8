// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Home folders of real users.
#ifndef TAVOSDK_HOMES_H_
#define TAVOSDK_HOMES_H_

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "user_database.h"

namespace mediidx::platform {

struct Home {
  std::string user;
  std::string folder;    ///< As the database names it, without trailing slashes.
  std::string resolved;  ///< Where it leads; empty when it does not exist.
};

/// Whether a user is a person with a home: an id from 1000 on, 65534 excepted, and an absolute home
/// but "/".
bool is_real_user(const User& user);

/// The homes of the real users among these, resolved.
std::vector<Home> homes_of(std::span<const User> users);

/// The home that the path is or lies in, compared as text with the name of each home and with what
/// it resolves to. The deepest counts, among equals the first. Null when there is none.
const Home* find_home(std::span<const Home> homes, std::string_view path);

}  // namespace mediidx::platform

#endif
