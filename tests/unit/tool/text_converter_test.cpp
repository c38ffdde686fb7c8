// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "converter/text_converter.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <string>

namespace {

using mediidx::tool::TextConverter;
using namespace std::string_literals;

std::string converted(const std::string& text, const std::string& from,
                      const std::string& to = "UTF-8") {
  TextConverter converter(from, to);
  auto out = converter.convert(text);
  return out + converter.finish();
}

std::string converted_bytewise(const std::string& text, const std::string& from) {
  TextConverter converter(from, "UTF-8");
  std::string out;
  for (const char byte : text) out += converter.convert({&byte, 1});
  return out + converter.finish();
}

struct LegacyCase {
  const char* charset;
  std::string bytes;
  const char* text;
  friend void PrintTo(const LegacyCase& test, std::ostream* out) { *out << test.charset; }
};

class LegacyText : public testing::TestWithParam<LegacyCase> {};

TEST_P(LegacyText, BecomesUtf8) {
  EXPECT_EQ(converted(GetParam().bytes, GetParam().charset), GetParam().text);
  EXPECT_EQ(converted_bytewise(GetParam().bytes, GetParam().charset), GetParam().text);
}

INSTANTIATE_TEST_SUITE_P(NamesOfCodePages, LegacyText,
                         testing::Values(LegacyCase{"CP1252", "Caf\xE9 \x80", "Café €"},
                                         LegacyCase{"CP1250", "\xA3\xF3\x9F", "Łóź"},
                                         LegacyCase{"CP1251", "\xCC\xE8\xF0", "Мир"},
                                         LegacyCase{"CP1254", "\xDE\xFD", "Şı"},
                                         LegacyCase{"CP932", "\x93\xFA\x96\x7B \x95\x5C",
                                                    "日本 表"},
                                         LegacyCase{"CP936", "\xD6\xD0\xCE\xC4", "中文"},
                                         LegacyCase{"CP949", "\xC7\xD1\xB1\xB9", "한국"},
                                         LegacyCase{"CP950", "\xA4\xA4\xA4\xE5", "中文"}));

INSTANTIATE_TEST_SUITE_P(NamesOfTheDetector, LegacyText,
                         testing::Values(LegacyCase{"ASCII", "Song", "Song"},
                                         LegacyCase{"GBK", "\xD6\xD0\xCE\xC4", "中文"},
                                         LegacyCase{"BIG5", "\xA4\xA4\xA4\xE5", "中文"},
                                         LegacyCase{"KOI8-R", "\xED\xC9\xD2", "Мир"},
                                         LegacyCase{"KOI8-U", "\xA4\xC4\xC1", "єда"},
                                         LegacyCase{"IBM866", "\x8C\xA8\xE0", "Мир"},
                                         LegacyCase{"MACCYRILLIC", "\x8C\xE8\xF0", "Мир"},
                                         LegacyCase{"ISO-8859-2", "\xA3\xF3\xBC", "Łóź"},
                                         LegacyCase{"ISO-8859-5", "\xBC\xD8\xE0", "Мир"},
                                         LegacyCase{"IBM852", "\x9D\xA2\xAB", "Łóź"},
                                         LegacyCase{"UTF-8", "Caf\xC3\xA9", "Café"}));

INSTANTIATE_TEST_SUITE_P(
    CharactersBeyondUnicode, LegacyText,
    testing::Values(LegacyCase{"UTF-8", "a\xF4\x90\x80\x80z", "a\uFFFDz"},
                    LegacyCase{"UTF-8", "\xF7\xBF\xBF\xBF\xF4\x8F\xBF\xBF", "\uFFFD\U0010FFFF"},
                    LegacyCase{"UTF-8", "\xFB\xBF\xBF\xBF\xBF\xFD\xBF\xBF\xBF\xBF\xBF.",
                               "\uFFFD\uFFFD."},
                    LegacyCase{"UCS-4BE", "\x7F\xFF\xFF\xFF\0\0\0A"s, "\uFFFDA"}));

INSTANTIATE_TEST_SUITE_P(TwoByteUnits, LegacyText,
                         testing::Values(LegacyCase{"UCS-2BE", "\0A\x04\x1C"s, "AМ"},
                                         LegacyCase{"UCS-2LE", "A\0\x1C\x04"s, "AМ"},
                                         LegacyCase{"UCS-2BE", "\xFE\xFF\0A"s, "A"},
                                         LegacyCase{"UCS-2LE",
                                                    "\xFF\xFE"
                                                    "A\0"s,
                                                    "A"},
                                         LegacyCase{"UCS-2LE",
                                                    "A\0\x3C\xD8\x0A\xDF"
                                                    "B\0"s,
                                                    "A\U0001F30AB"},
                                         LegacyCase{"ucs-2be", "\xD8\x3C\xDF\x0A\0B"s,
                                                    "\U0001F30AB"}));

TEST(InvalidText, BecomesReplacementCharacters) {
  EXPECT_EQ(converted("a\xFF"
                      "b",
                      "UTF-8"),
            "a\uFFFDb");
  EXPECT_EQ(converted("a\x81", "CP932"), "a\uFFFD");
  EXPECT_EQ(converted("a\xE4", "UTF-8"), "a\uFFFD");
}

TEST(InvalidText, OfTwoByteUnitsKeepsItsPlace) {
  EXPECT_EQ(converted("A\0\x3C\xD8"
                      "B\0"s,
                      "UCS-2LE"),
            "A\uFFFDB");
  EXPECT_EQ(converted("A\0\x0A\xDF"
                      "B\0"s,
                      "UCS-2LE"),
            "A\uFFFDB");
  EXPECT_EQ(converted("A\0B"s, "UCS-2LE"), "A\uFFFD");
  EXPECT_EQ(converted("A\0\x3C\xD8"s, "UCS-2LE"), "A\uFFFD");
}

TEST(InvalidText, IsAQuestionMarkOutsideUtf8) {
  EXPECT_EQ(converted("a\xFF", "UTF-8", "CP1252"), "a?");
}

// Vietnamese letters wait in the converter for the accent that may follow.
TEST(TheLastLetter, IsNotHeldBack) {
  EXPECT_EQ(converted("ba", "CP1258"), "ba");
  EXPECT_EQ(converted("ba\xEC", "CP1258"), "bá");
}

TEST(ByteOrderMark, IsTakenOffTheBeginningOnly) {
  EXPECT_EQ(converted("\xEF\xBB\xBF"
                      "a\xEF\xBB\xBF",
                      "UTF-8"),
            "a\xEF\xBB\xBF");
  EXPECT_EQ(converted_bytewise("\xEF\xBB\xBF"
                               "a",
                               "UTF-8"),
            "a");
}

TEST(AnEmptyText, StaysEmpty) { EXPECT_EQ(converted("", "CP1258"), ""); }

TEST(ALongText, ComesWhole) {
  const std::string text(100'000, '\xE9');
  std::string expected;
  for (std::size_t i = 0; i < text.size(); ++i) expected += "é";
  EXPECT_EQ(converted(text, "CP1252"), expected);
}

TEST(AnUnknownCharset, IsRefused) {
  EXPECT_THROW(TextConverter("NO-SUCH-SET", "UTF-8"), std::invalid_argument);
  EXPECT_THROW(TextConverter("UTF-8", "NO-SUCH-SET"), std::invalid_argument);
}

}  // namespace
