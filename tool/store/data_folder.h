// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Where the command keeps what is its own.
#ifndef MEDIIDX_TOOL_STORE_DATA_FOLDER_H_
#define MEDIIDX_TOOL_STORE_DATA_FOLDER_H_

#include <filesystem>
#include <optional>
#include <string>

namespace mediidx::tool {

/// The folder of a mediidx:
///   .mediidx    says that the folder is one
///   lock        held while the settings below root are changed, see SettingsLock
///   index.lock  held while the index is scanned, see ScanLock
///   daemon.lock, pid.lock  see PidFile
///   postgres/   the private database server, see PrivateServer
///   root/       what stands for "/" to the library and the platform: shares and index folders in
///               usr/tavo/etc, programs that the library starts
class DataFolder {
 public:
  /// The folder that was asked for, else /var/lib/mediidx for root and $XDG_DATA_HOME/mediidx for
  /// others. Makes it with its root and hands the root to library and platform. Throws
  /// std::runtime_error, also for a folder with other things in it.
  explicit DataFolder(const std::optional<std::string>& asked);

  const std::filesystem::path& path() const { return path_; }
  std::filesystem::path root() const { return path_ / "root"; }

 private:
  void make_root() const;

  std::filesystem::path path_;
};

/// A lock between processes on a file, which is made when missing; given up with the object.
class FileLock {
 public:
  explicit FileLock(const std::filesystem::path& file);
  ~FileLock();
  FileLock(const FileLock&) = delete;
  FileLock& operator=(const FileLock&) = delete;

  /// Each replaces what is held; both wait.
  void share();
  void own();
  /// False when others hold it.
  bool try_own();
  void release();

 private:
  void change(int operation);

  int descriptor_;
};

}  // namespace mediidx::tool

#endif
