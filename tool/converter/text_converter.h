// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Whole texts from any character set that iconv knows.
#ifndef MEDIIDX_TOOL_CONVERTER_TEXT_CONVERTER_H_
#define MEDIIDX_TOOL_CONVERTER_TEXT_CONVERTER_H_

#include <iconv.h>

#include <cstddef>
#include <string>
#include <string_view>

namespace mediidx::tool {

/// Converts a text that comes in pieces. What is not valid in its character set becomes U+FFFD (or
/// "?" where the target has none), and a byte-order mark at its beginning is taken off.
class TextConverter {
 public:
  /// Throws std::invalid_argument for a pair of character sets that iconv does not know.
  TextConverter(const std::string& from, const std::string& to);
  ~TextConverter();
  TextConverter(const TextConverter&) = delete;
  TextConverter& operator=(const TextConverter&) = delete;

  std::string convert(std::string_view piece);
  /// What is still held back, and what an unfinished character at the end gives.
  std::string finish();

 private:
  std::string run(std::string_view text, bool is_last);
  void take_mark_off(std::string& out);

  iconv_t descriptor_;
  std::size_t unit_;         ///< Bytes to go on by after an invalid character.
  std::string rest_;         ///< The beginning of a character whose end is still to come.
  std::string replacement_;  ///< For bytes that are no character, in the target character set.
  bool at_beginning_ = true;
  bool to_utf8_;
};

}  // namespace mediidx::tool

#endif
