// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "statement_splitter.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <tavodb.h>

#include <cstdlib>
#include <string>
#include <string_view>
#include <vector>

#include "random_text.h"

namespace mediidx::test {
namespace {

using Statements = std::vector<std::string>;

Statements split(std::string_view text) {
  Statements statements;
  while (const auto statement = platform::next_statement(text)) statements.emplace_back(*statement);
  EXPECT_TRUE(text.empty());
  return statements;
}

struct SplitCase {
  const char* name;
  const char* text;
  Statements statements;
};

class Splitting : public testing::TestWithParam<SplitCase> {};

TEST_P(Splitting, EndsStatementsAtSemicolons) {
  EXPECT_EQ(split(GetParam().text), GetParam().statements);
}

const auto kName = [](const auto& test) { return test.param.name; };

INSTANTIATE_TEST_SUITE_P(
    Plain, Splitting,
    testing::Values(SplitCase{"One", "SELECT 1", {"SELECT 1"}},
                    SplitCase{"OneEnded", "SELECT 1;", {"SELECT 1"}},
                    SplitCase{"Two", "SELECT 1;SELECT 2", {"SELECT 1", "SELECT 2"}},
                    SplitCase{"BlanksAreCutOff", " a ;\n b\t; ", {"a", "b"}},
                    SplitCase{"EmptyStatementsArePassedOver", ";; a;;\n;b; ; ", {"a", "b"}},
                    SplitCase{"NoText", "", {}}, SplitCase{"OnlyBlanks", " \t\r\n\f", {}},
                    SplitCase{"OnlySemicolons", ";;;", {}}),
    kName);

INSTANTIATE_TEST_SUITE_P(
    Literals, Splitting,
    testing::Values(
        SplitCase{"Quoted", "a 'x;y';b", {"a 'x;y'", "b"}},
        SplitCase{"DoubledQuote", "a 'x'';y';b", {"a 'x'';y'", "b"}},
        SplitCase{"QuotedQuotes", "a '''';b", {"a ''''", "b"}},
        SplitCase{"EmptyLiteral", "a '';b", {"a ''", "b"}},
        SplitCase{"BackslashIsPlain", "a 'x\\';b", {"a 'x\\'", "b"}},
        SplitCase{"EscapedQuote", "a E'x\\';y';b", {"a E'x\\';y'", "b"}},
        SplitCase{"EscapedQuoteSmall", "a e'x\\';y';b", {"a e'x\\';y'", "b"}},
        SplitCase{"EscapedBackslash", "a E'x\\\\';b", {"a E'x\\\\'", "b"}},
        SplitCase{"EscapedDoubledQuote", "a E'x''\\';y';b", {"a E'x''\\';y'", "b"}},
        SplitCase{"EscapedOnTheNextLine", "a E'x'\n'\\';';b", {"a E'x'\n'\\';'", "b"}},
        SplitCase{"EscapedBehindAComment", "a E'x' --;\n '\\';';b", {"a E'x' --;\n '\\';'", "b"}},
        SplitCase{"PlainBehindEscaped", "a E'x' '\\';b", {"a E'x' '\\'", "b"}},
        SplitCase{"NameThatEndsInE", "a name'x\\';b", {"a name'x\\'", "b"}},
        SplitCase{"UnicodeNameThatEndsInE",
                  "a \xc3\xa9"
                  "e'x\\';b",
                  {"a \xc3\xa9"
                   "e'x\\'",
                   "b"}},
        SplitCase{"OtherPrefixes", "a U&'\\';X';';b", {"a U&'\\'", "X';'", "b"}},
        SplitCase{"QuotedName", "a \"x;'y\";b", {"a \"x;'y\"", "b"}},
        SplitCase{"DoubledNameQuote", "a \"x\"\";y\";b", {"a \"x\"\";y\"", "b"}},
        SplitCase{"Dollars", "a $$x;'y$$;b", {"a $$x;'y$$", "b"}},
        SplitCase{"TaggedDollars", "a $t$x;$$;$u$;$t$;b", {"a $t$x;$$;$u$;$t$", "b"}},
        SplitCase{"DollarsOfAName", "a x$t$;b$t$", {"a x$t$", "b$t$"}},
        SplitCase{"Parameter", "a $1;b $1$", {"a $1", "b $1$"}},
        SplitCase{"LoneDollar", "a $;$", {"a $", "$"}}),
    kName);

INSTANTIATE_TEST_SUITE_P(
    Comments, Splitting,
    testing::Values(
        SplitCase{"Line", "a --;'\n;b", {"a --;'", "b"}},
        SplitCase{"LineEndedByCr", "a --;\r;b", {"a --;", "b"}},
        SplitCase{"LineAtTheEnd", "a; --b", {"a"}},
        SplitCase{"Block", "a /*;'*/ x;b", {"a /*;'*/ x", "b"}},
        SplitCase{"Nested", "a /* /* */ ; */;b", {"a /* /* */ ; */", "b"}},
        SplitCase{"OverlappingMarks", "a /*/;*/;b", {"a /*/;*/", "b"}},
        SplitCase{"OnlyAComment", "/* a */; -- b\n;c", {"c"}},
        SplitCase{"MarksInALiteral", "a '--';b '/*';c", {"a '--'", "b '/*'", "c"}},
        SplitCase{"BehindAnOperator", "a +--;\n1;b*/*;*/2;c", {"a +--;\n1", "b*/*;*/2", "c"}}),
    kName);

INSTANTIATE_TEST_SUITE_P(NeverClosed, Splitting,
                         testing::Values(SplitCase{"Literal", "a;b 'x;y", {"a", "b 'x;y"}},
                                         SplitCase{"EscapeLiteral", "a;b E'x\\", {"a", "b E'x\\"}},
                                         SplitCase{"Name", "a;b \"x;y", {"a", "b \"x;y"}},
                                         SplitCase{"Dollar", "a;b $t$x;$t", {"a", "b $t$x;$t"}},
                                         SplitCase{
                                             "Comment", "a;b /* /* */;", {"a", "b /* /* */;"}},
                                         SplitCase{"OnlyAComment", "a;/*;", {"a", "/*;"}}),
                         kName);

TEST(Splitting, KeepsFilledStatementsWhole) {
  RandomTexts texts;
  for (int i = 0; i < 3000; ++i) {
    Statements statements;
    std::string text;
    for (int n = 0; n < 4; ++n) {
      char* filled = TAVODBEscapeStringEX3(TAVODB_TYPE_POSTGRESQL, "a '@TAVO:VAR' b '@TAVO:LVAR'",
                                           texts.next().c_str(), texts.next().c_str());
      ASSERT_NE(filled, nullptr);
      statements.emplace_back(filled);
      text += statements.back() + "; ";
      std::free(filled);
    }
    EXPECT_EQ(split(text), statements) << text;
  }
}

TEST(Splitting, LosesNothingOfAnyText) {
  RandomTexts texts;
  for (int i = 0; i < 3000; ++i) {
    const auto text = texts.next(60);
    std::size_t from = 0;
    for (const auto& statement : split(text)) {
      const auto found = text.find(statement, from);
      ASSERT_NE(found, text.npos) << text;
      from = found + statement.size();
    }
  }
}

}  // namespace
}  // namespace mediidx::test
