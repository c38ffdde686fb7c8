// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "text/utf8.h"

#include <gtest/gtest.h>

#include <clocale>

namespace mediidx::tool {
namespace {

struct TextCase {
  const char* name;
  std::string_view text;
  std::string_view expected;
};
std::string case_name(const testing::TestParamInfo<TextCase>& test) { return test.param.name; }

class CleanText : public testing::TestWithParam<TextCase> {};
TEST_P(CleanText, IsWhatTheIndexStores) {
  EXPECT_EQ(clean_text(GetParam().text), GetParam().expected);
}
using namespace std::string_view_literals;
INSTANTIATE_TEST_SUITE_P(
    Cases, CleanText,
    testing::Values(TextCase{"PlainTextStays", "Wish You Were Here", "Wish You Were Here"},
                    TextCase{"OtherScriptsStay", "夜の港 Мельница 🌊", "夜の港 Мельница 🌊"},
                    TextCase{"EmptyStaysEmpty", "", ""},
                    TextCase{"TextEndsAtTheFirstNul", "one\0two"sv, "one"},
                    TextCase{"LineEndsBecomeOneSpace", "one\r\n\ttwo", "one two"},
                    TextCase{"SpacesWithinStay", "one  two", "one  two"},
                    TextCase{"SpaceAroundGoes", " \n one \t", "one"},
                    TextCase{"ControlCharactersGo", "b\x07\x1B[31mell\x7F", "b[31mell"},
                    TextCase{"WideControlCharactersGo", "a\xC2\x9Bz", "az"},
                    TextCase{"InvalidByteIsReplaced", "caf\xE9", "caf\xEF\xBF\xBD"},
                    TextCase{"CutCharacterIsReplaced", "a\xE5\xA4", "a\xEF\xBF\xBD\xEF\xBF\xBD"},
                    TextCase{"OverlongSlashIsReplaced", "\xC0\xAF", "\xEF\xBF\xBD\xEF\xBF\xBD"},
                    TextCase{"SurrogateIsReplaced", "\xED\xA0\x80",
                             "\xEF\xBF\xBD\xEF\xBF\xBD\xEF\xBF\xBD"},
                    TextCase{"BeyondUnicodeIsReplaced", "\xF4\x90\x80\x80",
                             "\xEF\xBF\xBD\xEF\xBF\xBD\xEF\xBF\xBD\xEF\xBF\xBD"}),
    case_name);

TEST(CleanText, IsAlwaysValid) {
  for (int first = 1; first < 256; ++first) {
    for (int second = 0; second < 256; ++second) {
      const std::string text{static_cast<char>(first), static_cast<char>(second), 'z'};
      EXPECT_TRUE(is_utf8(clean_text(text))) << first << " " << second;
    }
  }
}

class DisplayText : public testing::TestWithParam<TextCase> {};
TEST_P(DisplayText, CannotSteerATerminal) {
  EXPECT_EQ(escape_for_display(GetParam().text), GetParam().expected);
}
INSTANTIATE_TEST_SUITE_P(
    Cases, DisplayText,
    testing::Values(TextCase{"PlainTextStays", "a'b%c\\d 海", "a'b%c\\d 海"},
                    TextCase{"LineEnd", "a\nb", "a\\nb"}, TextCase{"Tab", "a\tb", "a\\tb"},
                    TextCase{"EscapeCharacter", "\x1B[2J", "\\x1B[2J"},
                    TextCase{"Delete", "\x7F", "\\x7F"},
                    TextCase{"InvalidByte", "caf\xE9.mp3", "caf\\xE9.mp3"},
                    TextCase{"WideControl", "\xC2\x9B", "\\u{009B}"},
                    TextCase{"DirectionOverride", "\xE2\x80\xAE", "\\u{202E}"}),
    case_name);

TEST(Utf8, RefusesWhatPostgresRefuses) {
  EXPECT_TRUE(is_utf8(""));
  EXPECT_TRUE(is_utf8("\xF4\x8F\xBF\xBF"));
  EXPECT_FALSE(is_utf8("\xFF"));
  EXPECT_FALSE(is_utf8("\xED\xBF\xBF"));
  EXPECT_FALSE(is_utf8("a\xC3"));
}

class DisplayWidth : public testing::Test {
 protected:
  DisplayWidth() { std::setlocale(LC_CTYPE, "C.UTF-8"); }
};

TEST_F(DisplayWidth, CountsColumnsNotBytes) {
  EXPECT_EQ(display_width("abc"), 3);
  EXPECT_EQ(display_width("夜の港"), 6);
  EXPECT_EQ(display_width("cafe\xCC\x81"), 4);
}

TEST_F(DisplayWidth, LongTextIsCutWithAnEllipsis) {
  EXPECT_EQ(cut_to_width("abcdef", 6, false), "abcdef");
  EXPECT_EQ(cut_to_width("abcdefg", 6, false), "abcde…");
  EXPECT_EQ(cut_to_width("/music/a.mp3", 7, true), "…/a.mp3");
  EXPECT_EQ(cut_to_width("夜の港", 4, false), "夜…");
  EXPECT_EQ(cut_to_width("abc", 0, false), "");
}

}  // namespace
}  // namespace mediidx::tool
