// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavodb.h>

#include <climits>
#include <cstdlib>
#include <memory>
#include <optional>
#include <string>

#include "random_text.h"

extern "C" char* fill_from_c(const char* text, int number, long long wide);

namespace mediidx::test {
namespace {

using Text = std::optional<std::string>;

Text taken(char* filled) {
  const std::unique_ptr<char, decltype(&std::free)> owner(filled, std::free);
  return filled ? Text(filled) : std::nullopt;
}

template <class... Values>
Text fill(const char* sql, Values... values) {
  return taken(TAVODBEscapeStringEX3(TAVODB_TYPE_POSTGRESQL, sql, values...));
}

struct TextCase {
  const char* name;
  const char* sql;
  const char* value;
  const char* filled;
};

class TemplateText : public testing::TestWithParam<TextCase> {};

TEST_P(TemplateText, IsFilledIn) {
  EXPECT_EQ(fill(GetParam().sql, GetParam().value), GetParam().filled);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, TemplateText,
    testing::Values(
        TextCase{"PlainVar", "'@TAVO:VAR'", "abc", "'abc'"},
        TextCase{"EmptyVar", "'@TAVO:VAR'", "", "''"},
        TextCase{"QuotesAreDoubled", "'@TAVO:VAR'", "it's '", "'it''s '''"},
        TextCase{"BackslashOfVarStays", "'@TAVO:VAR'", "a\\b\\'", "'a\\b\\'''"},
        TextCase{"WildcardsOfVarStay", "'@TAVO:VAR'", "100%_", "'100%_'"},
        TextCase{"WildcardsOfLvarAreEscaped", "'@TAVO:LVAR/%'", "100%_\\", "'100\\%\\_\\\\/%'"},
        TextCase{"QuotesOfLvarAreDoubled", "'%@TAVO:LVAR'", "it's", "'%it''s'"},
        TextCase{"NevarStandsAsItIs", "DELETE FROM @TAVO:NEVAR;", "mu'sic\\%",
                 "DELETE FROM mu'sic\\%;"},
        TextCase{"PlaceholdersOfAValueAreText", "'@TAVO:VAR'", "@TAVO:VAR @TAVO:NOPE",
                 "'@TAVO:VAR @TAVO:NOPE'"},
        TextCase{"PlaceholdersOfNevarAreText", "@TAVO:NEVAR", "@TAVO:INT", "@TAVO:INT"},
        TextCase{"FormatsOfAValueAreText", "'@TAVO:VAR'", "%s%n", "'%s%n'"},
        TextCase{"ValueAndTemplateMakeNoPlaceholder", "@TAVO:NEVAR@TAVO", "@TAVO:", "@TAVO:@TAVO"},
        TextCase{"SmallLettersEndTheWord", "@TAVO:VARx", "v", "vx"},
        TextCase{"DigitsEndTheWord", "@TAVO:VAR1", "v", "v1"},
        TextCase{"SimilarTextStays", "@TAVO @tavo:VAR TAVO:VAR '@TAVO:VAR'", "v",
                 "@TAVO @tavo:VAR TAVO:VAR 'v'"}),
    [](const auto& test) { return test.param.name; });

TEST(Template, TakesItsValuesInOrder) {
  EXPECT_EQ(fill("@TAVO:INT '@TAVO:VAR' @TAVO:LLINT '@TAVO:LVAR' @TAVO:NEVAR @TAVO:INT", -1, "a'",
                 1LL << 40, "b_", "c", 2),
            "-1 'a''' 1099511627776 'b\\_' c 2");
}

TEST(Template, TakesMoreValuesThanFitIntoRegisters) {
  EXPECT_EQ(fill("@TAVO:VAR@TAVO:VAR@TAVO:VAR@TAVO:INT@TAVO:VAR@TAVO:LLINT@TAVO:VAR@TAVO:VAR"
                 "@TAVO:VAR@TAVO:VAR@TAVO:INT@TAVO:VAR",
                 "a", "b", "c", 1, "d", 2LL, "e", "f", "g", "h", 3, "i"),
            "abc1d2efgh3i");
}

TEST(Template, WritesTheWidestNumbers) {
  EXPECT_EQ(fill("@TAVO:INT @TAVO:INT", INT_MIN, INT_MAX), "-2147483648 2147483647");
  EXPECT_EQ(fill("@TAVO:LLINT @TAVO:LLINT", LLONG_MIN, LLONG_MAX),
            "-9223372036854775808 9223372036854775807");
}

TEST(Template, WithoutPlaceholdersIsCopied) {
  EXPECT_EQ(fill("VACUUM ANALYZE"), "VACUUM ANALYZE");
  EXPECT_EQ(fill(""), "");
}

TEST(Template, HoldsLongValues) {
  const std::string quotes(1 << 20, '\'');
  EXPECT_EQ(fill("'@TAVO:VAR'", quotes.c_str()), "'" + quotes + quotes + "'");
}

TEST(Template, IsFilledFromC) { EXPECT_EQ(taken(fill_from_c("a'", -2, 3)), "'a''', -2, 3"); }

class BadTemplate : public testing::TestWithParam<const char*> {};

TEST_P(BadTemplate, HasNoText) { EXPECT_EQ(fill(GetParam(), "value"), std::nullopt); }

INSTANTIATE_TEST_SUITE_P(UnknownPlaceholders, BadTemplate,
                         testing::Values("@TAVO:", "@TAVO: VAR", "@TAVO:var", "@TAVO:VARCHAR",
                                         "@TAVO:LNEVAR", "@TAVO:INTEGER", "@TAVO:LINT",
                                         "@TAVO:VAR @TAVO:TEXT", "@TAVO:V"));

TEST(Template, NeedsATextAndEveryString) {
  const char* const none = nullptr;
  EXPECT_EQ(fill(nullptr), std::nullopt);
  EXPECT_EQ(fill("'@TAVO:VAR'", none), std::nullopt);
  EXPECT_EQ(fill("'@TAVO:LVAR'", none), std::nullopt);
  EXPECT_EQ(fill("@TAVO:NEVAR", none), std::nullopt);
  EXPECT_EQ(fill("'@TAVO:VAR' '@TAVO:VAR'", "a", none), std::nullopt);
}

TEST(Template, IsForPostgresqlOnly) {
  for (const int type : {-1, 0, 2}) {
    EXPECT_EQ(taken(TAVODBEscapeStringEX3(type, "'@TAVO:VAR'", "a")), std::nullopt) << type;
  }
}

/// What the server reads in a quoted literal; nothing when the literal ends early.
Text read_literal(const std::string& literal) {
  std::string value;
  for (std::size_t at = 0; at < literal.size(); ++at) {
    if (literal[at] == '\'' && literal[++at] != '\'') return std::nullopt;
    value += literal[at];
  }
  return value;
}

/// Whether a LIKE pattern matches exactly one text, and which.
Text read_pattern(const std::string& pattern) {
  std::string text;
  for (std::size_t at = 0; at < pattern.size(); ++at) {
    if (pattern[at] == '%' || pattern[at] == '_') return std::nullopt;
    if (pattern[at] == '\\' && ++at == pattern.size()) return std::nullopt;
    text += pattern[at];
  }
  return text;
}

TEST(Template, ReadsBackAsTheValueItWasFilledWith) {
  RandomTexts texts;
  for (int i = 0; i < 5000; ++i) {
    const auto text = texts.next();
    EXPECT_EQ(read_literal(fill("@TAVO:VAR", text.c_str()).value()), text);
    const auto pattern = read_literal(fill("@TAVO:LVAR", text.c_str()).value());
    EXPECT_EQ(read_pattern(pattern.value()), text);
  }
}

}  // namespace
}  // namespace mediidx::test
