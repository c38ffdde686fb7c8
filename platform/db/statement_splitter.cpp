// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "statement_splitter.h"

#include <algorithm>

namespace mediidx::platform {
namespace {

constexpr std::string_view kBlanks = " \t\n\r\f";
constexpr std::string_view kLineEnds = "\n\r";

constexpr bool is_in(std::string_view set, char c) { return set.find(c) != set.npos; }

constexpr bool begins_name(char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' ||
         static_cast<unsigned char>(c) >= 0x80;
}
constexpr bool continues_tag(char c) { return begins_name(c) || (c >= '0' && c <= '9'); }
constexpr bool continues_name(char c) { return continues_tag(c) || c == '$'; }

/// Walks over one text, token by token, as far as tokens matter for where a statement ends.
class Scanner {
 public:
  explicit Scanner(std::string_view text) : text_(text) {}

  std::size_t position() const { return at_; }
  bool is_at_end() const { return at_ >= text_.size() || text_[at_] == ';'; }

  /// True when blanks or a whole comment were passed over.
  bool skip_blank() {
    if (is_in(kBlanks, text_[at_])) {
      ++at_;
      return true;
    }
    if (rest().starts_with("--")) {
      move_to(text_.find_first_of(kLineEnds, at_));
      return true;
    }
    return rest().starts_with("/*") && skip_block_comment();
  }

  void skip_token() {
    const char c = text_[at_];
    if (c == '\'' || c == '"') {
      skip_quoted(c);
    } else if (c == '$') {
      skip_dollar();
    } else if ((c == 'e' || c == 'E') && peek(1) == '\'') {
      ++at_;
      skip_escape_string();
    } else if (begins_name(c)) {
      while (at_ < text_.size() && continues_name(text_[at_])) ++at_;
    } else if (rest().starts_with("/*")) {
      at_ = text_.size();  // a comment that is never closed
    } else {
      ++at_;
    }
  }

 private:
  std::string_view rest() const { return text_.substr(at_); }
  char peek(std::size_t ahead) const {
    return at_ + ahead < text_.size() ? text_[at_ + ahead] : '\0';
  }
  void move_to(std::size_t position) { at_ = std::min(position, text_.size()); }

  /// Comments nest. False, and not moved, when this one is never closed.
  bool skip_block_comment() {
    int depth = 0;
    for (auto at = at_; at + 1 < text_.size();) {
      const auto two = text_.substr(at, 2);
      if (two == "/*") {
        ++depth;
      } else if (two == "*/") {
        --depth;
      } else {
        ++at;
        continue;
      }
      at += 2;
      if (depth == 0) {
        at_ = at;
        return true;
      }
    }
    return false;
  }

  /// A doubled quote reads as two literals side by side, which ends at the same place.
  void skip_quoted(char quote) {
    const auto close = text_.find(quote, at_ + 1);
    move_to(close == text_.npos ? close : close + 1);
  }

  /// An E'' literal: backslashes hide quotes, and it goes on in a literal on a later line.
  void skip_escape_string() {
    for (++at_; at_ < text_.size(); ++at_) {
      if (text_[at_] == '\\' || (text_[at_] == '\'' && peek(1) == '\'')) {
        ++at_;
      } else if (text_[at_] == '\'') {
        const auto more = continuation(at_ + 1);
        if (more == text_.npos) break;
        at_ = more;
      }
    }
    move_to(at_ + 1);
  }

  /// Where a literal that ended before `at` is opened again, if it is.
  std::size_t continuation(std::size_t at) const {
    bool new_line = false;
    while (at < text_.size()) {
      if (is_in(kBlanks, text_[at])) {
        new_line |= is_in(kLineEnds, text_[at]);
        ++at;
      } else if (text_.substr(at).starts_with("--")) {
        at = std::min(text_.find_first_of(kLineEnds, at), text_.size());
      } else {
        break;
      }
    }
    return new_line && at < text_.size() && text_[at] == '\'' ? at : text_.npos;
  }

  /// $$...$$ or $tag$...$tag$; any other "$" is passed over alone.
  void skip_dollar() {
    auto end = at_ + 1;
    if (begins_name(peek(1))) {
      while (end < text_.size() && continues_tag(text_[end])) ++end;
    }
    if (end >= text_.size() || text_[end] != '$') {
      ++at_;
      return;
    }
    const auto delimiter = text_.substr(at_, end + 1 - at_);
    const auto close = text_.find(delimiter, end + 1);
    move_to(close == text_.npos ? close : close + delimiter.size());
  }

  std::string_view text_;
  std::size_t at_ = 0;
};

std::string_view without_blanks(std::string_view text) {
  text.remove_prefix(std::min(text.find_first_not_of(kBlanks), text.size()));
  return text.substr(0, text.find_last_not_of(kBlanks) + 1);
}

}  // namespace

std::optional<std::string_view> next_statement(std::string_view& text) {
  while (!text.empty()) {
    Scanner scanner(text);
    bool is_empty = true;
    while (!scanner.is_at_end()) {
      if (scanner.skip_blank()) continue;
      scanner.skip_token();
      is_empty = false;
    }
    const auto statement = text.substr(0, scanner.position());
    text.remove_prefix(std::min(scanner.position() + 1, text.size()));
    if (!is_empty) return without_blanks(statement);
  }
  return std::nullopt;
}

}  // namespace mediidx::platform
