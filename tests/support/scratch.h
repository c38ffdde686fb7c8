// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Throw-away folders, and roots in which the library and the platform find their system files.
#ifndef MEDIIDX_TESTS_SUPPORT_SCRATCH_H_
#define MEDIIDX_TESTS_SUPPORT_SCRATCH_H_

#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>

namespace mediidx::test {

/// A folder that goes with the object.
class ScratchFolder {
 public:
  ScratchFolder();
  ~ScratchFolder();
  ScratchFolder(const ScratchFolder&) = delete;
  ScratchFolder& operator=(const ScratchFolder&) = delete;

  const std::filesystem::path& path() const { return path_; }
  /// The absolute path of `relative` (with or without a leading slash) below the folder.
  std::string at(std::string_view relative) const;
  /// Writes a file, its folders made as needed; returns its absolute path.
  std::string write(std::string_view relative, std::string_view content) const;
  std::string make_folder(std::string_view relative) const;
  std::string make_link(std::string_view relative, const std::string& target) const;
  std::string read(std::string_view relative) const;
  bool exists(std::string_view relative) const;

 private:
  std::filesystem::path path_;
};

/// A scratch folder that stands for "/": set as the root of library and platform while it lives.
class ScratchRoot : public ScratchFolder {
 public:
  ScratchRoot();
  ~ScratchRoot();

  /// Adds a share to the share file; its folder is made.
  void add_share(const std::string& name, const std::string& folder, std::uint32_t status = 0);
  /// Adds a user to etc/passwd (from then on the only user database); the home is made.
  void add_user(const std::string& name, std::uint32_t uid, const std::string& home);
  /// Writes the index-folder configuration.
  void set_index_folders(std::string_view json) const;
  /// Adds a share and makes its whole folder indexed for every kind, in file and memory.
  void index_everything(const std::string& share, const std::string& folder);

 private:
  std::string shares_;
  std::string users_;
};

}  // namespace mediidx::test

#endif
