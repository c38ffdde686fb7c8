// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// A statement put together from pieces with one placeholder each, and values for them. Whatever the
// values are, the filled text has the tokens of the template, and each literal holds its value.
#include <tavodb.h>

#include <array>
#include <memory>
#include <span>
#include <string>
#include <variant>
#include <vector>

#include "fuzz.h"
#include "sql_tokens.h"

namespace {

using namespace mediidx;

struct Piece {
  std::string_view before;
  std::string_view placeholder;
  std::string_view after;
};

constexpr std::array kPieces{
    Piece{"SELECT * FROM ", "@TAVO:NEVAR", " WHERE "},
    Piece{"path = '", "@TAVO:VAR", "' AND "},
    Piece{"path like '", "@TAVO:LVAR", "'; "},
    Piece{"path like '", "@TAVO:LVAR", "/%' OR "},
    Piece{"comment LIKE '%", "@TAVO:LVAR", "/%';"},
    Piece{"VALUES('", "@TAVO:VAR", "', "},
    Piece{"'", "@TAVO:VAR", "','"},
    Piece{"", "@TAVO:VAR", "', "},
    Piece{"", "@TAVO:INT", ", "},
    Piece{"'", "@TAVO:INT", "')"},
    Piece{"= ", "@TAVO:LLINT", ";"},
    Piece{"\"", "@TAVO:INT", "\" "},
    Piece{"-- it's ", "@TAVO:INT", "\n"},
    Piece{"/* ' */", "@TAVO:LLINT", "::text "},
};

constexpr std::size_t kMostPieces = 5;
constexpr std::array kTables{"music", "playlist"};

using Value = std::variant<std::string, int, long long>;

struct Filling {
  std::string sql;
  std::string with_texts;  ///< The template with all but the texts of literals filled in.
  std::vector<Value> values;
  std::vector<std::string> literals;  ///< What stands for each text within its literal.
};

std::string in_pattern(const std::string& text) {
  std::string pattern;
  for (const char c : text) {
    if (std::string_view("\\%_").find(c) != std::string_view::npos) pattern += '\\';
    pattern += c;
  }
  fuzz::check(test::sole_match(pattern) == text);
  return pattern;
}

void add(Filling& filling, const Piece& piece, fuzz::Input& input) {
  filling.sql.append(piece.before).append(piece.placeholder).append(piece.after);
  std::string shown(piece.placeholder);
  if (piece.placeholder == "@TAVO:NEVAR") {
    shown = kTables[input.byte() % kTables.size()];
    filling.values.emplace_back(shown);
  } else if (piece.placeholder == "@TAVO:INT" || piece.placeholder == "@TAVO:LLINT") {
    const auto number = static_cast<long long>(std::strtoll(input.text().c_str(), nullptr, 10));
    const auto narrow = static_cast<int>(number);
    const bool is_wide = piece.placeholder == "@TAVO:LLINT";
    if (is_wide) {
      filling.values.emplace_back(number);
    } else {
      filling.values.emplace_back(narrow);
    }
    shown = std::to_string(is_wide ? number : narrow);
  } else {
    const auto text = input.text();
    filling.values.emplace_back(text);
    filling.literals.push_back(piece.placeholder == "@TAVO:LVAR" ? in_pattern(text) : text);
    shown = "\x01";  // No piece has this byte.
  }
  filling.with_texts.append(piece.before).append(shown).append(piece.after);
}

/// Calls with the values as the arguments that they are.
template <class... Done>
std::unique_ptr<char, decltype(&std::free)> filled(const Filling& filling,
                                                   std::span<const Value> values, Done... done) {
  if (values.empty()) {
    return {TAVODBEscapeStringEX3(TAVODB_TYPE_POSTGRESQL, filling.sql.c_str(), done...), std::free};
  }
  const auto rest = values.subspan(1);
  if constexpr (sizeof...(Done) < kMostPieces) {
    if (const auto* text = std::get_if<std::string>(&values[0])) {
      return filled(filling, rest, done..., text->c_str());
    }
    if (const auto* number = std::get_if<int>(&values[0])) {
      return filled(filling, rest, done..., *number);
    }
    return filled(filling, rest, done..., std::get<long long>(values[0]));
  }
  std::abort();
}

/// The tokens that the template has, with the texts in their places.
std::vector<test::SqlToken> expected_tokens(const Filling& filling) {
  auto tokens = test::sql_tokens(filling.with_texts);
  auto literal = filling.literals.begin();
  for (auto& token : tokens) {
    for (std::size_t at = 0; (at = token.text.find('\x01', at)) != token.text.npos;) {
      token.text.replace(at, 1, *literal);
      at += literal++->size();
    }
  }
  return tokens;
}

/// Pieces may leave a literal open: its text is no literal then, and nothing may be filled in.
bool keeps_texts_in_literals(const Filling& filling) {
  std::size_t places = 0;
  for (const auto& token : test::sql_tokens(filling.with_texts)) {
    if (token.kind != test::SqlToken::Kind::kLiteral) continue;
    places += static_cast<std::size_t>(std::ranges::count(token.text, '\x01'));
  }
  return places == filling.literals.size();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  fuzz::Input input(data, size);
  Filling filling;
  const auto pieces = input.byte() % (kMostPieces + 1);
  for (std::size_t i = 0; i < pieces; ++i) {
    add(filling, kPieces[input.byte() % kPieces.size()], input);
  }
  // An odd template of the input's own has no value for its placeholders: none may be asked for.
  auto odd = input.text();
  std::ranges::replace(odd, '\x01', 'x');
  for (std::size_t at = 0; (at = odd.find("@TAVO:", at)) != odd.npos; ++at) odd.insert(at + 6, "?");
  filling.sql += odd;
  const auto text = filled(filling, filling.values);
  if (odd.find("@TAVO:") != odd.npos) {
    fuzz::check(text == nullptr);
    return 0;
  }
  filling.with_texts += odd;
  fuzz::check(text != nullptr);
  if (keeps_texts_in_literals(filling)) {
    fuzz::check(test::sql_tokens(text.get()) == expected_tokens(filling));
  }
  return 0;
}
