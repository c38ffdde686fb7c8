// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "replace_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <memory>

#include "descriptor.h"

namespace mediidx::platform {

namespace {

/// A temporary file beside `target`; goes unless it was renamed over it.
class TemporaryFile {
 public:
  explicit TemporaryFile(const std::string& target)
      : name_(target + ".XXXXXX"), file_(mkostemp(name_.data(), O_CLOEXEC)) {}
  ~TemporaryFile() {
    if (file_ && !renamed_) unlink(name_.c_str());
  }
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;

  int get() const { return file_.get(); }
  explicit operator bool() const { return static_cast<bool>(file_); }
  bool rename_to(const std::string& target) {
    renamed_ = std::rename(name_.c_str(), target.c_str()) == 0;
    return renamed_;
  }

 private:
  std::string name_;
  Descriptor file_;
  bool renamed_ = false;
};

bool write_all(int file, std::string_view content) {
  while (!content.empty()) {
    const ssize_t count = write(file, content.data(), content.size());
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return false;
    content.remove_prefix(static_cast<std::size_t>(count));
  }
  return true;
}

bool keep_owner_and_mode(int file, const struct stat& old) {
  // Only root may give files away; where the owner stays the writer's, only the mode is kept.
  if (fchown(file, old.st_uid, old.st_gid) != 0 && errno != EPERM) return false;
  return fchmod(file, old.st_mode & 07777) == 0;
}

void flush_folder_of(const std::string& path) {
  const auto folder = path.substr(0, path.rfind('/') + 1);
  const Descriptor handle(open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (handle) fsync(handle.get());
}

}  // namespace

bool replace_file(const std::string& path, std::string_view content) {
  const std::unique_ptr<char, decltype(&std::free)> resolved(realpath(path.c_str(), nullptr),
                                                             std::free);
  struct stat old{};
  if (!resolved || stat(resolved.get(), &old) != 0) return false;
  const std::string target(resolved.get());
  TemporaryFile temporary(target);
  if (!temporary || !write_all(temporary.get(), content)) return false;
  if (!keep_owner_and_mode(temporary.get(), old) || fsync(temporary.get()) != 0) return false;
  if (!temporary.rename_to(target)) return false;
  flush_folder_of(target);
  return true;
}

}  // namespace mediidx::platform
