// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavodb.h>

#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>

#include "border.h"
#include "escape.h"

namespace mediidx::platform {
namespace {

constexpr std::string_view kMark = "@TAVO:";

/// The values of a call, each read once. (A va_list of its own could not be handed on by
/// reference.)
struct Values {
  std::va_list list;
};

/// Calls `append` with the next value, a text; false when it is null.
template <class Append>
bool append_text(std::string& out, Values& values, Append append) {
  const char* text = va_arg(values.list, const char*);
  if (!text) return false;
  append(out, text);
  return true;
}

/// Appends the next value as the placeholder of this name wants it; false when there is no such
/// placeholder or the value is null.
bool append_value(std::string& out, std::string_view placeholder, Values& values) {
  if (placeholder == "VAR") return append_text(out, values, append_literal);
  if (placeholder == "LVAR") return append_text(out, values, append_pattern);
  if (placeholder == "NEVAR") {
    return append_text(out, values, [](std::string& to, const char* text) { to += text; });
  }
  if (placeholder == "INT") {
    out += std::to_string(va_arg(values.list, int));
  } else if (placeholder == "LLINT") {
    out += std::to_string(va_arg(values.list, long long));
  } else {
    return false;
  }
  return true;
}

/// Takes the capital letters off the front of `text`.
std::string_view take_word(std::string_view& text) {
  std::size_t length = 0;
  while (length < text.size() && text[length] >= 'A' && text[length] <= 'Z') ++length;
  const auto word = text.substr(0, length);
  text.remove_prefix(length);
  return word;
}

std::optional<std::string> fill(std::string_view sql, Values& values) {
  std::string out;
  out.reserve(2 * sql.size());
  for (std::size_t mark; (mark = sql.find(kMark)) != sql.npos;) {
    out.append(sql, 0, mark);
    sql.remove_prefix(mark + kMark.size());
    if (!append_value(out, take_word(sql), values)) return std::nullopt;
  }
  out.append(sql);
  return out;
}

/// A copy for free(); null without memory.
char* copied(std::string_view text) {
  auto* copy = static_cast<char*>(std::malloc(text.size() + 1));
  if (copy) copy[text.copy(copy, text.size())] = '\0';
  return copy;
}

}  // namespace
}  // namespace mediidx::platform

extern "C" char* TAVODBEscapeStringEX3(int databaseType, const char* sql, ...) {
  using namespace mediidx::platform;
  if (databaseType != TAVODB_TYPE_POSTGRESQL || !sql) return nullptr;
  Values values;
  va_start(values.list, sql);
  char* filled = no_throw<char*>(nullptr, [&]() -> char* {
    const auto text = fill(sql, values);
    return text ? copied(*text) : nullptr;
  });
  va_end(values.list);
  return filled;
}
