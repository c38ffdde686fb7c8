// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the fuzzers share.
#ifndef MEDIIDX_TESTS_FUZZ_FUZZ_H_
#define MEDIIDX_TESTS_FUZZ_FUZZ_H_

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string_view>

#include "mediidx/record.h"

namespace mediidx::fuzz {

inline std::string_view text(const std::uint8_t* data, std::size_t size) {
  return {reinterpret_cast<const char*>(data), size};
}

/// A property that every input must have.
inline void check(bool holds) {
  if (!holds) std::abort();
}

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
