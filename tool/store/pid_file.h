// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// One scan at a time, and how it is found by those who change the configuration.
#ifndef MEDIIDX_TOOL_STORE_PID_FILE_H_
#define MEDIIDX_TOOL_STORE_PID_FILE_H_

#include <stdexcept>

#include "store/data_folder.h"

namespace mediidx::tool {

/// Another scan of the same index runs; what() says which.
struct AlreadyRunning : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// The right to scan, of one process at a time.
class ScanLock {
 public:
  enum class IfTaken { kThrow, kWait };

  /// Throws AlreadyRunning, or waits until the other is done.
  ScanLock(const DataFolder& data, IfTaken if_taken);

 private:
  FileLock lock_;
};

/// This process in "var/run/tavoindexd.pid" below the root, gone with the object. While another
/// process holds the file it is left alone. Whoever is named there has to take SIGHUP as a request
/// to read the configuration again.
class PidFile {
 public:
  explicit PidFile(const DataFolder& data);
  ~PidFile();
  PidFile(const PidFile&) = delete;
  PidFile& operator=(const PidFile&) = delete;

  /// Removes the file of a process that was killed, so that nobody else is signalled for it.
  static void remove_stale(const DataFolder& data);

 private:
  std::filesystem::path file_;
  FileLock lock_;  ///< Held by the process that the file names, for as long.
  bool is_ours_ = false;
};

}  // namespace mediidx::tool

#endif
