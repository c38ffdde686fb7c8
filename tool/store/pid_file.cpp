// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "store/pid_file.h"

#include <unistd.h>

#include <fstream>
#include <stdexcept>
#include <string>
#include <system_error>

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

fs::path file_of(const DataFolder& data) { return data.root() / "var/run/tavoindexd.pid"; }
fs::path lock_of(const DataFolder& data) { return data.path() / "daemon.lock"; }
fs::path scan_lock_of(const DataFolder& data) { return data.path() / "index.lock"; }

/// Held for the moment in which somebody finds out whose the file is: who only looks is not taken
/// for a process that runs.
class Look {
 public:
  explicit Look(const DataFolder& data) : lock_(data.path() / "pid.lock") { lock_.own(); }

 private:
  FileLock lock_;
};

}  // namespace

ScanLock::ScanLock(const DataFolder& data, IfTaken if_taken) : lock_(scan_lock_of(data)) {
  if (!lock_.try_own()) {
    if (if_taken == IfTaken::kThrow) {
      std::string pid = "another one";
      std::ifstream(scan_lock_of(data)) >> pid;
      throw AlreadyRunning("a scan is already running: process " + pid);
    }
    lock_.own();
  }
  std::ofstream(scan_lock_of(data), std::ios::trunc) << getpid() << "\n";
}

PidFile::PidFile(const DataFolder& data) : file_(file_of(data)), lock_(lock_of(data)) {
  const Look look(data);
  is_ours_ = lock_.try_own();
  if (!is_ours_) return;
  std::ofstream out(file_, std::ios::trunc);
  out << getpid() << "\n";
  out.close();
  if (!out) throw std::runtime_error(file_.string() + " cannot be written");
}

PidFile::~PidFile() {
  std::error_code ignored;
  if (is_ours_) fs::remove(file_, ignored);
}

void PidFile::remove_stale(const DataFolder& data) {
  const Look look(data);
  FileLock lock(lock_of(data));
  if (lock.try_own()) fs::remove(file_of(data));
}

}  // namespace mediidx::tool
