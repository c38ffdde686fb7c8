// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "store/data_folder.h"

#include <fcntl.h>
#include <pwd.h>
#include <sys/file.h>
#include <tavocore.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <fstream>
#include <stdexcept>
#include <system_error>

#include "mediidx/root.h"
#include "store/root.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

constexpr const char* kMarker = ".mediidx";

std::string home() {
  if (const char* value = std::getenv("HOME"); value && value[0] == '/') return value;
  const passwd* user = getpwuid(geteuid());
  if (!user || user->pw_dir[0] != '/') {
    throw std::runtime_error("there is no home folder: name a folder with --data-dir");
  }
  return user->pw_dir;
}

fs::path usual_folder() {
  if (geteuid() == 0) return "/var/lib/mediidx";
  const char* data = std::getenv("XDG_DATA_HOME");
  const fs::path base = data && data[0] == '/' ? fs::path(data) : fs::path(home()) / ".local/share";
  return base / "mediidx";
}

void check_or_mark(const fs::path& folder) {
  if (fs::exists(folder / kMarker)) return;
  if (!fs::is_empty(folder)) {
    throw std::runtime_error(folder.string() +
                             " holds other things: name an empty or a new folder");
  }
  std::ofstream marker(folder / kMarker);
  marker << "The data of mediidx.\n";
  marker.close();
  if (!marker) throw std::runtime_error(folder.string() + " cannot be written to");
}

/// Beside the command in the tree in which it was built, in a folder of its own where it is
/// installed.
fs::path converter_of(const fs::path& command) {
  const auto beside = command.parent_path() / "mediidx-iconv";
  if (fs::exists(beside)) return beside;
  return command.parent_path().parent_path() / "libexec/mediidx/mediidx-iconv";
}

/// Named where the library looks for it; replaced at once when the command has moved.
void link_program(const fs::path& program, const fs::path& link) {
  std::error_code ignored;
  if (fs::read_symlink(link, ignored) == program) return;
  const fs::path fresh = link.string() + "." + std::to_string(getpid());
  fs::remove(fresh);
  fs::create_symlink(program, fresh);
  fs::rename(fresh, link);
}

}  // namespace

DataFolder::DataFolder(const std::optional<std::string>& asked)
    : path_(fs::absolute(asked ? fs::path(*asked) : usual_folder())) {
  try {
    fs::create_directories(path_);
    path_ = fs::canonical(path_);
    check_or_mark(path_);
    make_root();
  } catch (const fs::filesystem_error& error) {
    throw std::runtime_error("the data folder cannot be used: " + error.path1().string() + ": " +
                             error.code().message());
  }
  if (TAVOMediaIndexRootSet(root().c_str()) != 0 || TAVOPlatformRootSet(root().c_str()) != 0) {
    throw std::runtime_error("the data folder's name is too long: " + path_.string());
  }
  set_own_root(root().string());
}

void DataFolder::make_root() const {
  for (const char* folder :
       {"etc", "tmp", "var/run", "var/services", "usr/bin", "usr/tavo/etc", "usr/tavo/bin"}) {
    fs::create_directories(root() / folder);
  }
  // The library has text converted by the program of this name.
  const auto command = fs::read_symlink("/proc/self/exe");
  link_program(converter_of(command), root() / "usr/bin/php");
  // And it has folders indexed by these: the command itself under other names.
  for (const char* name : {"tavoindex", "tavoindex_mgr"}) {
    link_program(command, root() / "usr/tavo/bin" / name);
  }
}

FileLock::FileLock(const fs::path& file)
    : descriptor_(open(file.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOFOLLOW, 0600)) {
  if (descriptor_ < 0) throw std::system_error(errno, std::generic_category(), file.string());
}

FileLock::~FileLock() { close(descriptor_); }

void FileLock::change(int operation) {
  while (flock(descriptor_, operation) != 0) {
    if (errno != EINTR) throw std::system_error(errno, std::generic_category(), "flock");
  }
}

void FileLock::share() { change(LOCK_SH); }
void FileLock::own() { change(LOCK_EX); }
void FileLock::release() { change(LOCK_UN); }
bool FileLock::try_own() { return flock(descriptor_, LOCK_EX | LOCK_NB) == 0; }

}  // namespace mediidx::tool
