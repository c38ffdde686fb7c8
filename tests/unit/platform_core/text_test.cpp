// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavocore.h>

#include <string>
#include <string_view>

#include "utf8.h"

namespace {

using namespace std::string_literals;

struct TextCase {
  const char* name;
  const char* given;
  const char* expected;
};

std::string name_of(const testing::TestParamInfo<TextCase>& test) { return test.param.name; }

class TrimmingWhiteSpace : public testing::TestWithParam<TextCase> {};

TEST_P(TrimmingWhiteSpace, TakesItOffBothEnds) {
  std::string text = GetParam().given;
  EXPECT_STREQ(StringTrim(text.data()), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, TrimmingWhiteSpace,
    testing::Values(TextCase{"Nothing", "", ""}, TextCase{"OnlyWhiteSpace", " \t\r\n\v\f", ""},
                    TextCase{"BothEnds", " \r\n a b\t\n", "a b"},
                    TextCase{"NoWhiteSpace", "ab", "ab"},
                    TextCase{"NoBreakSpaceStays", "\xC2\xA0x\xC2\xA0", "\xC2\xA0x\xC2\xA0"}),
    name_of);

class TrimmingBlanks : public testing::TestWithParam<TextCase> {};

TEST_P(TrimmingBlanks, LeavesLineEnds) {
  std::string text = GetParam().given;
  EXPECT_STREQ(TLIBCStrTrimSpace(text.data()), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(Cases, TrimmingBlanks,
                         testing::Values(TextCase{"Nothing", "", ""},
                                         TextCase{"OnlyBlanks", " \t ", ""},
                                         TextCase{"BothEnds", "\t a b \t", "a b"},
                                         TextCase{"LineEnd", " a \r\n", "a \r\n"}),
                         name_of);

TEST(Trimming, ReturnsTheTextItself) {
  std::string text = "  a";
  EXPECT_EQ(StringTrim(text.data()), text.data());
  EXPECT_EQ(TLIBCStrTrimSpace(text.data()), text.data());
}

TEST(Trimming, OfNoTextIsNoText) {
  EXPECT_EQ(StringTrim(nullptr), nullptr);
  EXPECT_EQ(TLIBCStrTrimSpace(nullptr), nullptr);
}

struct Utf8Case {
  const char* name;
  const char* text;
  int valid;
};

class Utf8 : public testing::TestWithParam<Utf8Case> {};

TEST_P(Utf8, IsToldFromOtherBytes) {
  EXPECT_EQ(IsUnicodeString(GetParam().text), GetParam().valid);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, Utf8,
    testing::Values(Utf8Case{"Empty", "", 1}, Utf8Case{"Ascii", "abc\x7F", 1},
                    Utf8Case{"TwoBytes", "\xC3\xA9", 1}, Utf8Case{"ThreeBytes", "\xE6\x97\xA5", 1},
                    Utf8Case{"FourBytes", "\xF0\x9F\x8E\xB5", 1},
                    Utf8Case{"LastBeforeSurrogates", "\xED\x9F\xBF", 1},
                    Utf8Case{"FirstAfterSurrogates", "\xEE\x80\x80", 1},
                    Utf8Case{"LastOfAll", "\xF4\x8F\xBF\xBF", 1}, Utf8Case{"Null", nullptr, 0},
                    Utf8Case{"Latin1", "caf\xE9", 0}, Utf8Case{"LoneTail", "a\x80", 0},
                    Utf8Case{"OverlongSlash", "\xC0\xAF", 0},
                    Utf8Case{"OverlongTwoBytes", "\xC1\xBF", 0},
                    Utf8Case{"OverlongThreeBytes", "\xE0\x9F\xBF", 0},
                    Utf8Case{"OverlongFourBytes", "\xF0\x8F\xBF\xBF", 0},
                    Utf8Case{"FirstSurrogate", "\xED\xA0\x80", 0},
                    Utf8Case{"BeyondTheLast", "\xF4\x90\x80\x80", 0},
                    Utf8Case{"FiveBytes", "\xF8\x88\x80\x80\x80", 0},
                    Utf8Case{"CutTwoBytes", "\xC3", 0}, Utf8Case{"CutThreeBytes", "\xE6\x97", 0},
                    Utf8Case{"CutFourBytes", "\xF0\x9F\x8E", 0},
                    Utf8Case{"CutInTheMiddle", "\xE6\x97z", 0}),
    [](const auto& test) { return test.param.name; });

TEST(CuttingAText, EndsAtTheBorderOfACharacter) {
  using mediidx::platform::cut_utf8;
  EXPECT_EQ(cut_utf8("abc", 3), "abc");
  EXPECT_EQ(cut_utf8("abc", 2), "ab");
  EXPECT_EQ(cut_utf8("a\xE6\x97\xA5z", 4), "a\xE6\x97\xA5");
  EXPECT_EQ(cut_utf8("a\xE6\x97\xA5z", 3), "a");
  EXPECT_EQ(cut_utf8("a\xE6\x97\xA5z", 2), "a");
  EXPECT_EQ(cut_utf8("\xF0\x9F\x8E\xB5", 3), "");
  EXPECT_EQ(cut_utf8("\xF0\x9F\x8E\xB5", 0), "");
}

TEST(CuttingAText, CountsStrayBytesAsCharacters) {
  EXPECT_EQ(mediidx::platform::cut_utf8("\x80\x80\x80\x80", 3), "\x80\x80\x80");
  EXPECT_EQ(mediidx::platform::cut_utf8("ab\xE6\x97", 3), "ab\xE6");
}

struct CompareCase {
  const char* name;
  const char* a;
  const char* b;
  int sign;
};

class ComparingWithoutCase : public testing::TestWithParam<CompareCase> {};

TEST_P(ComparingWithoutCase, OrdersBothWays) {
  const auto sign = [](int order) { return (order > 0) - (order < 0); };
  const auto& given = GetParam();
  EXPECT_EQ(sign(TLIBCUnicodeUTF8StrCaseCmp(given.a, given.b)), given.sign);
  EXPECT_EQ(sign(TLIBCUnicodeUTF8StrCaseCmp(given.b, given.a)), -given.sign);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, ComparingWithoutCase,
    testing::Values(
        CompareCase{"SameText", "/a/b", "/a/b", 0}, CompareCase{"Empty", "", "", 0},
        CompareCase{"Ascii", "/Music/A.MP3", "/music/a.mp3", 0},
        CompareCase{"AsciiOrder", "Alpha", "beta", -1}, CompareCase{"Prefix", "abc", "ABCD", -1},
        CompareCase{"BracketIsNoBrace", "[", "{", -1}, CompareCase{"Latin", "É", "é", 0},
        CompareCase{"Cyrillic", "ПЕСНЯ", "песня", 0}, CompareCase{"Greek", "ΣΊΣΥΦΟΣ", "σίσυφος", 0},
        CompareCase{"SharpS", "Straße", "STRASSE", 0}, CompareCase{"Deseret", "𐐀", "𐐨", 0},
        CompareCase{"Cjk", "日本", "日木", 1}, CompareCase{"AsciiAgainstMore", "e", "é", -1},
        CompareCase{"InvalidBytesDiffer", "\xC3(", "\xC3)", -1},
        CompareCase{"InvalidBytesKeepTheirCase", "A\xFF", "a\xFF", -1},
        CompareCase{"CutCharacter", "é\xF0\x9F", "É\xF0\x9F", 1},
        CompareCase{"NoTextIsLess", nullptr, "", -1}, CompareCase{"NoTexts", nullptr, nullptr, 0}),
    [](const auto& test) { return test.param.name; });

TEST(FormattedText, HoldsItsValues) {
  char* text = TLIBCStrGet("%s %d%%", "a", 5);
  EXPECT_STREQ(text, "a 5%");
  TLIBCStrPut(text);
}

TEST(FormattedText, MayBeLong) {
  const std::string long_text(100000, 'x');
  char* text = TLIBCStrGetEx("<%s>", long_text.c_str());
  EXPECT_EQ(text, "<" + long_text + ">");
  TLIBCStrPut(text);
}

TEST(FormattedText, IsNoneWithoutAFormat) {
  const char* volatile none = nullptr;
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
#pragma GCC diagnostic ignored "-Wformat-security"
  EXPECT_EQ(TLIBCStrGet(none), nullptr);
  EXPECT_EQ(TLIBCStrGetEx(none), nullptr);
#pragma GCC diagnostic pop
  TLIBCStrPut(nullptr);
}

TEST(PlatformError, IsWhatWasSetLast) {
  TLIBCErrSetEx(0x1D00, "user.c", 12);
  EXPECT_EQ(TLIBCErrGet(), 0x1D00);
  EXPECT_STREQ(TLIBCErrorGetFile(), "user.c");
  EXPECT_EQ(TLIBCErrorGetLine(), 12);
}

TEST(PlatformError, NeverHasANullFile) {
  TLIBCErrSetEx(1, nullptr, 2);
  EXPECT_STREQ(TLIBCErrorGetFile(), "");
}

TEST(PlatformRoot, IsEmptyUntilSetAndCanBeTakenBack) {
  EXPECT_STREQ(TAVOPlatformRootGet(), "");
  EXPECT_EQ(TAVOPlatformRootSet("/some/root"), 0);
  EXPECT_STREQ(TAVOPlatformRootGet(), "/some/root");
  EXPECT_EQ(TAVOPlatformRootSet(TAVOPlatformRootGet()), 0);
  EXPECT_STREQ(TAVOPlatformRootGet(), "/some/root");
  EXPECT_EQ(TAVOPlatformRootSet(nullptr), 0);
  EXPECT_STREQ(TAVOPlatformRootGet(), "");
}

TEST(PlatformRoot, IsKeptWhenTheNewOneIsTooLong) {
  ASSERT_EQ(TAVOPlatformRootSet("/kept"), 0);
  EXPECT_EQ(TAVOPlatformRootSet(std::string(4096, 'r').c_str()), -1);
  EXPECT_STREQ(TAVOPlatformRootGet(), "/kept");
  EXPECT_EQ(TAVOPlatformRootSet(std::string(4095, 'r').c_str()), 0);
  TAVOPlatformRootSet(nullptr);
}

}  // namespace
