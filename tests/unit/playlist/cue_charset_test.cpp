// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/cue_charset.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using mediidx::detect_charset;
using namespace std::string_literals;

constexpr const char* kAscii = "FILE \"a.wav\" WAVE\n  TRACK 01 AUDIO\n    INDEX 01 00:00:00\n";
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

TEST(UndecidedCharset, IsNotToldWithoutACodePage) {
  EXPECT_FALSE(detect_charset(kLatin, ""));
  EXPECT_FALSE(detect_charset(kLatin, "nosuch"));
  EXPECT_FALSE(detect_charset(kLatin, "ENU"));
}

TEST(Ucs2, HasTheByteOrderOfItsMark) {
  EXPECT_EQ(detect_charset("\xFE\xFF\0T\0I\0T\0L\0E\0 \0a\0\n"s, ""), "UCS-2BE");
  EXPECT_EQ(detect_charset("\xFF\xFET\0I\0T\0L\0E\0 \0a\0\n\0"s, ""), "UCS-2LE");
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

}  // namespace
