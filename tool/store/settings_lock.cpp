// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "store/settings_lock.h"

#include <unistd.h>

#include <fstream>
#include <stdexcept>
#include <system_error>

namespace mediidx::tool {
namespace {

/// The process that holds the lock; 0 where it does not say.
pid_t holder(const std::filesystem::path& file) {
  pid_t pid = 0;
  std::ifstream(file) >> pid;
  return pid;
}

}  // namespace

SettingsLock::SettingsLock(const DataFolder& data)
    : file_(data.path() / "lock"), lock_(file_), is_ours_(lock_.try_own()) {
  if (!is_ours_ && holder(file_) == getppid()) return;
  if (!is_ours_) lock_.own();
  is_ours_ = true;
  std::ofstream out(file_, std::ios::trunc);
  out << getpid() << "\n";
  out.close();
  if (!out) throw std::runtime_error(file_.string() + " cannot be written");
}

SettingsLock::~SettingsLock() {
  std::error_code ignored;
  if (is_ours_) std::filesystem::resize_file(file_, 0, ignored);
}

}  // namespace mediidx::tool
