// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "support/text.h"

#include <gtest/gtest.h>

#include <array>
#include <string>

namespace mediidx {
namespace {

struct CutCase {
  const char* name;
  std::string_view text;
  std::size_t width;
  std::string_view kept;
};

class CuttingAText : public testing::TestWithParam<CutCase> {};

TEST_P(CuttingAText, EndsAtTheBorderOfACharacter) {
  EXPECT_EQ(cut_at_character(GetParam().text, GetParam().width), GetParam().kept);
}

INSTANTIATE_TEST_SUITE_P(WellFormed, CuttingAText,
                         testing::Values(CutCase{"KeepsAShorterText", "abc", 10, "abc"},
                                         CutCase{"KeepsATextOfTheWidth", "abc", 3, "abc"},
                                         CutCase{"CutsLetters", "abcd", 3, "abc"},
                                         CutCase{"KeepsNothing", "abcd", 0, ""},
                                         CutCase{"DropsHalfOfTwoBytes", "aé!", 2, "a"},
                                         CutCase{"KeepsTwoWholeBytes", "aé!", 3, "aé"},
                                         CutCase{"DropsOneOfThreeBytes", "愛愛", 4, "愛"},
                                         CutCase{"DropsTwoOfThreeBytes", "愛愛", 5, "愛"},
                                         CutCase{"DropsThreeOfFourBytes", "🎵!", 3, ""},
                                         CutCase{"KeepsFourWholeBytes", "🎵!", 4, "🎵"},
                                         CutCase{"DropsAHalfFirstCharacter", "愛", 2, ""}),
                         [](const auto& test) { return std::string(test.param.name); });

INSTANTIATE_TEST_SUITE_P(
    Malformed, CuttingAText,
    testing::Values(CutCase{"CutsLatin1Bytes", "\xff\xff\xff\xff", 2, "\xff\xff"},
                    CutCase{"CutsLooseContinuations", "\x80\x80\x80\x80\x80\x80", 5,
                            "\x80\x80\x80\x80\x80"},
                    CutCase{"CutsBehindAShortSequence", "\xe6zzz", 2, "\xe6z"}),
    [](const auto& test) { return std::string(test.param.name); });

TEST(CuttingAText, TakesAtMostThreeBytesFromIt) {
  for (const std::string character : {"a", "é", "愛", "🎵", "\xff", "\x80"}) {
    std::string text;
    while (text.size() < 64) text += character;
    for (std::size_t width = 0; width < 40; ++width) {
      const auto kept = cut_at_character(text, width);

      EXPECT_LE(kept.size(), width);
      EXPECT_GE(kept.size() + 3, width);
      EXPECT_TRUE(text.starts_with(kept));
    }
  }
}

TEST(CopyingAText, FillsAFieldButForItsTerminator) {
  std::array<char, 4> field;
  field.fill('#');

  copy_text(field, "abcdef");

  EXPECT_STREQ(field.data(), "abc");
}

TEST(CopyingAText, CutsAtTheBorderOfACharacter) {
  std::array<char, 4> field;

  copy_text(field, "ab愛");

  EXPECT_STREQ(field.data(), "ab");
}

TEST(CopyingAText, LeavesRoomBehindItAlone) {
  std::array<char, 5> field;
  field.fill('#');

  copy_text(field, "ab");

  EXPECT_EQ(std::string(field.data(), 5), std::string("ab\0##", 5));
}

TEST(CopyingAText, IntoNoFieldWritesNothing) {
  char byte = '#';

  copy_text(std::span(&byte, 0), "ab");

  EXPECT_EQ(byte, '#');
}

}  // namespace
}  // namespace mediidx
