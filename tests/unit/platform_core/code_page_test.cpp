// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavocore.h>

#include <array>
#include <cstring>
#include <string>

namespace {

struct CodePageCase {
  const char* code;
  const char* text;
  const char* utf8;
};

class CodePage : public testing::TestWithParam<CodePageCase> {};

TEST_P(CodePage, IsConvertedToUtf8) {
  const auto& given = GetParam();
  std::array<char, 64> out{};
  const int written =
      TLIBCUnicodeStrCPToUTF8(given.code, given.text, out.data(), static_cast<int>(out.size()));
  EXPECT_STREQ(out.data(), given.utf8);
  EXPECT_EQ(written, static_cast<int>(std::strlen(given.utf8)) + 1);
}

INSTANTIATE_TEST_SUITE_P(
    Codes, CodePage,
    testing::Values(CodePageCase{"utf8", "日本", "日本"}, CodePageCase{"enu", "caf\xE9", "café"},
                    CodePageCase{"fre", "\x80", "€"}, CodePageCase{"ger", "\xFC", "ü"},
                    CodePageCase{"ita", "\xE0", "à"}, CodePageCase{"spn", "\xF1", "ñ"},
                    CodePageCase{"cht", "\xA4\xA4\xA4\xE5", "中文"},
                    CodePageCase{"chs", "\xD6\xD0\xCE\xC4", "中文"},
                    CodePageCase{"jpn", "\x93\xFA\x96\x7B", "日本"},
                    CodePageCase{"krn", "\xC7\xD1\xB1\xDB", "한글"},
                    CodePageCase{"ptb", "\xE3", "ã"},
                    CodePageCase{"rus", "\xCF\xE5\xF1\xED\xFF", "Песня"},
                    CodePageCase{"dan", "\xF8", "ø"}, CodePageCase{"nor", "\xE5", "å"},
                    CodePageCase{"sve", "\xE4", "ä"}, CodePageCase{"nld", "\xEB", "ë"},
                    CodePageCase{"plk", "\xB3", "ł"}, CodePageCase{"ptg", "\xF5", "õ"},
                    CodePageCase{"hun", "\xF5", "ő"}, CodePageCase{"trk", "\xFE", "ş"},
                    CodePageCase{"csy", "\xF8", "ř"}, CodePageCase{"CP1252", "\xE9", "é"},
                    CodePageCase{"KOI8-R", "\xD0", "п"}, CodePageCase{"enu", "", ""}),
    [](const auto& test) {
      std::string name = test.param.code;
      std::erase(name, '-');
      return name + (*test.param.text ? "" : "Empty");
    });

struct BadCodePageCase {
  const char* name;
  const char* code;
  const char* text;
};

class BadCodePage : public testing::TestWithParam<BadCodePageCase> {};

TEST_P(BadCodePage, IsRefused) {
  std::array<char, 64> out{};
  EXPECT_LT(TLIBCUnicodeStrCPToUTF8(GetParam().code, GetParam().text, out.data(),
                                    static_cast<int>(out.size())),
            1);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, BadCodePage,
    testing::Values(BadCodePageCase{"Unknown", "xyz", "a"}, BadCodePageCase{"Empty", "", "a"},
                    BadCodePageCase{"None", nullptr, "a"},
                    BadCodePageCase{"NoText", "enu", nullptr},
                    BadCodePageCase{"UpperCaseCode", "ENU", "a"},
                    BadCodePageCase{"Flags", "UTF-8//IGNORE", "\xFF"},
                    BadCodePageCase{"NoUtf8", "utf8", "caf\xE9"},
                    BadCodePageCase{"UndefinedByte", "enu", "\x81"},
                    BadCodePageCase{"CutCharacter", "jpn", "\x93"},
                    BadCodePageCase{"BeyondUnicode", "utf8", "\xF4\x90\x80\x80"},
                    BadCodePageCase{"SixBytes", "utf8", "\xFC\xAD\xAD\xAD\xAD\xAD"}),
    [](const auto& test) { return test.param.name; });

TEST(ConvertedText, HasToFitWithItsEnd) {
  std::array<char, 5> out{};
  EXPECT_EQ(TLIBCUnicodeStrCPToUTF8("enu", "ab\xE9", out.data(), 5), 5);
  EXPECT_STREQ(out.data(), "abé");
  EXPECT_LT(TLIBCUnicodeStrCPToUTF8("enu", "ab\xE9", out.data(), 4), 1);
  EXPECT_STREQ(out.data(), "");
  EXPECT_LT(TLIBCUnicodeStrCPToUTF8("enu", "a", out.data(), 0), 1);
  EXPECT_LT(TLIBCUnicodeStrCPToUTF8("enu", "a", nullptr, 5), 1);
}

}  // namespace
