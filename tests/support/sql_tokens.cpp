// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "sql_tokens.h"

#include <algorithm>

namespace mediidx::test {
namespace {

using Kind = SqlToken::Kind;

constexpr std::string_view kSpaces = " \t\n\r\f";
constexpr std::string_view kNewlines = "\n\r";
constexpr std::string_view kOperatorSigns = "~!@#^&|`?+-*/%<>=";
/// With one of these within, an operator may end in "+" or "-".
constexpr std::string_view kLooseOperatorSigns = "~!@#^&|`?%";

constexpr bool is_in(std::string_view set, char c) { return set.find(c) != set.npos; }
constexpr bool is_digit(char c) { return c >= '0' && c <= '9'; }
constexpr bool begins_word(char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' ||
         static_cast<unsigned char>(c) >= 0x80;
}
constexpr bool is_letter(char c, char small) { return c == small || c == small - 'a' + 'A'; }

class Lexer {
 public:
  explicit Lexer(std::string_view text) : text_(text) {}

  std::vector<SqlToken> read() {
    while (skip_blanks()) take_token();
    return std::move(tokens_);
  }

 private:
  char peek(std::size_t ahead = 0) const {
    return at_ + ahead < text_.size() ? text_[at_ + ahead] : '\0';
  }
  bool is_at(std::string_view begin) const { return text_.substr(at_).starts_with(begin); }
  void add(Kind kind, std::string text) { tokens_.push_back({kind, std::move(text)}); }
  void add_to(Kind kind, std::size_t end) {
    add(kind, std::string(text_.substr(at_, end - at_)));
    at_ = std::min(end, text_.size());
  }
  void add_broken() { add_to(Kind::kBroken, text_.size()); }
  /// Where the run of characters that `holds` takes ends.
  template <class Predicate>
  std::size_t run_end(std::size_t begin, Predicate holds) const {
    while (begin < text_.size() && holds(text_[begin])) ++begin;
    return begin;
  }

  /// False at the end. What opens a comment that nothing closes is a token.
  bool skip_blanks() {
    while (at_ < text_.size()) {
      if (is_in(kSpaces, peek())) {
        ++at_;
      } else if (is_at("--")) {
        at_ = std::min(text_.find_first_of(kNewlines, at_), text_.size());
      } else if (const auto end = is_at("/*") ? comment_end() : text_.npos; end != text_.npos) {
        at_ = end;
      } else {
        return true;
      }
    }
    return false;
  }

  std::size_t comment_end() const {
    int depth = 0;
    for (auto at = at_; at + 1 < text_.size();) {
      const auto two = text_.substr(at, 2);
      const bool opens = two == "/*";
      const bool closes = two == "*/";
      at += opens || closes ? 2 : 1;
      depth += opens ? 1 : closes ? -1 : 0;
      if (depth == 0) return at;
    }
    return text_.npos;
  }

  void take_token() {
    const char c = peek();
    if (is_at("/*")) return add_broken();
    if (c == '\'') return take_literal(0, false);
    if (c == '"') return take_name(0);
    if (is_letter(c, 'e') && peek(1) == '\'') return take_literal(1, true);
    if ((is_letter(c, 'b') || is_letter(c, 'x')) && peek(1) == '\'') return take_literal(1, false);
    if (is_letter(c, 'u') && peek(1) == '&' && peek(2) == '\'') return take_literal(2, false);
    if (is_letter(c, 'u') && peek(1) == '&' && peek(2) == '"') return take_name(2);
    if (c == '$') return take_dollar();
    if (begins_word(c)) {
      return add_to(Kind::kWord, run_end(at_, [](char each) {
                      return begins_word(each) || is_digit(each) || each == '$';
                    }));
    }
    if (is_digit(c) || (c == '.' && is_digit(peek(1)))) return take_number();
    if (is_in(kOperatorSigns, c)) return take_operator();
    add_to(Kind::kSign, at_ + 1);
  }

  void take_name(std::size_t prefix) {
    std::string name;
    for (auto at = at_ + prefix + 1; at < text_.size(); ++at) {
      if (text_[at] == '"' && text_.substr(at + 1, 1) != "\"") {
        at_ = at + 1;
        return add(Kind::kName, name);
      }
      if (text_[at] == '"') ++at;
      name += text_[at];
    }
    add_broken();
  }

  void take_literal(std::size_t prefix, bool escapes) {
    std::string value;
    for (auto at = at_ + prefix + 1; at < text_.size(); ++at) {
      if (escapes && text_[at] == '\\') {
        if (++at < text_.size()) value += unescaped(text_[at]);
      } else if (text_[at] != '\'') {
        value += text_[at];
      } else if (text_.substr(at + 1, 1) == "'") {
        value += text_[at++];
      } else if (const auto more = continuation(at + 1); more != text_.npos) {
        at = more;
      } else {
        at_ = at + 1;
        return add(Kind::kLiteral, value);
      }
    }
    add_broken();
  }

  static std::string unescaped(char c) {
    switch (c) {
      case 'b':
        return "\b";
      case 'f':
        return "\f";
      case 'n':
        return "\n";
      case 'r':
        return "\r";
      case 't':
        return "\t";
      default:
        return is_digit(c) || is_in("xuU", c) ? std::string{'\\', c} : std::string{c};
    }
  }

  /// The quote at which a literal that ended before `at` goes on, on a later line.
  std::size_t continuation(std::size_t at) const {
    bool new_line = false;
    for (; at < text_.size(); ++at) {
      if (text_.substr(at).starts_with("--")) at = text_.find_first_of(kNewlines, at);
      if (at == text_.npos || !is_in(kSpaces, text_[at])) break;
      new_line |= is_in(kNewlines, text_[at]);
    }
    return new_line && at < text_.size() && text_[at] == '\'' ? at : text_.npos;
  }

  void take_dollar() {
    const auto tag_end =
        begins_word(peek(1))
            ? run_end(at_ + 1, [](char c) { return begins_word(c) || is_digit(c); })
            : at_ + 1;
    if (text_.substr(tag_end, 1) == "$") {
      const auto quote = text_.substr(at_, tag_end + 1 - at_);
      const auto close = text_.find(quote, tag_end + 1);
      if (close == text_.npos) return add_broken();
      add(Kind::kLiteral, std::string(text_.substr(tag_end + 1, close - tag_end - 1)));
      at_ = close + quote.size();
    } else {
      add_to(Kind::kSign, run_end(at_ + 1, is_digit));
    }
  }

  void take_number() {
    auto end = run_end(at_, is_digit);
    if (text_.substr(end, 1) == "." && text_.substr(end, 2) != "..")
      end = run_end(end + 1, is_digit);
    if (end < text_.size() && is_letter(text_[end], 'e')) {
      const bool has_sign = end + 1 < text_.size() && is_in("+-", text_[end + 1]);
      const auto digits = end + (has_sign ? 2 : 1);
      if (const auto last = run_end(digits, is_digit); last > digits) end = last;
    }
    add_to(Kind::kNumber, end);
  }

  void take_operator() {
    auto end = run_end(at_, [](char c) { return is_in(kOperatorSigns, c); });
    auto sign = text_.substr(at_, end - at_);
    end = at_ + std::min({sign.size(), sign.find("/*", 1), sign.find("--", 1)});
    sign = text_.substr(at_, end - at_);
    const bool is_loose = sign.find_first_of(kLooseOperatorSigns) != sign.npos;
    while (!is_loose && sign.size() > 1 && is_in("+-", sign.back())) sign.remove_suffix(1);
    add_to(Kind::kSign, at_ + sign.size());
  }

  std::string_view text_;
  std::size_t at_ = 0;
  std::vector<SqlToken> tokens_;
};

}  // namespace

std::vector<SqlToken> sql_tokens(std::string_view sql) { return Lexer(sql).read(); }

std::optional<std::string> sole_match(std::string_view pattern) {
  std::string text;
  for (std::size_t at = 0; at < pattern.size(); ++at) {
    if (pattern[at] == '%' || pattern[at] == '_') return std::nullopt;
    if (pattern[at] == '\\' && ++at == pattern.size()) return std::nullopt;
    text += pattern[at];
  }
  return text;
}

}  // namespace mediidx::test
