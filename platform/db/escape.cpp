// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "escape.h"

#include <tavodb.h>

#include <cstring>
#include <span>

#include "border.h"

namespace mediidx::platform {

void append_literal(std::string& out, std::string_view value) {
  for (std::size_t quote; (quote = value.find('\'')) != value.npos;) {
    out.append(value, 0, quote).append("''");
    value.remove_prefix(quote + 1);
  }
  out.append(value);
}

void append_pattern(std::string& out, std::string_view value) {
  for (const char c : value) {
    if (c == '\\' || c == '%' || c == '_') out += '\\';
    if (c == '\'') out += '\'';
    out += c;
  }
}

std::optional<std::string> escape_condition(std::string_view condition) {
  const auto open = condition.find('\'');
  if (open == condition.npos) return std::string(condition);
  const auto close = condition.rfind('\'');
  if (close == open) return std::nullopt;
  std::string out(condition.substr(0, open + 1));
  append_literal(out, condition.substr(open + 1, close - open - 1));
  out.append(condition.substr(close));
  return out;
}

namespace {

/// Copies a text and its terminator; -1, and an empty text where there is room, when it is too
/// long.
int store(std::span<char> destination, std::string_view text) {
  if (destination.empty()) return -1;
  const bool fits = text.size() < destination.size();
  const auto length = fits ? text.copy(destination.data(), text.size()) : 0;
  destination[length] = '\0';
  return fits ? 0 : -1;
}

/// No statement can hold a NUL: it ends the text.
int escape_literal(std::span<char> destination, const char* source, std::size_t length) {
  if (!destination.data() || !source) return -1;
  std::string escaped;
  append_literal(escaped, {source, strnlen(source, length)});
  return store(destination, escaped);
}

int escape_pattern(std::span<char> destination, const char* source) {
  if (!destination.data() || !source) return -1;
  std::string escaped;
  for (const char* c = source; *c; ++c) {
    if (*c == '\\' || *c == '%' || *c == '_') escaped += '\\';
    escaped += *c;
  }
  return store(destination, escaped);
}

}  // namespace
}  // namespace mediidx::platform

using namespace mediidx::platform;

extern "C" int TAVODBEscapeString(char* destination, const char* source, size_t length) {
  return no_throw(-1,
                  [&] { return escape_literal({destination, 2 * length + 1}, source, length); });
}

extern "C" int TAVODBEscapeStringEX2(int databaseType, char* destination, size_t size,
                                     const char* source, size_t length) {
  if (databaseType != TAVODB_TYPE_POSTGRESQL) return -1;
  return no_throw(-1, [&] { return escape_literal({destination, size}, source, length); });
}

extern "C" int TAVODBEscapeBackslash(char* destination, size_t size, const char* source) {
  return no_throw(-1, [&] { return escape_pattern({destination, size}, source); });
}

extern "C" int TAVODBEscapeBackslashEX2(int databaseType, char* destination, size_t size,
                                        const char* source) {
  if (databaseType != TAVODB_TYPE_POSTGRESQL) return -1;
  return TAVODBEscapeBackslash(destination, size, source);
}

extern "C" int EscapeConditionEX(tavodb_connection*, const char* condition, char* destination) {
  return no_throw(-1, [&] {
    if (!condition || !destination) return -1;
    const auto escaped = escape_condition(condition);
    return escaped ? store({destination, 2 * std::strlen(condition) + 1}, *escaped) : -1;
  });
}
