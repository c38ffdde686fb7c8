// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "sql_text.h"

#include <gmock/gmock.h>

namespace mediidx::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST(SplittingAText, EndsStatementsAtSemicolons) {
  EXPECT_THAT(split_statements("DELETE FROM a; DELETE FROM b;"),
              ElementsAre("DELETE FROM a", "DELETE FROM b"));
}

TEST(SplittingAText, KeepsSemicolonsOfLiterals) {
  EXPECT_THAT(split_statements("DELETE FROM a WHERE p = 'x;''y;';DELETE FROM b "),
              ElementsAre("DELETE FROM a WHERE p = 'x;''y;'", "DELETE FROM b"));
}

TEST(SplittingAText, TakesABackslashForASignOfTheLiteral) {
  EXPECT_THAT(split_statements(R"(SELECT '\'; SELECT 2)"),
              ElementsAre(R"(SELECT '\')", "SELECT 2"));
}

TEST(SplittingAText, LeavesBlankStatementsOut) {
  EXPECT_THAT(split_statements(" ;\n; "), IsEmpty());
}

struct ShapeCase {
  const char* name;
  const char* statement;
  const char* shape;
};
class Shape : public testing::TestWithParam<ShapeCase> {};
TEST_P(Shape, IsTheStatementWithoutItsValues) {
  EXPECT_EQ(shape_of(GetParam().statement), GetParam().shape);
}
INSTANTIATE_TEST_SUITE_P(
    Cases, Shape,
    testing::Values(ShapeCase{"Literals", "SELECT id  FROM a WHERE p='it''s' ",
                              "SELECT id FROM a WHERE p = '?'"},
                    ShapeCase{"Numbers", "INSERT INTO a(x, y2) VALUES(-5, 12)",
                              "INSERT INTO a ( x , y2 ) VALUES ( 0 , 0 )"},
                    ShapeCase{"Patterns", R"(DELETE FROM a WHERE p LIKE '%a\%b\\/%')",
                              "DELETE FROM a WHERE p LIKE '%x%'"},
                    ShapeCase{"ThePatternOfAllPaths", "SELECT * FROM a WHERE p like '/%'",
                              "SELECT * FROM a WHERE p like '/%'"},
                    ShapeCase{"ExactPatterns", R"(DELETE FROM a WHERE p like 'a\_日本')",
                              "DELETE FROM a WHERE p like 'x'"},
                    ShapeCase{"SingleCharacterWildcards", "DELETE FROM a WHERE p like 'a_b'",
                              "DELETE FROM a WHERE p like 'x_x'"},
                    ShapeCase{"Lists", "SELECT * FROM a WHERE p in ('a','b,)','c') AND q = 1",
                              "SELECT * FROM a WHERE p in (...) AND q = 0"},
                    ShapeCase{"SubqueriesAreNoLists",
                              "SELECT * FROM a WHERE p IN (SELECT p FROM b)",
                              "SELECT * FROM a WHERE p IN ( SELECT p FROM b )"}),
    [](const auto& test) { return test.param.name; });

TEST(Oddness, IsNothingForOrdinaryValues) {
  EXPECT_EQ(oddness("DELETE FROM a WHERE p like '/volume1/music/%' AND q = 'x'"), 0u);
}

TEST(Oddness, GrowsWithPatternsThatMatchMuch) {
  EXPECT_GT(oddness("DELETE FROM a WHERE p like '%/'"),
            oddness("DELETE FROM a WHERE p like '%/a'"));
}

TEST(Oddness, GrowsWithLists) {
  EXPECT_GT(oddness("SELECT * FROM a WHERE p in ('a','b','c')"),
            oddness("SELECT * FROM a WHERE p in ('a','b')"));
}

}  // namespace
}  // namespace mediidx::test
