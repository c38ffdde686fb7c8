// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "key_value.h"

#include <algorithm>

namespace mediidx::platform {

namespace {

std::string_view trimmed(std::string_view text) {
  constexpr std::string_view kWhiteSpace = " \t\v\f\r\n";
  const auto first = text.find_first_not_of(kWhiteSpace);
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(kWhiteSpace) - first + 1);
}

std::string_view unquoted(std::string_view value) {
  const bool quoted = value.size() >= 2 && value.starts_with('"') && value.ends_with('"');
  return quoted ? value.substr(1, value.size() - 2) : value;
}

// Values leave as terminated texts: what follows a null byte could never be seen.
std::string_view until_null(std::string_view text) { return text.substr(0, text.find('\0')); }

std::optional<KeyValue> parse_line(std::string_view line, std::string_view separator) {
  if (trimmed(line).starts_with('#')) return std::nullopt;
  const auto at = line.find(separator);
  if (at == std::string_view::npos) return std::nullopt;
  const auto key = trimmed(line.substr(0, at));
  if (key.empty() || key.find('\0') != std::string_view::npos) return std::nullopt;
  return KeyValue{key, until_null(unquoted(trimmed(line.substr(at + separator.size()))))};
}

}  // namespace

KeyValueReader::KeyValueReader(std::string_view text, std::string_view separator)
    : rest_(text), separator_(separator) {
  constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";
  if (rest_.starts_with(kByteOrderMark)) rest_.remove_prefix(kByteOrderMark.size());
}

std::optional<KeyValue> KeyValueReader::next() {
  while (!rest_.empty()) {
    const auto line = rest_.substr(0, rest_.find('\n'));
    rest_.remove_prefix(std::min(rest_.size(), line.size() + 1));
    if (const auto entry = parse_line(line, separator_)) return entry;
  }
  return std::nullopt;
}

}  // namespace mediidx::platform
