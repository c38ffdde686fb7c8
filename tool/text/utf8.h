// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Text from media files and folders, whose bytes may be anything.
#ifndef MEDIIDX_TOOL_TEXT_UTF8_H_
#define MEDIIDX_TOOL_TEXT_UTF8_H_

#include <cstddef>
#include <string>
#include <string_view>

namespace mediidx::tool {

/// The character at the beginning of a text. What is no UTF-8 is a character of one byte, not
/// valid.
struct Character {
  std::size_t length;
  char32_t code;
  bool valid;
};

/// `text` is not empty.
Character first_character(std::string_view text);

bool is_utf8(std::string_view text);

/// A tag's text as the index stores it: valid UTF-8 (U+FFFD for what is not), up to the first NUL,
/// white space of any kind as one space for a run that has a control character, other control
/// characters left out, nothing but text at both ends.
std::string clean_text(std::string_view text);

/// A text as it may stand in a line on a terminal: control characters and invalid bytes as "\n",
/// "\t", "\xNN" or "\u{NNNN}".
std::string escape_for_display(std::string_view text);

/// Terminal columns of a valid text without control characters.
int display_width(std::string_view text);

/// The text cut to `width` columns, "…" in place of its end (or, with `keep_end`, its beginning).
std::string cut_to_width(std::string_view text, int width, bool keep_end);

}  // namespace mediidx::tool

#endif
