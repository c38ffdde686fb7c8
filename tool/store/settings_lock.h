// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// One change of a data folder's settings at a time.
#ifndef MEDIIDX_TOOL_STORE_SETTINGS_LOCK_H_
#define MEDIIDX_TOOL_STORE_SETTINGS_LOCK_H_

#include "store/data_folder.h"

namespace mediidx::tool {

/// Holds the data folder's "lock", and names this process in it. Waits while others hold it; but
/// a program that the holder itself runs, and so waits for, works under the holder's. Throws
/// std::runtime_error.
class SettingsLock {
 public:
  explicit SettingsLock(const DataFolder& data);
  ~SettingsLock();
  SettingsLock(const SettingsLock&) = delete;
  SettingsLock& operator=(const SettingsLock&) = delete;

 private:
  std::filesystem::path file_;
  FileLock lock_;
  bool is_ours_;
};

}  // namespace mediidx::tool

#endif
