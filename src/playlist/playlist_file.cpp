// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/playlist_file.h"

#include <tavocore.h>
#include <tavoindex.h>

#include <array>

#include "mediidx/record.h"
#include "playlist/entry_path.h"
#include "support/owned.h"

namespace mediidx {
namespace {

/// A line as UTF-8; empty when it is in no character set that is known here.
std::optional<std::string> as_utf8(std::string_view line, const std::string& code_page) {
  std::string text(line);
  if (IsUnicodeString(text.c_str())) return text;
  std::array<char, MEDIIDX_PATH_SIZE> converted;
  if (TLIBCUnicodeStrCPToUTF8(code_page.c_str(), text.c_str(), converted.data(),
                              static_cast<int>(converted.size())) < 1) {
    return std::nullopt;
  }
  return std::string(converted.data());
}

std::optional<std::string> read_entry(std::string_view line, PlaylistFormat format,
                                      M3uReader& m3u) {
  switch (format) {
    case PlaylistFormat::kM3u:
      return m3u.read_line(line);
    case PlaylistFormat::kPls:
      return read_pls_line(line);
    case PlaylistFormat::kWpl:
      return read_wpl_line(line);
  }
  return std::nullopt;
}

}  // namespace

bool read_playlist(const std::string& playlist_path, PlaylistFormat format,
                   const EntryVisitor& visit) {
  const OwnedFile file(std::fopen(playlist_path.c_str(), "re"));
  if (!file) return false;
  const char* configured = TAVOIndexCodePageGet();
  const std::string code_page = configured ? configured : "";
  const auto music_link = read_music_link();
  M3uReader m3u;
  // A longer line comes in pieces: a path cannot be longer.
  std::array<char, MEDIIDX_PATH_SIZE> buffer;
  while (std::fgets(buffer.data(), static_cast<int>(buffer.size()), file.get())) {
    if (buffer[0] == '\r' || buffer[0] == '\n') continue;
    const auto line = as_utf8(clean_line(buffer.data(), format), code_page);
    if (!line) continue;
    const auto entry = read_entry(*line, format, m3u);
    if (!entry) continue;
    auto tags = m3u.take_tags();
    auto path = resolve_entry(*entry, playlist_path, music_link);
    if (path) visit(std::move(*path), std::move(tags));
  }
  return !std::ferror(file.get());
}

int count_playlist_entries(const std::string& playlist_path, PlaylistFormat format) {
  int count = 0;
  const bool read = read_playlist(playlist_path, format, [&](auto&&...) { ++count; });
  return read ? count : 0;
}

}  // namespace mediidx
