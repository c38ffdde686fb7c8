// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "statement_splitter.h"

namespace tavodb {
namespace {

bool is_space(char c) { return c == ' ' || (c >= '\t' && c <= '\r'); }

bool is_name_start(char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' ||
         static_cast<unsigned char>(c) >= 0x80;
}

bool is_name_part(char c) {
  return is_name_start(c) || (c >= '0' && c <= '9') || c == '$';
}

/// Reads a text as PostgreSQL's lexer does, as far as ";" is concerned.
class Scanner {
public:
  explicit Scanner(std::string_view text) : text_(text) {}

  bool at_end() const { return at_ >= text_.size(); }
  std::size_t position() const { return at_; }
  char current() const { return text_[at_]; }

  /// Passes over one token; true when it was more than white space or a
  /// comment.
  bool skip_token() {
    const char c = current();
    if (is_space(c))
      return ++at_, false;
    if (starts_with("--"))
      return skip_to("\n"), false;
    if (starts_with("/*"))
      return skip_block_comment(), false;
    if (c == '\'')
      return skip_quoted('\'', false), true;
    if (c == '"')
      return skip_quoted('"', false), true;
    if ((c == 'e' || c == 'E') && at_ + 1 < text_.size() &&
        text_[at_ + 1] == '\'') {
      ++at_;
      return skip_quoted('\'', true), true;
    }
    if (is_name_start(c))
      return skip_name(), true;
    if (c == '$' && skip_dollar_quoted())
      return true;
    return ++at_, true;
  }

private:
  bool starts_with(std::string_view prefix) const {
    return text_.substr(at_).substr(0, prefix.size()) == prefix;
  }

  /// Past the next `mark`, or to the end.
  void skip_to(std::string_view mark) {
    const auto found = text_.find(mark, at_);
    at_ = found == text_.npos ? text_.size() : found + mark.size();
  }

  /// A doubled quote ends one literal and begins the next, which comes to the
  /// same.
  void skip_quoted(char quote, bool has_escapes) {
    for (++at_; !at_end(); ++at_) {
      if (has_escapes && current() == '\\') {
        ++at_;
      } else if (current() == quote) {
        if (at_ + 1 >= text_.size() || text_[at_ + 1] != quote)
          break;
        ++at_;
      }
    }
    at_ = at_ < text_.size() ? at_ + 1 : text_.size();
  }

  void skip_block_comment() {
    int depth = 0;
    do {
      if (starts_with("/*")) {
        ++depth;
        at_ += 2;
      } else if (starts_with("*/")) {
        --depth;
        at_ += 2;
      } else {
        ++at_;
      }
    } while (depth > 0 && !at_end());
  }

  void skip_name() {
    while (!at_end() && is_name_part(current()))
      ++at_;
  }

  /// "$tag$ … $tag$"; false when no such literal begins here.
  bool skip_dollar_quoted() {
    auto end = at_ + 1;
    while (end < text_.size() && text_[end] != '$' && is_name_part(text_[end]))
      ++end;
    if (end >= text_.size() || text_[end] != '$')
      return false;
    if (end > at_ + 1 && !is_name_start(text_[at_ + 1]))
      return false;
    const auto tag = text_.substr(at_, end + 1 - at_);
    at_ = end + 1;
    skip_to(tag);
    return true;
  }

  std::string_view text_;
  std::size_t at_ = 0;
};

} // namespace

std::optional<std::string_view> StatementSplitter::next() {
  while (!rest_.empty()) {
    Scanner scanner(rest_);
    bool has_content = false;
    while (!scanner.at_end() && scanner.current() != ';') {
      has_content = scanner.skip_token() || has_content;
    }
    const auto statement = rest_.substr(0, scanner.position());
    rest_.remove_prefix(scanner.at_end() ? rest_.size()
                                         : scanner.position() + 1);
    if (has_content)
      return statement;
  }
  return std::nullopt;
}

} // namespace tavodb
