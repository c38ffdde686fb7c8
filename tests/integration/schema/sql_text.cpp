// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "sql_text.h"

#include <strings.h>

#include <cctype>

namespace mediidx::test {
namespace {

enum class Kind { kWord, kLiteral, kNumber, kSign };

struct Token {
  Kind kind;
  std::string_view text;  ///< A literal's with its quotes.
};

bool is_word(char c) {
  return std::isalnum(static_cast<unsigned char>(c)) || c == '_' || (c & 0x80) != 0;
}

/// The end of the quoted text that begins at `at`; doubled quotes are part of it.
std::size_t end_of_quoted(std::string_view sql, std::size_t at) {
  const char quote = sql[at++];
  for (; at < sql.size(); ++at) {
    if (sql[at] != quote) continue;
    if (at + 1 == sql.size() || sql[at + 1] != quote) return at + 1;
    ++at;
  }
  return sql.size();
}

std::vector<Token> tokens(std::string_view sql) {
  std::vector<Token> found;
  for (std::size_t at = 0; at < sql.size();) {
    const char c = sql[at];
    std::size_t end = at + 1;
    Kind kind = Kind::kSign;
    if (std::isspace(static_cast<unsigned char>(c))) {
      ++at;
      continue;
    }
    if (c == '\'' || c == '"') {
      end = end_of_quoted(sql, at);
      kind = c == '"' ? Kind::kWord : Kind::kLiteral;
    } else if (is_word(c)) {
      while (end < sql.size() && (is_word(sql[end]))) ++end;
      kind = std::isdigit(static_cast<unsigned char>(c)) ? Kind::kNumber : Kind::kWord;
    }
    found.push_back({kind, sql.substr(at, end - at)});
    at = end;
  }
  return found;
}

bool is(const Token& token, std::string_view word) {
  return token.text.size() == word.size() &&
         strncasecmp(token.text.data(), word.data(), word.size()) == 0;
}

std::string_view unquoted(std::string_view literal) {
  return literal.size() < 2 ? std::string_view() : literal.substr(1, literal.size() - 2);
}

/// Calls `wildcard(c)` and `text()` for the parts of a pattern; escaped signs are text.
template <class Wildcard, class Text>
void walk_pattern(std::string_view pattern, Wildcard wildcard, Text text) {
  for (std::size_t i = 0; i < pattern.size(); ++i) {
    if (pattern[i] == '%' || pattern[i] == '_') {
      wildcard(pattern[i]);
    } else {
      if (pattern[i] == '\\') ++i;
      text();
    }
  }
}

std::string shape_of_pattern(std::string_view pattern) {
  if (pattern == "/%") return "/%";  // every absolute path: not like any other prefix
  std::string shape;
  walk_pattern(
      pattern, [&](char c) { shape += c; },
      [&] {
        if (!shape.ends_with('x')) shape += 'x';
      });
  return shape;
}

/// The number of tokens up to the ")" that closes the list of values at `first`, 0 when there is
/// no such list.
std::size_t length_of_list(const std::vector<Token>& all, std::size_t first) {
  if (first + 1 >= all.size() || !is(all[first], "(") || all[first + 1].kind == Kind::kWord)
    return 0;
  std::size_t last = first;
  while (last < all.size() && !is(all[last], ")")) ++last;
  return last - first + 1;
}

}  // namespace

std::vector<std::string> split_statements(std::string_view text) {
  std::vector<std::string> statements;
  const char* begin = text.data();
  const char* end = begin;  // of what belongs to the statement so far
  bool blank = true;
  const auto finish = [&](const char* next) {
    if (!blank) statements.emplace_back(begin, end);
    begin = end = next;
    blank = true;
  };
  for (const auto& token : tokens(text)) {
    const char* after = token.text.data() + token.text.size();
    if (token.text == ";") {
      finish(after);
      continue;
    }
    if (blank) begin = token.text.data();
    blank = false;
    end = after;
  }
  finish(end);
  return statements;
}

std::string shape_of(std::string_view statement) {
  const auto all = tokens(statement);
  std::string shape;
  for (std::size_t i = 0; i < all.size(); ++i) {
    const auto& token = all[i];
    const bool is_sign_of_number = token.text == "-" && i + 1 < all.size() &&
                                   all[i + 1].kind == Kind::kNumber && i > 0 &&
                                   all[i - 1].kind == Kind::kSign && all[i - 1].text != ")";
    if (is_sign_of_number) continue;
    if (!shape.empty()) shape += ' ';
    if (token.kind == Kind::kNumber) {
      shape += '0';
    } else if (token.kind == Kind::kLiteral) {
      const bool is_pattern = i > 0 && is(all[i - 1], "like");
      shape += "'" + (is_pattern ? shape_of_pattern(unquoted(token.text)) : "?") + "'";
    } else if (const auto length = i > 0 && is(all[i - 1], "in") ? length_of_list(all, i) : 0) {
      shape += "(...)";
      i += length - 1;
    } else {
      shape += token.text;
    }
  }
  return shape;
}

std::size_t oddness(std::string_view statement) {
  constexpr std::size_t kShortest = 8;
  constexpr std::size_t kLongest = 40;
  const auto all = tokens(statement);
  std::size_t odd = 0;
  for (std::size_t i = 1; i < all.size(); ++i) {
    if (is(all[i - 1], "in")) odd += length_of_list(all, i);
    if (all[i].kind != Kind::kLiteral) continue;
    if (all[i].text == "''") odd += kLongest;
    if (!is(all[i - 1], "like")) continue;
    std::size_t fixed = 0;
    bool open = false;
    walk_pattern(unquoted(all[i].text), [&](char) { open = true; }, [&] { ++fixed; });
    if (open && fixed < kShortest) odd += (kShortest - fixed) * kLongest;
    if (open && fixed > kLongest) odd += fixed - kLongest;
  }
  return odd;
}

}  // namespace mediidx::test
