// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "text/legacy_text.h"

#include <gtest/gtest.h>

namespace mediidx::tool {
namespace {

struct LegacyCase {
  const char* name;
  const char* page;
  const char* bytes;
  const char* text;
};

class ATextOfAnyCharset : public testing::TestWithParam<LegacyCase> {
 protected:
  ~ATextOfAnyCharset() override { set_code_page(""); }
};

TEST_P(ATextOfAnyCharset, IsDecoded) {
  const auto& test = GetParam();
  set_code_page(test.page);
  EXPECT_EQ(decode_legacy(test.bytes), test.text);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, ATextOfAnyCharset,
    testing::Values(
        LegacyCase{"Ascii", "rus", "Low Tide", "Low Tide"}, LegacyCase{"Empty", "rus", "", ""},
        LegacyCase{"Utf8", "rus", "Zo\xC3\xAB", "Zoë"},
        LegacyCase{"Latin1WithoutPage", "", "Zo\xEB", "Zoë"},
        LegacyCase{"Latin1UnderItsOwn", "enu", "Zo\xEB", "Zoë"},
        LegacyCase{"QuotesOfCp1252", "enu", "It\x92s", "It’s"},
        LegacyCase{"QuotesWithoutPage", "", "It\x92s", "It\xC2\x92s"},
        LegacyCase{"Cyrillic", "rus", "\xCF\xF0\xE8\xF7\xE0\xEB", "Причал"},
        LegacyCase{"CyrillicAndLatin", "rus", "DJ \xCF\xF0\xE8\xF7\xE0\xEB", "DJ Причал"},
        LegacyCase{"LoneCyrillicLetter", "rus", "\xDF", "Я"},
        LegacyCase{"LoneLetterAmongWords", "rus", "a \xE0 b", "a а b"},
        LegacyCase{"FrenchUnderRussian", "rus", "Voil\xE0, d\xE9j\xE0 vu", "Voilà, déjà vu"},
        LegacyCase{"FrenchWithALoneLetter", "rus", "\xC0 bient\xF4t", "À bientôt"},
        LegacyCase{"SignsAreNoLetters", "rus", "na\xA8ve", "naЁve"},
        LegacyCase{"Polish", "plk",
                   "wi\xEA"
                   "c",
                   "więc"},
        LegacyCase{"PolishByItsIconvName", "CP1250",
                   "wi\xEA"
                   "c",
                   "więc"},
        LegacyCase{"Turkish", "trk",
                   "\xDE"
                   "ark\xFD",
                   "Şarkı"},
        LegacyCase{"Japanese", "jpn", "\x94\x67\x8E\x7E\x8F\xEA", "波止場"},
        LegacyCase{"JapaneseWithAscii", "jpn",
                   "A\x83"
                   "A",
                   "Aア"},
        LegacyCase{"Korean", "krn", "\xBC\xAD\xBF\xEF", "서울"},
        LegacyCase{"TraditionalChinese", "cht", "\xA4\xA4\xA4\xE5", "中文"},
        LegacyCase{"SimplifiedChinese", "chs", "\xD6\xD0\xCE\xC4", "中文"},
        LegacyCase{"NotValidInThePage", "jpn", "\x94", "\xC2\x94"},
        LegacyCase{"UnknownPage", "none such", "Zo\xEB", "Zoë"},
        LegacyCase{"PageThatIsUtf8", "utf8", "Zo\xEB", "Zoë"}),
    [](const auto& test) { return test.param.name; });

}  // namespace
}  // namespace mediidx::tool
