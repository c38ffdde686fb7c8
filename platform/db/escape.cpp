// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Values made safe. Strings are standard-conforming in every session: only the
// quote is special in a literal, and the backslash only where LIKE reads it.
#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>

#include "border.h"
#include "tavodb.h"

namespace {

bool is_like_special(char c) { return c == '\\' || c == '%' || c == '_'; }

void append_literal(std::string &out, std::string_view value) {
  for (const char c : value) {
    if (c == '\'')
      out += '\'';
    out += c;
  }
}

void append_pattern(std::string &out, std::string_view value) {
  for (const char c : value) {
    if (c == '\'')
      out += '\'';
    if (is_like_special(c))
      out += '\\';
    out += c;
  }
}

/// The word of capital letters after "@TAVO:".
std::string_view placeholder_name(std::string_view text) {
  std::size_t length = 0;
  while (length < text.size() && text[length] >= 'A' && text[length] <= 'Z')
    ++length;
  return text.substr(0, length);
}

/// Appends the value of a placeholder, taken from the arguments; false when it
/// has none.
bool append_value(std::string &out, std::string_view name, va_list &arguments) {
  if (name == "INT")
    return out += std::to_string(va_arg(arguments, int)), true;
  if (name == "LLINT")
    return out += std::to_string(va_arg(arguments, long long)), true;
  if (name != "VAR" && name != "LVAR" && name != "NEVAR")
    return false;
  const char *value = va_arg(arguments, const char *);
  if (!value)
    return false;
  if (name == "VAR")
    append_literal(out, value);
  if (name == "LVAR")
    append_pattern(out, value);
  if (name == "NEVAR")
    out += value;
  return true;
}

std::optional<std::string> fill(std::string_view sql, va_list &arguments) {
  constexpr std::string_view kMark = "@TAVO:";
  std::string out;
  out.reserve(sql.size() * 2);
  for (;;) {
    const auto mark = sql.find(kMark);
    out += sql.substr(0, mark);
    if (mark == sql.npos)
      return out;
    sql.remove_prefix(mark + kMark.size());
    const auto name = placeholder_name(sql);
    if (!append_value(out, name, arguments))
      return std::nullopt;
    sql.remove_prefix(name.size());
  }
}

/// Copies with a terminator; -1 when it does not fit.
int copy_out(const std::string &text, char *destination, std::size_t size) {
  if (text.size() >= size)
    return -1;
  std::memcpy(destination, text.c_str(), text.size() + 1);
  return 0;
}

bool is_known(int database_type) {
  return database_type == TAVODB_TYPE_POSTGRESQL;
}

} // namespace

extern "C" char *TAVODBEscapeStringEX3(int databaseType, const char *sql, ...) {
  if (!is_known(databaseType) || !sql)
    return nullptr;
  va_list arguments;
  va_start(arguments, sql);
  char *text = tavodb::guarded(static_cast<char *>(nullptr), [&]() -> char * {
    const auto filled = fill(sql, arguments);
    return filled ? strdup(filled->c_str()) : nullptr;
  });
  va_end(arguments);
  return text;
}

extern "C" int TAVODBEscapeString(char *destination, const char *source,
                                  size_t length) {
  return TAVODBEscapeStringEX2(TAVODB_TYPE_POSTGRESQL, destination,
                               2 * length + 1, source, length);
}

extern "C" int TAVODBEscapeStringEX2(int databaseType, char *destination,
                                     size_t size, const char *source,
                                     size_t length) {
  if (!is_known(databaseType) || !destination || !source)
    return -1;
  return tavodb::guarded(-1, [&] {
    std::string out;
    append_literal(out, {source, strnlen(source, length)});
    return copy_out(out, destination, size);
  });
}

extern "C" int TAVODBEscapeBackslash(char *destination, size_t size,
                                     const char *source) {
  return TAVODBEscapeBackslashEX2(TAVODB_TYPE_POSTGRESQL, destination, size,
                                  source);
}

extern "C" int TAVODBEscapeBackslashEX2(int databaseType, char *destination,
                                        size_t size, const char *source) {
  if (!is_known(databaseType) || !destination || !source)
    return -1;
  return tavodb::guarded(-1, [&] {
    std::string out;
    for (const char *c = source; *c; ++c) {
      if (is_like_special(*c))
        out += '\\';
      out += *c;
    }
    return copy_out(out, destination, size);
  });
}

extern "C" int EscapeConditionEX(tavodb_connection *, const char *condition,
                                 char *destination) {
  if (!condition || !destination)
    return -1;
  return tavodb::guarded(-1, [&] {
    const std::string_view text(condition);
    const auto opening = text.find('\'');
    const auto closing = text.rfind('\'');
    // The value reaches from the first quote to the last; a lone quote opens
    // one that never ends.
    if (opening != text.npos && opening == closing)
      return -1;
    std::string out(
        text.substr(0, opening == text.npos ? text.size() : opening + 1));
    if (opening != text.npos) {
      append_literal(out, text.substr(opening + 1, closing - opening - 1));
      out += text.substr(closing);
    }
    return copy_out(out, destination, 2 * text.size() + 1);
  });
}
