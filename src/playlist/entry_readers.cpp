// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/entry_readers.h"

#include <strings.h>

#include <utility>

namespace mediidx {
namespace {

constexpr std::string_view kBlanks = " \t";

std::string_view trimmed(std::string_view text) {
  const auto first = text.find_first_not_of(kBlanks);
  if (first == text.npos) return {};
  return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

/// Replaces until no occurrence is left, those that a replacement completes included, in one pass:
/// text already put out is looked at again only at its end.
std::string replaced(std::string_view text, std::string_view from, char to) {
  std::string out;
  out.reserve(text.size());
  for (const char c : text) {
    out += c;
    while (out.ends_with(from)) {
      out.resize(out.size() - from.size());
      out += to;
    }
  }
  return out;
}

/// Where a quoted value ends: at a quote before a blank, "/" or ">".
std::size_t value_end(std::string_view text) {
  for (auto quote = text.find('"'); quote != text.npos; quote = text.find('"', quote + 1)) {
    if (quote + 1 < text.size() &&
        std::string_view(" />").find(text[quote + 1]) != std::string_view::npos)
      return quote;
  }
  return text.npos;
}

}  // namespace

std::optional<PlaylistFormat> playlist_format(std::string_view path) {
  constexpr std::size_t kLength = 3;
  const std::string extension(path.substr(path.rfind('.') + 1, kLength));
  if (strcasecmp(extension.c_str(), "m3u") == 0) return PlaylistFormat::kM3u;
  if (strcasecmp(extension.c_str(), "pls") == 0) return PlaylistFormat::kPls;
  if (strcasecmp(extension.c_str(), "wpl") == 0) return PlaylistFormat::kWpl;
  return std::nullopt;
}

std::string_view clean_line(std::string_view line, PlaylistFormat format) {
  while (line.ends_with('\r') || line.ends_with('\n')) line.remove_suffix(1);
  if (format == PlaylistFormat::kM3u && line.starts_with("\xEF\xBB")) {
    line.remove_prefix(line.size() < 3 ? line.size() : 3);
  }
  return line;
}

std::optional<std::string> read_pls_line(std::string_view line) {
  const auto name = line.find("File");
  if (name == line.npos) return std::nullopt;
  const auto equals = line.find('=', name);
  if (equals == line.npos) return std::nullopt;
  const auto entry = trimmed(line.substr(equals + 1));
  if (entry.empty()) return std::nullopt;
  return std::string(entry);
}

std::optional<std::string> read_wpl_line(std::string_view line) {
  constexpr std::string_view kName = "media src";
  // Some writers put this private-use character where a quote belongs.
  const auto text = replaced(line, "\xEF\x80\xA0", '"');
  auto value = std::string_view(text);
  const auto name = value.find(kName);
  if (name == value.npos) return std::nullopt;
  value.remove_prefix(name + kName.size());
  const auto first = value.find_first_not_of(" \t\"=");
  if (first == value.npos) return std::nullopt;
  value.remove_prefix(first);
  const auto end = value_end(value);
  if (end == value.npos) return std::nullopt;
  auto entry = replaced(replaced(value.substr(0, end), "&amp;", '&'), "&apos;", '\'');
  if (trimmed(entry).empty()) return std::nullopt;
  return entry;
}

std::optional<std::string> M3uReader::read_line(std::string_view line) {
  if (tags_.read_line(line) || trimmed(line).empty()) return std::nullopt;
  return std::string(line);
}

ExtendedTags M3uReader::take_tags() { return std::exchange(tags_, {}); }

}  // namespace mediidx
