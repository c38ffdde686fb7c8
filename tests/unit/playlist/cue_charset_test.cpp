// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/cue_charset.h"

#include <enca.h>
#include <gtest/gtest.h>

#include <string>
#include <utility>

#include "converter/text_converter.h"

namespace {

using mediidx::detect_charset;
using namespace std::string_literals;

constexpr const char* kAscii = "FILE \"a.wav\" WAVE\n  TRACK 01 AUDIO\n    INDEX 01 00:00:00\n";
/// One byte that is no letter: the detector cannot tell in any language.
constexpr const char* kTooLittle =
    "TITLE \"a\xFF"
    "z\"\n";
constexpr const char* kLatin = "TITLE \"Caf\xE9\"\nPERFORMER \"\xC9ric\"\n";

TEST(CharsetOfAnEmptyFile, IsNotTold) {
  EXPECT_FALSE(detect_charset("", "enu"));
  EXPECT_FALSE(detect_charset("", ""));
}

TEST(CharsetOfAPlainSheet, IsAsciiByName) { EXPECT_EQ(detect_charset(kAscii, ""), "ASCII"); }

TEST(CharsetOfUtf8, IsToldUnderEveryCodePage) {
  const std::string text = "TITLE \"日本語の歌\"\nPERFORMER \"Éric Тест\"\n";
  for (const char* code : {"", "enu", "jpn", "cht", "utf8", "nosuch"}) {
    EXPECT_EQ(detect_charset(text, code), "UTF-8") << code;
  }
}

TEST(UndecidedCharset, IsThatOfTheCodePage) {
  EXPECT_EQ(detect_charset(kLatin, "enu"), "CP1252");
  EXPECT_EQ(detect_charset(kLatin, "trk"), "CP1254");
  EXPECT_EQ(detect_charset(kLatin, "utf8"), "UTF-8");
}

TEST(UndecidedCharset, IsTheOneOfEachCodePage) {
  const std::pair<const char*, const char*> code_pages[] = {
      {"utf8", "UTF-8"}, {"enu", "CP1252"}, {"fre", "CP1252"}, {"ger", "CP1252"}, {"ita", "CP1252"},
      {"spn", "CP1252"}, {"cht", "CP950"},  {"chs", "CP936"},  {"jpn", "CP932"},  {"krn", "CP949"},
      {"ptb", "CP1252"}, {"rus", "CP1251"}, {"dan", "CP1252"}, {"nor", "CP1252"}, {"sve", "CP1252"},
      {"nld", "CP1252"}, {"plk", "CP1250"}, {"ptg", "CP1252"}, {"hun", "CP1250"}, {"trk", "CP1254"},
      {"csy", "CP1250"}};
  for (const auto& [code, charset] : code_pages) {
    EXPECT_EQ(detect_charset(kTooLittle, code), charset) << code;
  }
}

TEST(UndecidedCharset, IsNotToldWithoutACodePage) {
  EXPECT_FALSE(detect_charset(kLatin, ""));
  EXPECT_FALSE(detect_charset(kLatin, "nosuch"));
  EXPECT_FALSE(detect_charset(kLatin, "ENU"));
}

TEST(Ucs2, HasTheByteOrderOfItsMark) {
  EXPECT_EQ(detect_charset("\xFE\xFF\0T\0I\0T\0L\0E\0 \0a\0\n"s, ""), "UCS-2BE");
  EXPECT_EQ(detect_charset("\xFF\xFET\0I\0T\0L\0E\0 \0a\0\n\0"s, ""), "UCS-2LE");
}

TEST(Ucs2, WithoutAMarkIsLittleEndianUnlessItBeginsWithAZero) {
  std::string big;
  std::string little;
  for (const char c : std::string(40, 'T') + "\n") {
    big += "\0"s + c;
    little += c + "\0"s;
  }
  EXPECT_EQ(detect_charset(big, ""), "UCS-2BE");
  EXPECT_EQ(detect_charset(little, ""), "UCS-2LE");
}

TEST(ChineseText, OfTheTraditionalScriptIsToldToo) {
  // "中文歌曲的名字是什麼我們不知道" in Big5
  const std::string big5 =
      "TITLE \"\xA4\xA4\xA4\xE5\xBA\x71\xA6\xB1\xAA\xBA\xA6\x57\xA6\x72\xAC\x4F\xA4\xB0\xBB\xF2"
      "\xA7\xDA\xAD\xCC\xA4\xA3\xAA\xBE\xB9\x44\"\n";
  EXPECT_EQ(detect_charset(big5, "cht"), "BIG5");
}

TEST(ChineseText, IsToldWithTheHelpOfTheCodePage) {
  // "中文歌曲的名字是什么我们不知道" in GBK
  const std::string gbk =
      "TITLE \"\xD6\xD0\xCE\xC4\xB8\xE8\xC7\xFA\xB5\xC4\xC3\xFB\xD7\xD6\xCA\xC7\xCA\xB2\xC3\xB4"
      "\xCE\xD2\xC3\xC7\xB2\xBB\xD6\xAA\xB5\xC0\"\n";
  EXPECT_EQ(detect_charset(gbk, "chs"), "GBK");
}

TEST(RussianText, IsToldWithTheHelpOfTheCodePage) {
  // "Песня о том, как мы пошли домой" in CP1251
  const std::string russian =
      "TITLE \"\xCF\xE5\xF1\xED\xFF \xEE \xF2\xEE\xEC, \xEA\xE0\xEA \xEC\xFB "
      "\xEF\xEE\xF8\xEB\xE8 \xE4\xEE\xEC\xEE\xE9\"\n";
  EXPECT_EQ(detect_charset(russian, "rus"), "CP1251");
}

TEST(EveryCharsetOfTheDetector, IsKnownToTheConverter) {
  int named = 0;
  for (int charset = 0; charset < static_cast<int>(enca_number_of_charsets()); ++charset) {
    const char* name = enca_charset_name(charset, ENCA_NAME_STYLE_ICONV);
    if (!name) continue;  // not told then: the code page decides
    ++named;
    EXPECT_NO_THROW(mediidx::tool::TextConverter(name, "UTF-8")) << name;
  }
  EXPECT_GT(named, 20);
}

}  // namespace
