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
fs::path lock_of(const DataFolder& data) { return data.path() / "index.lock"; }

/// Held for the moment in which somebody finds out whose the file is: who only looks is not taken
/// for a process that runs.
class Look {
 public:
  explicit Look(const DataFolder& data) : lock_(data.path() / "pid.lock") { lock_.own(); }

 private:
  FileLock lock_;
};

}  // namespace

PidFile::PidFile(const DataFolder& data, IfTaken if_taken)
    : file_(file_of(data)), lock_(lock_of(data)) {
  if (!try_own(data)) {
    if (if_taken == IfTaken::kThrow) {
      std::string pid = "another one";
      std::ifstream(file_) >> pid;
      throw AlreadyRunning("a scan is already running: process " + pid);
    }
    lock_.own();
  }
  std::ofstream out(file_, std::ios::trunc);
  out << getpid() << "\n";
  out.close();
  if (!out) throw std::runtime_error(file_.string() + " cannot be written");
}

bool PidFile::try_own(const DataFolder& data) {
  const Look look(data);
  return lock_.try_own();
}

PidFile::~PidFile() {
  std::error_code ignored;
  fs::remove(file_, ignored);
}

void PidFile::remove_stale(const DataFolder& data) {
  const Look look(data);
  FileLock lock(lock_of(data));
  if (lock.try_own()) fs::remove(file_of(data));
}

}  // namespace mediidx::tool
