// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Random texts of what is special to statements and patterns, the same in every run.
#ifndef MEDIIDX_TESTS_PLATFORM_DB_RANDOM_TEXT_H_
#define MEDIIDX_TESTS_PLATFORM_DB_RANDOM_TEXT_H_

#include <array>
#include <random>
#include <string>

namespace mediidx::test {

class RandomTexts {
 public:
  /// At most `longest` pieces, valid UTF-8 without a NUL.
  std::string next(int longest = 24) {
    std::string text;
    for (auto pieces = below(longest + 1); pieces > 0; --pieces) {
      text += kPieces[static_cast<std::size_t>(below(static_cast<int>(kPieces.size())))];
    }
    return text;
  }
  int below(int limit) { return static_cast<int>(source_() % static_cast<unsigned>(limit)); }

 private:
  static constexpr std::array kPieces{
      "'", "''", "\\", "\\'", "%",  "_",  ";",         "--", "/*",          "*/",
      "$", "$$", "\"", "E'",  "\n", "\t", "@TAVO:VAR", "%s", " OR '1'='1'", "$a$",
      "a", "B",  "0",  " ",   "/",  "é",  "音楽",      "ж",  "\x01",        "\x7f"};

  std::mt19937 source_{20};
};

}  // namespace mediidx::test

#endif
