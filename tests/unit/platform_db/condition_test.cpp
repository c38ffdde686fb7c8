// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavodb.h>

#include <cstdlib>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "random_text.h"

namespace mediidx::test {
namespace {

std::optional<std::string> escaped(const std::string& condition) {
  std::vector<char> buffer(2 * condition.size() + 1, '#');
  if (EscapeConditionEX(nullptr, condition.c_str(), buffer.data()) == -1) return std::nullopt;
  return buffer.data();
}

struct ConditionCase {
  const char* name;
  const char* condition;
  const char* escaped;
};

class Condition : public testing::TestWithParam<ConditionCase> {};

TEST_P(Condition, KeepsItsValueInOneLiteral) {
  EXPECT_EQ(escaped(GetParam().condition), GetParam().escaped);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, Condition,
    testing::Values(ConditionCase{"Plain", " path='/a' ", " path='/a' "},
                    ConditionCase{"EmptyValue", " path='' ", " path='' "},
                    ConditionCase{"QuoteWithin", " path='/it's' ", " path='/it''s' "},
                    ConditionCase{"QuoteAtTheBeginning", " path=''a' ", " path='''a' "},
                    ConditionCase{"QuoteAtTheEnd", " path='a'' ", " path='a''' "},
                    ConditionCase{"OnlyQuotes", " path=''' ", " path='''' "},
                    ConditionCase{"Or", " path='x' OR '1'='1' ", " path='x'' OR ''1''=''1' "},
                    ConditionCase{"Semicolon", " path='x'; DROP TABLE directory; --' ",
                                  " path='x''; DROP TABLE directory; --' "},
                    ConditionCase{"BackslashStays", " path='a\\' ", " path='a\\' "},
                    ConditionCase{"BackslashBeforeAQuote", " path='a\\'b' ", " path='a\\''b' "},
                    ConditionCase{"WildcardsStay", " path='%_' ", " path='%_' "},
                    ConditionCase{"DoubledQuotesAreTwo", " path='a''b' ", " path='a''''b' "},
                    ConditionCase{"NoValue", " id=5 ", " id=5 "}, ConditionCase{"Empty", "", ""}),
    [](const auto& test) { return test.param.name; });

TEST(AConditionWithOneQuote, IsRefused) {
  EXPECT_EQ(escaped(" path='OR true "), std::nullopt);
  EXPECT_EQ(escaped("'"), std::nullopt);
}

TEST(ACondition, NeedsBothTexts) {
  char to[4];
  EXPECT_EQ(EscapeConditionEX(nullptr, nullptr, to), -1);
  EXPECT_EQ(EscapeConditionEX(nullptr, "a", nullptr), -1);
}

TEST(ACondition, OfAnyValueHoldsThisValue) {
  RandomTexts texts;
  for (int i = 0; i < 5000; ++i) {
    const auto value = texts.next();
    const auto condition = escaped(" path='" + value + "' ").value();
    char* expected =
        TAVODBEscapeStringEX3(TAVODB_TYPE_POSTGRESQL, " path='@TAVO:VAR' ", value.c_str());
    EXPECT_EQ(condition, expected);
    std::free(expected);
  }
}

}  // namespace
}  // namespace mediidx::test
