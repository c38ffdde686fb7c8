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

/// The time of the change of the inode: that of the content can be set back.
Stamp to_stamp(const struct stat& info) {
  return {info.st_dev, info.st_ino, info.st_size, info.st_ctim.tv_sec, info.st_ctim.tv_nsec};
}

/// False while another change could leave the same stamp, for times of files advance in steps.
bool is_settled(const Stamp& stamp) {
  using std::chrono::nanoseconds;
  using std::chrono::seconds;
  constexpr std::chrono::milliseconds kLongestStep{100};
  const auto changed = seconds(stamp.changed_s) + nanoseconds(stamp.changed_ns);
  return std::chrono::system_clock::now().time_since_epoch() - changed > kLongestStep;
}

/// Where the users come from: from etc/passwd below the root, when a root is set and has one, else
/// from the system.
struct Source {
  bool own_file = false;
  std::string file;
  Stamp stamp;
};

Source user_source() {
  struct stat info{};
  if (*TAVOPlatformRootGet() != '\0') {
    auto path = below_root(kPasswd);
    if (stat(path.c_str(), &info) == 0 && S_ISREG(info.st_mode)) {
      return {true, std::move(path), to_stamp(info)};
    }
  }
  return {false, kPasswd, stat(kPasswd, &info) == 0 ? to_stamp(info) : Stamp()};
}

struct UserCache {
  Source source;
  bool settled = false;
  std::chrono::steady_clock::time_point read_at;
  unsigned generation = 0;
  std::vector<User> users;

  bool is_fresh(const Source& now) const {
    constexpr std::chrono::seconds kTrusted{10};
    const bool unchanged = settled && source.file == now.file && source.stamp == now.stamp;
    return unchanged && (source.own_file || std::chrono::steady_clock::now() - read_at < kTrusted);
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
  auto source = user_source();
  UserCache& cache = user_cache();
  if (cache.is_fresh(source)) return cache.users;
  // Asked for before the users are read: a change meanwhile is seen the next time.
  const bool settled = is_settled(source.stamp);
  cache.settled = false;
  cache.users = source.own_file ? read_passwd_file(source.file) : read_system_users();
  cache.source = std::move(source);
  cache.settled = settled;
  cache.read_at = std::chrono::steady_clock::now();
  ++cache.generation;
  return cache.users;
}

unsigned all_users_generation() { return user_cache().generation; }

std::optional<User> find_user(const std::string& name) {
  if (user_source().own_file)
    return find_listed([&](const User& user) { return user.name == name; });
  std::vector<char> buffer(kFirstBuffer);
  return with_growing_buffer(buffer, [&](passwd& entry, std::vector<char>& room, passwd*& found) {
    return getpwnam_r(name.c_str(), &entry, room.data(), room.size(), &found);
  });
}

std::optional<User> find_user(std::uint32_t uid) {
  if (user_source().own_file) return find_listed([&](const User& user) { return user.uid == uid; });
  std::vector<char> buffer(kFirstBuffer);
  return with_growing_buffer(buffer, [&](passwd& entry, std::vector<char>& room, passwd*& found) {
    return getpwuid_r(uid, &entry, room.data(), room.size(), &found);
  });
}

}  // namespace mediidx::platform
