// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/glob.h"

#include <bitset>
#include <cstddef>

namespace mediidx::tool {
namespace {

using Bytes = std::bitset<256>;

/// The bytes of a class, as pairs of a first and a last one.
struct NamedClass {
  std::string_view name;
  std::string_view ranges;
};

constexpr NamedClass kNamedClasses[] = {{"alnum", "09AZaz"},   {"alpha", "AZaz"},
                                        {"blank", "\t\t  "},   {"cntrl", "\x01\x1F\x7F\x7F"},
                                        {"digit", "09"},       {"graph", "!~"},
                                        {"lower", "az"},       {"print", " ~"},
                                        {"punct", "!/:@[`{~"}, {"space", "\t\n\r\r  "},
                                        {"upper", "AZ"},       {"xdigit", "09AFaf"}};

void add_range(Bytes& bytes, char first, char last) {
  for (unsigned c = static_cast<unsigned char>(first); c <= static_cast<unsigned char>(last); ++c) {
    bytes.set(c);
  }
}

bool add_named_class(Bytes& bytes, std::string_view name) {
  for (const auto& known : kNamedClasses) {
    if (known.name != name) continue;
    for (std::size_t i = 0; i < known.ranges.size(); i += 2) {
      add_range(bytes, known.ranges[i], known.ranges[i + 1]);
    }
    return true;
  }
  return false;
}

std::string byte_regex(unsigned byte) {
  constexpr const char* kDigits = "0123456789ABCDEF";
  return {'\\', 'x', kDigits[byte / 16], kDigits[byte % 16]};
}

std::string regex_of(const Bytes& bytes) {
  std::string regex = "[";
  for (unsigned first = 0; first < bytes.size(); ++first) {
    if (!bytes[first]) continue;
    unsigned last = first;
    while (last + 1 < bytes.size() && bytes[last + 1]) ++last;
    regex += byte_regex(first) + "-" + byte_regex(last);
    first = last;
  }
  return regex + "]";
}

class GlobReader {
 public:
  explicit GlobReader(std::string_view glob) : glob_(glob) {}

  std::optional<std::string> read() {
    while (at_ < glob_.size() && can_match_) take_one();
    return can_match_ ? std::optional(std::move(regex_)) : std::nullopt;
  }

 private:
  /// The byte some places on; 0 behind the end, as no pattern has one inside.
  char peek(std::size_t ahead = 0) const {
    return at_ + ahead < glob_.size() ? glob_[at_ + ahead] : '\0';
  }
  char next() {
    const char c = peek();
    can_match_ = can_match_ && c != '\0';
    ++at_;
    return c;
  }
  /// What stands for itself, or the byte behind a backslash.
  char next_plain() {
    const char c = next();
    return c == '\\' ? next() : c;
  }

  void take_one() {
    switch (peek()) {
      case '*':
        take_stars();
        break;
      case '?':
        ++at_;
        regex_ += "[^/]";
        break;
      case '[':
        ++at_;
        take_class();
        break;
      default:
        regex_ += byte_regex(static_cast<unsigned char>(next_plain()));
    }
  }

  void take_stars() {
    // git matches plain text at the beginning by itself, and what follows as if it began there.
    const bool begins_name = at_ == glob_.find_first_of("*?[\\") || glob_[at_ - 1] == '/';
    const auto first = at_;
    while (peek() == '*') ++at_;
    const bool ends_name = peek() == '\0' || peek() == '/' || (peek() == '\\' && peek(1) == '/');
    if (at_ - first == 1 || !begins_name || !ends_name) {
      regex_ += "[^/]*";
    } else if (peek() == '/') {
      ++at_;
      regex_ += "(?:.*/)?";
    } else {
      regex_ += ".*";
    }
  }

  void take_class() {
    Bytes bytes;
    const bool negated = peek() == '!' || peek() == '^';
    if (negated) ++at_;
    // A "]" in the first place stands for itself.
    do take_member(bytes);
    while (can_match_ && peek() != ']');
    ++at_;
    if (negated) bytes.flip();
    bytes.reset('/');
    can_match_ = can_match_ && bytes.any();
    if (can_match_) regex_ += regex_of(bytes);
  }

  void take_member(Bytes& bytes) {
    if (peek() == '[' && peek(1) == ':') {
      const auto end = glob_.find(']', at_ + 2);
      if (end == std::string_view::npos) {
        can_match_ = false;
        return;
      }
      if (end > at_ + 2 && glob_[end - 1] == ':') {
        can_match_ = add_named_class(bytes, glob_.substr(at_ + 2, end - 1 - (at_ + 2)));
        at_ = end + 1;
        return;
      }
    }
    const char first = next_plain();
    char last = first;
    if (peek() == '-' && peek(1) != '\0' && peek(1) != ']') {
      ++at_;
      last = next_plain();
    }
    if (can_match_) add_range(bytes, first, last);
  }

  std::string_view glob_;
  std::size_t at_ = 0;
  std::string regex_;
  bool can_match_ = true;
};

}  // namespace

std::optional<std::string> regex_of_glob(std::string_view glob) { return GlobReader(glob).read(); }

}  // namespace mediidx::tool
