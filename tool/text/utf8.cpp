// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "text/utf8.h"

#include <wchar.h>

#include <array>
#include <cstdio>
#include <vector>

namespace mediidx::tool {
namespace {

constexpr std::string_view kReplacement = "\xEF\xBF\xBD";
constexpr std::string_view kEllipsis = "\xE2\x80\xA6";

struct Lead {
  std::size_t length;
  char32_t bits;
  char32_t smallest;  ///< Smaller codes in that many bytes are not valid.
};

constexpr Lead read_lead(unsigned char byte) {
  if (byte < 0x80) return {1, byte, 0};
  if (byte >= 0xC2 && byte < 0xE0) return {2, byte & 0x1FU, 0x80};
  if (byte >= 0xE0 && byte < 0xF0) return {3, byte & 0x0FU, 0x800};
  if (byte >= 0xF0 && byte < 0xF5) return {4, byte & 0x07U, 0x10000};
  return {0, 0, 0};
}

constexpr bool is_surrogate(char32_t code) { return code >= 0xD800 && code < 0xE000; }

constexpr bool is_control(char32_t code) { return code < 0x20 || (code >= 0x7F && code < 0xA0); }

/// Marks that turn the direction of text around or end a line: they make a table lie.
constexpr bool is_layout_mark(char32_t code) {
  return (code >= 0x202A && code <= 0x202E) || (code >= 0x2066 && code <= 0x2069) ||
         code == 0x2028 || code == 0x2029;
}

constexpr bool is_white_space(char32_t code) {
  return code == ' ' || (code >= '\t' && code <= '\r') || code == 0x85;
}

/// A run of white space: as it stands, or one space when it has a line end or a tab.
struct WhiteSpace {
  void take(char32_t code) {
    ++length;
    has_control = has_control || code != ' ';
  }
  std::string text() const { return std::string(has_control ? 1 : length, ' '); }

  std::size_t length = 0;
  bool has_control = false;
};

std::string escaped(char32_t code, bool valid) {
  if (valid && code == '\n') return "\\n";
  if (valid && code == '\t') return "\\t";
  if (valid && code == '\r') return "\\r";
  std::array<char, 16> buffer;
  std::snprintf(buffer.data(), buffer.size(), valid && code > 0x7F ? "\\u{%04X}" : "\\x%02X",
                static_cast<unsigned>(code));
  return buffer.data();
}

/// Columns of one character; marks that combine with the one before take none.
int columns_of(char32_t code) {
  const int columns = wcwidth(static_cast<wchar_t>(code));
  return columns < 0 ? 1 : columns;
}

}  // namespace

Character first_character(std::string_view text) {
  const auto first = static_cast<unsigned char>(text.front());
  const auto lead = read_lead(first);
  const Character invalid{1, first, false};
  if (lead.length == 0 || lead.length > text.size()) return invalid;
  char32_t code = lead.bits;
  for (std::size_t i = 1; i < lead.length; ++i) {
    const auto byte = static_cast<unsigned char>(text[i]);
    if ((byte & 0xC0U) != 0x80U) return invalid;
    code = (code << 6U) | (byte & 0x3FU);
  }
  if (code < lead.smallest || is_surrogate(code) || code > 0x10FFFF) return invalid;
  return {lead.length, code, true};
}

bool is_utf8(std::string_view text) {
  while (!text.empty()) {
    const auto character = first_character(text);
    if (!character.valid) return false;
    text.remove_prefix(character.length);
  }
  return true;
}

std::string clean_text(std::string_view text) {
  text = text.substr(0, text.find('\0'));
  std::string out;
  WhiteSpace space;
  while (!text.empty()) {
    const auto character = first_character(text);
    if (character.valid && is_white_space(character.code)) {
      space.take(character.code);
    } else if (!character.valid || !is_control(character.code)) {
      if (!out.empty()) out += space.text();
      space = {};
      out += character.valid ? text.substr(0, character.length) : kReplacement;
    }
    text.remove_prefix(character.length);
  }
  return out;
}

std::string escape_for_display(std::string_view text) {
  std::string out;
  while (!text.empty()) {
    const auto character = first_character(text);
    if (!character.valid || is_control(character.code) || is_layout_mark(character.code)) {
      out += escaped(character.code, character.valid);
    } else {
      out += text.substr(0, character.length);
    }
    text.remove_prefix(character.length);
  }
  return out;
}

int display_width(std::string_view text) {
  int width = 0;
  while (!text.empty()) {
    const auto character = first_character(text);
    width += columns_of(character.code);
    text.remove_prefix(character.length);
  }
  return width;
}

std::string cut_to_width(std::string_view text, int width, bool keep_end) {
  if (display_width(text) <= width) return std::string(text);
  if (width < 1) return {};
  std::vector<std::string_view> characters;
  for (auto rest = text; !rest.empty();) {
    const auto character = first_character(rest);
    characters.push_back(rest.substr(0, character.length));
    rest.remove_prefix(character.length);
  }
  int left = width - 1;
  std::string out;
  if (keep_end) {
    for (auto i = characters.rbegin(); i != characters.rend(); ++i) {
      left -= display_width(*i);
      if (left < 0) break;
      out.insert(0, *i);
    }
    return std::string(kEllipsis) + out;
  }
  for (const auto character : characters) {
    left -= display_width(character);
    if (left < 0) break;
    out += character;
  }
  return out + std::string(kEllipsis);
}

}  // namespace mediidx::tool
