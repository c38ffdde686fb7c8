// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/escape.h"

#include <cstdlib>
#include <cstring>

#include "support/log.h"

namespace mediidx {
namespace {

constexpr int kNoMemory = 280;
constexpr int kNotEscaped = 281;

/// A buffer, and what became of filling it.
struct Filled {
  OwnedText text;
  std::size_t size;

  explicit Filled(std::size_t bytes) : text(static_cast<char*>(std::malloc(bytes))), size(bytes) {
    if (!text) kDatabaseLog.parens(kNoMemory, "Failed to malloc(%d)", static_cast<int>(bytes));
  }
  OwnedText checked(int result) {
    if (result != -1) return std::move(text);
    kDatabaseLog.parens(kNotEscaped, "Failed to escape condition.");
    return nullptr;
  }
};

std::size_t literal_size(const char* text) { return 2 * std::strlen(text) + 1; }
std::size_t pattern_size(const char* literal) { return 3 * std::strlen(literal) + 1; }

}  // namespace

OwnedText escape_literal(const char* text) {
  Filled literal(literal_size(text));
  if (!literal.text) return nullptr;
  return literal.checked(TAVODBEscapeString(literal.text.get(), text, std::strlen(text)));
}

OwnedText escape_pattern(const char* text) {
  const auto literal = escape_literal(text);
  if (!literal) return nullptr;
  Filled pattern(pattern_size(literal.get()));
  if (!pattern.text) return nullptr;
  return pattern.checked(TAVODBEscapeBackslash(pattern.text.get(), pattern.size, literal.get()));
}

OwnedText escape_pattern(int database_type, const char* text) {
  Filled first(literal_size(text));
  if (!first.text) return nullptr;
  const auto literal = first.checked(
      TAVODBEscapeStringEX2(database_type, first.text.get(), first.size, text, std::strlen(text)));
  if (!literal) return nullptr;
  Filled pattern(pattern_size(literal.get()));
  if (!pattern.text) return nullptr;
  return pattern.checked(
      TAVODBEscapeBackslashEX2(database_type, pattern.text.get(), pattern.size, literal.get()));
}

}  // namespace mediidx
