// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "ratings/rating_file.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <tavocore.h>
#include <tavosdk.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <charconv>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <optional>
#include <stdexcept>
#include <utility>

#include "mediidx/request.h"
#include "support/owned.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

constexpr const char* kFileName = "TAVOAUDIO_SONG_RATING";
constexpr std::size_t kLargestFile = 1 << 20;

[[noreturn]] void fail(const std::string& path, const std::string& reason) {
  throw std::runtime_error(escape_for_display(path) + ": " + reason);
}
[[noreturn]] void fail_with_errno(const std::string& path) { fail(path, std::strerror(errno)); }

class Descriptor {
 public:
  explicit Descriptor(int number) : number_(number) {}
  Descriptor(Descriptor&& other) noexcept : number_(std::exchange(other.number_, -1)) {}
  Descriptor& operator=(Descriptor&& other) noexcept {
    std::swap(number_, other.number_);
    return *this;
  }
  ~Descriptor() {
    if (number_ >= 0) close(number_);
  }
  int get() const { return number_; }
  explicit operator bool() const { return number_ >= 0; }

 private:
  int number_;
};

/// The folder of a song's attributes; empty when the path names no file.
fs::path attribute_folder(const std::string& song) {
  std::array<char, PATH_MAX> folder;
  const int size = static_cast<int>(folder.size()) - 1;
  return TAVOEADirPath(0, song.c_str(), folder.data(), size) < 0 ? fs::path() : folder.data();
}

/// Root makes files in the folders of others: what it makes belongs to whom the folder belongs.
void give_to_owner_of(int folder, int made) {
  struct stat above{};
  if (geteuid() != 0 || fstat(folder, &above) != 0) return;
  if (fchown(made, above.st_uid, above.st_gid) != 0) return;  // a file system without owners
}

/// Opens a folder within another without following a link; makes it where that is asked for.
Descriptor open_folder(int above, const char* name, bool make) {
  constexpr mode_t kMode = 0755;
  const bool is_made = make && mkdirat(above, name, kMode) == 0;
  if (make && !is_made && errno != EEXIST) return Descriptor(-1);
  Descriptor folder(openat(above, name, O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC));
  if (folder && is_made) give_to_owner_of(above, folder.get());
  return folder;
}

/// The attribute folder, opened; closed with errno set when it is missing and not to be made.
Descriptor open_attributes(const fs::path& folder, bool make) {
  const auto attributes = folder.parent_path();
  const Descriptor songs(
      open(attributes.parent_path().c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (!songs) return Descriptor(-1);
  const auto above = open_folder(songs.get(), attributes.filename().c_str(), make);
  if (!above) return Descriptor(-1);
  return open_folder(above.get(), folder.filename().c_str(), make);
}

/// The file's text; empty when there is none.
std::optional<std::string> read_text(int folder, const std::string& shown_path) {
  const Descriptor file(openat(folder, kFileName, O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
  if (!file && errno == ENOENT) return std::nullopt;
  if (!file) fail_with_errno(shown_path);
  std::string text;
  std::array<char, 4096> piece;
  ssize_t count = 0;
  while ((count = read(file.get(), piece.data(), piece.size())) > 0) {
    text.append(piece.data(), static_cast<std::size_t>(count));
    if (text.size() > kLargestFile) fail(shown_path, "too large for a file of ratings");
  }
  if (count < 0) fail_with_errno(shown_path);
  return text;
}

/// A fresh file beside the old one; goes unless it was put in its place. The folder is locked, so
/// that one that is there already was left behind.
class FreshFile {
 public:
  FreshFile(int folder, const std::string& shown_path) : folder_(folder), shown_path_(shown_path) {
    unlinkat(folder, kName, 0);
    constexpr int kFlags = O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC;
    file_ = Descriptor(openat(folder, kName, kFlags, 0644));
    if (!file_) fail_with_errno(shown_path);
  }
  ~FreshFile() {
    if (!is_placed_) unlinkat(folder_, kName, 0);
  }
  FreshFile(const FreshFile&) = delete;
  FreshFile& operator=(const FreshFile&) = delete;

  void put_in_place(std::string_view text) {
    keep_owner_and_mode();
    while (!text.empty()) {
      const ssize_t count = write(file_.get(), text.data(), text.size());
      if (count < 0) fail_with_errno(shown_path_);
      text.remove_prefix(static_cast<std::size_t>(count));
    }
    if (fsync(file_.get()) != 0) fail_with_errno(shown_path_);
    is_placed_ = renameat(folder_, kName, folder_, kFileName) == 0;
    if (!is_placed_) fail_with_errno(shown_path_);
  }

 private:
  /// Those of the file before, where there is one and they may be kept.
  void keep_owner_and_mode() const {
    struct stat old{};
    if (fstatat(folder_, kFileName, &old, AT_SYMLINK_NOFOLLOW) != 0) {
      return give_to_owner_of(folder_, file_.get());
    }
    const bool kept = fchown(file_.get(), old.st_uid, old.st_gid) == 0 || errno == EPERM;
    if (!kept || fchmod(file_.get(), old.st_mode & 0777) != 0) fail_with_errno(shown_path_);
  }

  static constexpr const char* kName = "TAVOAUDIO_SONG_RATING.new";

  int folder_;
  std::string shown_path_;
  Descriptor file_{-1};
  bool is_placed_ = false;
};

template <class Number>
std::optional<Number> number_from(std::string_view text) {
  Number number{};
  const auto read = std::from_chars(text.data(), text.data() + text.size(), number);
  const bool whole = read.ec == std::errc() && read.ptr == text.data() + text.size();
  return whole ? std::optional(number) : std::nullopt;
}

std::string_view trimmed(std::string_view text) {
  constexpr std::string_view kBlanks = " \t\r\v\f";
  const auto first = text.find_first_not_of(kBlanks);
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

/// Whether a line, without its end, holds a rating of the user: as the index reads it, which takes
/// the number at the beginning of a key and leaves out what follows.
bool is_of(std::string_view line, std::uint32_t user) {
  const auto equals = line.find('=');
  if (equals == std::string_view::npos) return false;
  const std::string key(trimmed(line.substr(0, equals)));
  if (key.empty() || key.starts_with('#') || key.find('\0') != std::string::npos) return false;
  return std::strtoll(key.c_str(), nullptr, 10) == std::int64_t{user};
}

}  // namespace

Ratings read_ratings(const std::string& song) {
  const OwnedHash hash(TLIBCSzHashAlloc(0));
  if (!hash) throw std::bad_alloc();
  if (TAVOMediaIndexGetAllUserDefinedSongRating(song.c_str(), hash.get()) != 1) {
    fail(song, "its ratings cannot be read");
  }
  Ratings out;
  int cursor = 0;
  const char* key = nullptr;
  const char* value = nullptr;
  while (TLIBCSzHashNext(hash.get(), &cursor, &key, &value) == 1) {
    const auto user = number_from<std::uint32_t>(key);
    const auto stars = number_from<int>(value);
    if (user && stars) out[*user] = *stars;
  }
  return out;
}

std::string with_rating(std::string_view text, std::uint32_t user, int stars) {
  const auto rating = std::to_string(user) + "=" + std::to_string(stars) + "\n";
  constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";
  std::string out;
  if (text.starts_with(kByteOrderMark)) {
    out = kByteOrderMark;
    text.remove_prefix(kByteOrderMark.size());
  }
  bool is_written = stars == 0;
  while (!text.empty()) {
    const auto line = text.substr(0, text.find('\n'));
    text.remove_prefix(std::min(text.size(), line.size() + 1));
    if (!is_of(line, user)) {
      out.append(line).append("\n");
    } else if (!is_written) {
      out += rating;
      is_written = true;
    }
  }
  if (!is_written) out += rating;
  return out == kByteOrderMark ? std::string() : out;
}

void write_rating(const std::string& song, std::uint32_t user, int stars) {
  const auto path = attribute_folder(song);
  if (path.empty()) fail(song, "has no folder for its ratings");
  const auto shown_path = (path / kFileName).string();
  const auto folder = open_attributes(path, /*make=*/stars > 0);
  if (!folder && errno == ENOENT && stars == 0) return;
  if (!folder) fail_with_errno(shown_path);
  // Others who rate by this program wait; where nothing can be locked they do not.
  flock(folder.get(), LOCK_EX);
  const auto old = read_text(folder.get(), shown_path);
  const auto text = with_rating(old.value_or(""), user, stars);
  if (text == old.value_or("")) return;
  if (!text.empty()) {
    FreshFile(folder.get(), shown_path).put_in_place(text);
  } else if (unlinkat(folder.get(), kFileName, 0) != 0) {
    fail_with_errno(shown_path);
  }
  fsync(folder.get());
}

}  // namespace mediidx::tool
