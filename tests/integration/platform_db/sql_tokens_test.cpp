// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The tests' own lexer beside the server's.
#include "sql_tokens.h"

#include <gmock/gmock.h>
#include <tavodbbulk.h>

#include <array>
#include <random>

#include "db_server.h"

namespace mediidx::test {
namespace {

using testing::AllOf;
using testing::ElementsAre;
using testing::Field;
using testing::IsEmpty;
using Kind = SqlToken::Kind;

/// Texts of what decides where a literal begins and ends, the same in every run.
class RandomSql {
 public:
  std::string next() {
    std::string sql;
    for (auto pieces = 1 + source_() % 9; pieces > 0; --pieces) {
      sql += kPieces[source_() % kPieces.size()];
    }
    return sql;
  }

 private:
  static constexpr std::array kPieces{
      "'",  "'",  "''", "'a'", "'b'", "\\", "\\'", "E'", "e",  "$$", "$$", "$a$", "$b", "$a$",
      "--", "/*", "*/", "/*",  "*/",  "\n", "\n",  " ",  "\t", "a",  "\"", "é",   ";",  "%",
  };
  std::mt19937 source_{7};
};

class Lexing : public DbTest {
 protected:
  /// The value that the server reads in a text that is a literal alone.
  std::optional<std::string> value_of(const std::string& sql) {
    tavodb_result* rows = nullptr;
    const auto statement = "SELECT (" + sql + "\n)::text AS value";
    if (TAVODBExecuteParams(conn.get(), statement.c_str(), 0, nullptr, &rows) == -1) {
      return std::nullopt;
    }
    const OwnedRowSet owner(rows);
    std::uint32_t row = 0;
    EXPECT_EQ(TAVODBFetchRow(rows, &row), 0);
    return TAVODBFetchField(rows, row, "value");
  }
};

TEST_F(Lexing, FindsTheLiteralsThatTheServerFinds) {
  RandomSql texts;
  int literals = 0;
  for (int i = 0; i < 4000; ++i) {
    const auto sql = texts.next();
    const auto tokens = sql_tokens(sql);
    const bool is_literal = tokens.size() == 1 && tokens[0].kind == Kind::kLiteral;
    literals += is_literal ? 1 : 0;
    EXPECT_EQ(value_of(sql), is_literal ? std::optional(tokens[0].text) : std::nullopt) << sql;
  }
  EXPECT_GT(literals, 200);
}

auto token(Kind kind, const char* text) {
  return AllOf(Field(&SqlToken::kind, kind), Field(&SqlToken::text, text));
}

TEST(SqlTokens, AreThoseOfAStatement) {
  EXPECT_THAT(
      sql_tokens("SELECT a.\"b\"\"c\", -1.5e3,$1 FROM t /* ; /* */ */ WHERE x>='it''s'-- '\n;"),
      ElementsAre(token(Kind::kWord, "SELECT"), token(Kind::kWord, "a"), token(Kind::kSign, "."),
                  token(Kind::kName, "b\"c"), token(Kind::kSign, ","), token(Kind::kSign, "-"),
                  token(Kind::kNumber, "1.5e3"), token(Kind::kSign, ","), token(Kind::kSign, "$1"),
                  token(Kind::kWord, "FROM"), token(Kind::kWord, "t"), token(Kind::kWord, "WHERE"),
                  token(Kind::kWord, "x"), token(Kind::kSign, ">="), token(Kind::kLiteral, "it's"),
                  token(Kind::kSign, ";")));
}

TEST(SqlTokens, SayWhatIsNeverClosed) {
  for (const char* open : {"'a", "E'a\\'", "\"a", "$a$ $b$", "/* /* */", "U&'a", "'a'\n'"}) {
    EXPECT_THAT(sql_tokens(open), ElementsAre(token(Kind::kBroken, open)));
  }
}

TEST(SqlTokens, AreNoneInBlanksAndComments) {
  EXPECT_THAT(sql_tokens(" \t\r\n\f-- 'a'\r/* 'b' */"), IsEmpty());
}

TEST(SqlTokens, EndOperatorsWhereTheServerDoes) {
  EXPECT_THAT(sql_tokens("a=-1"), ElementsAre(token(Kind::kWord, "a"), token(Kind::kSign, "="),
                                              token(Kind::kSign, "-"), token(Kind::kNumber, "1")));
  EXPECT_THAT(
      sql_tokens("@-1+/*x*/--"),
      ElementsAre(token(Kind::kSign, "@-"), token(Kind::kNumber, "1"), token(Kind::kSign, "+")));
}

TEST(APattern, MatchesOneTextWhenItsWildcardsAreEscaped) {
  EXPECT_EQ(sole_match(R"(100\%\_\\a)"), R"(100%_\a)");
  for (const char* pattern : {"a%", "_", "a\\"}) EXPECT_EQ(sole_match(pattern), std::nullopt);
}

}  // namespace
}  // namespace mediidx::test
