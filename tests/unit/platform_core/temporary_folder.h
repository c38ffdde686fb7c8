// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Throw-away folders for tests of the platform libraries, which do without the media library.
#ifndef MEDIIDX_TESTS_UNIT_PLATFORM_CORE_TEMPORARY_FOLDER_H_
#define MEDIIDX_TESTS_UNIT_PLATFORM_CORE_TEMPORARY_FOLDER_H_

#include <stdlib.h>
#include <tavocore.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>
#include <string_view>

namespace mediidx::test {

/// A folder that goes with the object.
class TemporaryFolder {
 public:
  TemporaryFolder() {
    std::string name = std::filesystem::temp_directory_path() / "platform-XXXXXX";
    if (!mkdtemp(name.data())) throw std::runtime_error("no temporary folder");
    path_ = std::filesystem::canonical(name);
  }
  ~TemporaryFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  /// The absolute path of something in the folder.
  std::string at(std::string_view relative) const {
    return path_.native() + "/" + std::string(relative);
  }
  std::string write(std::string_view relative, std::string_view content) const {
    const auto file = at(relative);
    std::filesystem::create_directories(std::filesystem::path(file).parent_path());
    std::ofstream(file, std::ios::binary | std::ios::trunc) << content;
    return file;
  }
  std::string make_folder(std::string_view relative) const {
    std::filesystem::create_directories(at(relative));
    return at(relative);
  }
  std::string read(std::string_view relative) const {
    std::ifstream in(at(relative), std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
  }

 private:
  std::filesystem::path path_;
};

/// Such a folder as the platform's root while it lives.
class TemporaryRoot : public TemporaryFolder {
 public:
  TemporaryRoot() { TAVOPlatformRootSet(at("").c_str()); }
  ~TemporaryRoot() { TAVOPlatformRootSet(nullptr); }
};

}  // namespace mediidx::test

#endif
