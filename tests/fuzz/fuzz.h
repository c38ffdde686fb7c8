// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the fuzzers share.
#ifndef MEDIIDX_TESTS_FUZZ_FUZZ_H_
#define MEDIIDX_TESTS_FUZZ_FUZZ_H_

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <source_location>
#include <string>
#include <string_view>

#include "mediidx/record.h"

namespace mediidx::fuzz {

inline std::string_view text(const std::uint8_t* data, std::size_t size) {
  return {reinterpret_cast<const char*>(data), size};
}

/// A property that every input must have.
inline void check(bool holds, std::source_location where = std::source_location::current()) {
  if (holds) return;
  std::fprintf(stderr, "ERROR: what %s:%u checks does not hold\n", where.file_name(), where.line());
  std::abort();
}

/// An input taken apart from its beginning.
class Input {
 public:
  Input(const std::uint8_t* data, std::size_t size) : rest_(fuzz::text(data, size)) {}

  bool is_at_end() const { return rest_.empty(); }
  /// 0 at the end.
  unsigned byte() {
    if (rest_.empty()) return 0;
    const auto value = static_cast<unsigned char>(rest_.front());
    rest_.remove_prefix(1);
    return value;
  }
  /// What stands before the next NUL, of which `most` bytes are kept.
  std::string text(std::size_t most = std::string_view::npos) { return until('\0', most); }
  std::string line() { return until('\n', std::string_view::npos); }
  std::string_view rest() const { return rest_; }

 private:
  std::string until(char end, std::size_t most) {
    const auto piece = rest_.substr(0, rest_.find(end));
    rest_.remove_prefix(std::min(piece.size() + 1, rest_.size()));
    return std::string(piece.substr(0, most));
  }

  std::string_view rest_;
};

/// A file in memory, for what reads files by their path.
class MemoryFile {
 public:
  MemoryFile() : file_(memfd_create("fuzz", MFD_CLOEXEC)) { check(file_ >= 0); }
  std::string path() const { return "/proc/self/fd/" + std::to_string(file_); }
  void write(std::string_view text) const {
    check(ftruncate(file_, 0) == 0);
    check(pwrite(file_, text.data(), text.size(), 0) == static_cast<ssize_t>(text.size()));
  }

 private:
  int file_;
};

template <std::size_t Size>
bool is_terminated(const char (&field)[Size]) {
  return std::memchr(field, '\0', Size) != nullptr;
}

/// The text fields that playlists and cue sheets fill.
inline void check_texts(const __tag_TAVO_MEDIA_INFO& info) {
  check(std::memchr(info.path, '\0', MEDIIDX_PATH_SIZE) != nullptr);
  check(is_terminated(info.title) && is_terminated(info.album) && is_terminated(info.artist) &&
        is_terminated(info.album_artist) && is_terminated(info.genre) &&
        is_terminated(info.composer) && is_terminated(info.comment));
}

/// Calls `visit` with every line, without its end.
template <class Visit>
void for_each_line(std::string_view text, Visit visit) {
  while (!text.empty()) {
    const auto end = text.find('\n');
    visit(text.substr(0, end));
    text.remove_prefix(end == text.npos ? text.size() : end + 1);
  }
}

}  // namespace mediidx::fuzz

#endif
