// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavodb.h>

#include <array>
#include <optional>
#include <vector>

#include "fuzz.h"
#include "sql_tokens.h"

namespace {

using namespace mediidx;
using test::SqlToken;

constexpr int kType = TAVODB_TYPE_POSTGRESQL;

/// The escaped condition; it is written to exactly the room that callers give.
std::optional<std::string> escaped(const std::string& condition) {
  std::vector<char> room(2 * condition.size() + 1, '#');
  const int result = EscapeConditionEX(nullptr, condition.c_str(), room.data());
  fuzz::check(result == 0 || result == -1);
  if (result == -1) return std::nullopt;
  fuzz::check(std::memchr(room.data(), '\0', room.size()) != nullptr);
  return room.data();
}

void check_comparison(const std::string& value) {
  for (const auto& [before, after] : {std::array{" path='", "' "}, std::array{"id = '", "'"}}) {
    const auto condition = escaped(before + value + after);
    fuzz::check(condition.has_value());
    const auto tokens = test::sql_tokens(*condition);
    fuzz::check(tokens.size() == 3 && tokens[0].kind == SqlToken::Kind::kWord &&
                tokens[1] == SqlToken{SqlToken::Kind::kSign, "="} &&
                tokens[2] == SqlToken{SqlToken::Kind::kLiteral, value});
  }
}

/// The tokens of the buffer's text as a literal's.
std::vector<SqlToken> as_literal(const std::vector<char>& text) {
  return test::sql_tokens("'" + std::string(text.data()) + "'");
}

/// Each call with exactly the room that it needs, and with a byte less.
void check_literal(const std::string& text) {
  const std::vector<SqlToken> expected{{SqlToken::Kind::kLiteral, text}};
  std::vector<char> room(2 * text.size() + 1, '#');
  fuzz::check(TAVODBEscapeString(room.data(), text.c_str(), text.size()) == 0);
  fuzz::check(as_literal(room) == expected);

  std::vector<char> tight(std::strlen(room.data()) + 1, '#');
  const auto size = tight.size();
  const auto escape = [&](int type, std::size_t given) {
    return TAVODBEscapeStringEX2(type, tight.data(), given, text.c_str(), text.size());
  };
  fuzz::check(escape(kType, size - 1) == -1 && escape(kType + 1, size) == -1);
  fuzz::check(escape(kType, size) == 0 && as_literal(tight) == expected);

  const std::string literal = tight.data();
  std::vector<char> pattern(3 * literal.size() + 1, '#');
  fuzz::check(TAVODBEscapeBackslash(pattern.data(), pattern.size(), literal.c_str()) == 0);
  const auto tokens = as_literal(pattern);
  fuzz::check(tokens.size() == 1 && test::sole_match(tokens[0].text) == text);
  std::vector<char> short_of_one(std::strlen(pattern.data()), '#');
  for (const int type : {kType, kType + 1}) {
    fuzz::check(TAVODBEscapeBackslashEX2(type, short_of_one.data(), short_of_one.size(),
                                         literal.c_str()) == -1);
  }
}

}  // namespace

/// What the text becomes as a literal, as a pattern, as the value of a condition and as a whole
/// condition.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const auto text = fuzz::Input(data, size).text();
  check_literal(text);
  check_comparison(text);
  const auto quotes = std::ranges::count(text, '\'');
  const auto condition = escaped(text);
  fuzz::check(condition.has_value() == (quotes != 1));
  if (quotes == 0) fuzz::check(condition == text);
  return 0;
}
