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

/// This process in "var/run/tavoindexd.pid" below the root, gone with the object: the only one that
/// scans. Whoever is named there has to take SIGHUP as a request to read the configuration again.
class PidFile {
 public:
  enum class IfTaken { kThrow, kWait };

  /// Throws AlreadyRunning, or waits until the other is done.
  PidFile(const DataFolder& data, IfTaken if_taken);
  ~PidFile();
  PidFile(const PidFile&) = delete;
  PidFile& operator=(const PidFile&) = delete;

  /// Removes the file of a process that was killed, so that nobody else is signalled for it.
  static void remove_stale(const DataFolder& data);

 private:
  bool try_own(const DataFolder& data);

  std::filesystem::path file_;
  FileLock lock_;  ///< Held by the process that the file names, for as long.
};

}  // namespace mediidx::tool

#endif
