// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "report/report_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <stdexcept>
#include <utility>

#include "report/page.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

[[noreturn]] void fail(const std::string& named, const std::string& why) {
  throw std::runtime_error(escape_for_display(named) + ": " + why);
}

bool is_report(const fs::path& file) {
  std::ifstream in(file, std::ios::binary);
  std::string text(kPageBeginning, '\0');
  in.read(text.data(), static_cast<std::streamsize>(text.size()));
  return begins_report_page(std::string_view(text.data(), static_cast<std::size_t>(in.gcount())));
}

/// A file beside `target`, gone with the object unless it was put in its place.
class FileBeside {
 public:
  explicit FileBeside(const fs::path& target)
      : name_(target.string() + ".XXXXXX"), descriptor_(mkostemp(name_.data(), O_CLOEXEC)) {}
  ~FileBeside() {
    if (descriptor_ < 0) return;
    close(descriptor_);
    if (!is_placed_) unlink(name_.c_str());
  }
  FileBeside(const FileBeside&) = delete;
  FileBeside& operator=(const FileBeside&) = delete;

  /// Each is false on failure, with errno.
  bool is_open() const { return descriptor_ >= 0; }
  bool write(std::string_view text) const {
    while (!text.empty()) {
      const auto written = ::write(descriptor_, text.data(), text.size());
      if (written < 0 && errno == EINTR) continue;
      if (written < 0) return false;
      text.remove_prefix(static_cast<std::size_t>(written));
    }
    return true;
  }
  bool place(const fs::path& target, mode_t mode) {
    is_placed_ = fchmod(descriptor_, mode) == 0 && fsync(descriptor_) == 0 &&
                 std::rename(name_.c_str(), target.c_str()) == 0;
    return is_placed_;
  }

 private:
  std::string name_;
  int descriptor_;
  bool is_placed_ = false;
};

/// Of the file that is there, else of a new one.
mode_t mode_of(const fs::path& target) {
  struct stat found{};
  if (stat(target.c_str(), &found) == 0) return found.st_mode & 0777;
  const mode_t mask = umask(0);
  umask(mask);
  return 0666 & ~mask;
}

}  // namespace

ReportFile::ReportFile(const std::string& named) : named_(named), target_(named) {
  std::error_code error;
  const auto status = fs::status(target_, error);
  if (fs::exists(status)) target_ = fs::canonical(target_, error);
  if (status.type() == fs::file_type::not_found) return;
  if (error) fail(named_, error.message());
  if (fs::is_directory(status)) fail(named_, "is a folder");
  if (!fs::is_regular_file(status) || !is_report(target_)) {
    fail(named_, "is there and is no report; it is left as it is");
  }
}

void ReportFile::write(std::string_view page) const {
  FileBeside file(target_);
  if (!file.is_open() || !file.write(page) || !file.place(target_, mode_of(target_))) {
    fail(named_, std::strerror(errno));
  }
}

}  // namespace mediidx::tool
