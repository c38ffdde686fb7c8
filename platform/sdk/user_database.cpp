// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "user_database.h"

#include <below_root.h>
#include <pwd.h>
#include <sys/stat.h>

#include <cerrno>
#include <chrono>
#include <cstdio>
#include <memory>

namespace mediidx::platform {

namespace {

constexpr const char* kPasswd = "/etc/passwd";
constexpr std::size_t kFirstBuffer = 4096;
constexpr std::size_t kLastBuffer = std::size_t{16} << 20;

using File = std::unique_ptr<std::FILE, decltype(&std::fclose)>;

User to_user(const passwd& entry) {
  return {entry.pw_name ? entry.pw_name : "", entry.pw_uid, entry.pw_gid,
          entry.pw_dir ? entry.pw_dir : ""};
}

/// Calls `get(entry, buffer, found)` with a buffer that grows while it is too small. Empty when
/// there is no such entry.
template <class Get>
std::optional<User> with_growing_buffer(std::vector<char>& buffer, Get get) {
  for (;;) {
    passwd entry{};
    passwd* found = nullptr;
    const int error = get(entry, buffer, found);
    if (error == EINTR) continue;
    if (error != ERANGE || buffer.size() >= kLastBuffer) {
      return error == 0 && found ? std::optional(to_user(*found)) : std::nullopt;
    }
    buffer.resize(buffer.size() * 2);
  }
}

std::optional<User> next_in_file(std::FILE* file, std::vector<char>& buffer) {
  const off_t start = ftello(file);
  return with_growing_buffer(buffer, [&](passwd& entry, std::vector<char>& room, passwd*& found) {
    const int error = fgetpwent_r(file, &entry, room.data(), room.size(), &found);
    if (error == ERANGE) fseeko(file, start, SEEK_SET);
    return error;
  });
}

std::vector<User> read_passwd_file(const std::string& path) {
  std::vector<User> users;
  const File file(std::fopen(path.c_str(), "re"), std::fclose);
  if (!file) return users;
  std::vector<char> buffer(kFirstBuffer);
  while (auto user = next_in_file(file.get(), buffer)) users.push_back(std::move(*user));
  return users;
}

std::vector<User> read_system_users() {
  std::vector<User> users;
  setpwent();
  const std::unique_ptr<void, void (*)(void*)> end(&users, [](void*) { endpwent(); });
  while (const passwd* entry = getpwent()) users.push_back(to_user(*entry));
  return users;
}

/// Tells one state of a file from another; all zero when it is missing.
struct Stamp {
  dev_t device = 0;
  ino_t inode = 0;
  off_t size = 0;
  std::int64_t changed_s = 0;
  std::int64_t changed_ns = 0;
  bool operator==(const Stamp&) const = default;
};

Stamp stamp_of(const std::string& path) {
  struct stat info{};
  if (stat(path.c_str(), &info) != 0) return {};
  return {info.st_dev, info.st_ino, info.st_size, info.st_mtim.tv_sec, info.st_mtim.tv_nsec};
}

/// etc/passwd below the root, when a root is set and has one.
std::optional<std::string> passwd_below_root() {
  if (*TAVOPlatformRootGet() == '\0') return std::nullopt;
  auto path = below_root(kPasswd);
  struct stat info{};
  if (stat(path.c_str(), &info) != 0 || !S_ISREG(info.st_mode)) return std::nullopt;
  return path;
}

struct UserCache {
  std::string file;
  Stamp stamp;
  std::chrono::steady_clock::time_point read_at;
  unsigned generation = 0;
  std::vector<User> users;

  bool is_fresh(const std::string& path, const Stamp& now, bool own_file) const {
    constexpr std::chrono::seconds kTrusted{10};
    const bool unchanged = generation > 0 && file == path && stamp == now;
    return unchanged && (own_file || std::chrono::steady_clock::now() - read_at < kTrusted);
  }
};

UserCache& user_cache() {
  static auto& cache = *new UserCache;
  return cache;
}

template <class Matches>
std::optional<User> find_listed(Matches matches) {
  for (const User& user : all_users()) {
    if (matches(user)) return user;
  }
  return std::nullopt;
}

}  // namespace

const std::vector<User>& all_users() {
  const auto own = passwd_below_root();
  const std::string path = own.value_or(kPasswd);
  const Stamp stamp = stamp_of(path);
  UserCache& cache = user_cache();
  if (cache.is_fresh(path, stamp, own.has_value())) return cache.users;
  cache.users = own ? read_passwd_file(path) : read_system_users();
  cache.file = path;
  cache.stamp = stamp;
  cache.read_at = std::chrono::steady_clock::now();
  ++cache.generation;
  return cache.users;
}

unsigned all_users_generation() { return user_cache().generation; }

std::optional<User> find_user(const std::string& name) {
  if (passwd_below_root()) return find_listed([&](const User& user) { return user.name == name; });
  std::vector<char> buffer(kFirstBuffer);
  return with_growing_buffer(buffer, [&](passwd& entry, std::vector<char>& room, passwd*& found) {
    return getpwnam_r(name.c_str(), &entry, room.data(), room.size(), &found);
  });
}

std::optional<User> find_user(std::uint32_t uid) {
  if (passwd_below_root()) return find_listed([&](const User& user) { return user.uid == uid; });
  std::vector<char> buffer(kFirstBuffer);
  return with_growing_buffer(buffer, [&](passwd& entry, std::vector<char>& room, passwd*& found) {
    return getpwuid_r(uid, &entry, room.data(), room.size(), &found);
  });
}

}  // namespace mediidx::platform
