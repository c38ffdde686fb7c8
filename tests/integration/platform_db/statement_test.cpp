// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "db_server.h"
#include "sent_queries.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;

class Executing : public DbTest {
 protected:
  Executing() { run("CREATE TABLE t(n integer)"); }
  std::vector<std::string> stored() { return column("SELECT n AS value FROM t ORDER BY n"); }
  int affected() const { return TAVODBAffectedRows(conn.get(), nullptr); }
};

TEST_F(Executing, RunsEachStatementOfAText) {
  const SentQueries sent;
  run("INSERT INTO t VALUES(1);INSERT INTO t VALUES(2) ; ; INSERT INTO t VALUES(3);");
  EXPECT_THAT(sent.texts(), ElementsAre("INSERT INTO t VALUES(1)", "INSERT INTO t VALUES(2)",
                                        "INSERT INTO t VALUES(3)"));
  EXPECT_THAT(stored(), ElementsAre("1", "2", "3"));
}

TEST_F(Executing, StopsAtTheFirstFailureAndKeepsWhatWentBefore) {
  EXPECT_FALSE(runs("INSERT INTO t VALUES(1); INSERT INTO t VALUES('x'); INSERT INTO t VALUES(3)"));
  EXPECT_THAT(error(), HasSubstr("invalid input syntax for type integer: \"x\""));
  EXPECT_THAT(stored(), ElementsAre("1"));
}

TEST_F(Executing, RunsWhatCannotRunAmongOthers) {
  EXPECT_TRUE(runs("SELECT 1; VACUUM t; SELECT 1"));
}

TEST_F(Executing, HandsOutTheRowsOfTheLastStatement) {
  EXPECT_THAT(column("SELECT 1 AS value; SELECT 2 AS value"), ElementsAre("2"));
}

TEST_F(Executing, HandsOutNothingWhenTheLastStatementReturnsNoRows) {
  tavodb_result* result = reinterpret_cast<tavodb_result*>(this);
  EXPECT_NE(TAVODBExecute(conn.get(), "SELECT 1; INSERT INTO t VALUES(1)", &result), -1);
  EXPECT_EQ(result, nullptr);
}

TEST_F(Executing, HandsOutAnEmptyResultForASelectWithoutRows) {
  const auto result = run("SELECT n FROM t");
  ASSERT_NE(result, nullptr);
  EXPECT_EQ(TAVODBNumRows(result.get()), 0);
}

TEST_F(Executing, HandsOutNothingOnFailure) {
  tavodb_result* result = reinterpret_cast<tavodb_result*>(this);
  EXPECT_EQ(TAVODBExecute(conn.get(), "SELECT 1; SELECT nothing", &result), -1);
  EXPECT_EQ(result, nullptr);
}

TEST_F(Executing, TakesATextWithoutStatements) {
  const SentQueries sent;
  for (const char* text : {"", " ; ;", "-- nothing", "/* ; */;"}) {
    tavodb_result* result = reinterpret_cast<tavodb_result*>(this);
    EXPECT_NE(TAVODBExecute(conn.get(), text, &result), -1) << text;
    EXPECT_EQ(result, nullptr);
    EXPECT_EQ(affected(), 0);
  }
  EXPECT_TRUE(sent.texts().empty());
}

TEST_F(Executing, FailsWithoutAText) {
  EXPECT_EQ(TAVODBExecute(conn.get(), nullptr, nullptr), -1);
  EXPECT_EQ(error(), "no statement");
  EXPECT_EQ(TAVODBSelectLimit(conn.get(), nullptr, 1, 1, nullptr), -1);
  EXPECT_EQ(affected(), -1);
}

TEST_F(Executing, DoesNotCareForRowsWithoutAResult) {
  EXPECT_NE(TAVODBExecute(conn.get(), "SELECT 1", nullptr), -1);
}

TEST_F(Executing, HasErrorTextsThatEndInNoNewline) {
  EXPECT_FALSE(runs("SELECT nothing"));
  EXPECT_THAT(error(), HasSubstr("column \"nothing\" does not exist"));
  EXPECT_THAT(error(), Not(testing::EndsWith("\n")));
}

TEST_F(Executing, RefusesWhatIsNoUtf8AndGoesOn) {
  EXPECT_FALSE(runs("SELECT '\xff\xfe'"));
  EXPECT_THAT(error(), HasSubstr("invalid byte sequence for encoding \"UTF8\": 0xff"));
  EXPECT_FALSE(runs("INSERT INTO t VALUES(1); SELECT 'caf\xc3"));
  EXPECT_THAT(stored(), ElementsAre("1"));
}

TEST_F(Executing, ComplainsOfWhatIsNeverClosed) {
  EXPECT_FALSE(runs("INSERT INTO t VALUES(1); SELECT 'x; INSERT INTO t VALUES(2)"));
  EXPECT_THAT(error(), HasSubstr("unterminated quoted string"));
  EXPECT_FALSE(runs("/* x"));
  EXPECT_THAT(error(), HasSubstr("unterminated /* comment"));
  EXPECT_THAT(stored(), ElementsAre("1"));
}

TEST_F(Executing, RefusesToCopyAndGoesOn) {
  for (const char* copy : {"COPY t FROM STDIN", "COPY t TO STDOUT"}) {
    run("INSERT INTO t VALUES(7)");
    EXPECT_FALSE(runs(copy));
    EXPECT_EQ(error(), "COPY from or to the client is not supported");
  }
  EXPECT_THAT(stored(), ElementsAre("7", "7"));
}

TEST_F(Executing, EndsStatementsWhereTheServerDoes) {
  // Were one split elsewhere, half of it would reach the server and fail.
  for (const char* statement :
       {"SELECT E'\\';'", "SELECT E'a'\n'\\';'", "SELECT E'a' -- ;\n '\\';'", "SELECT $$;'$$",
        "SELECT $a$;$b$;$a$", "SELECT 1 AS a$b$, 2 AS b$b$", "SELECT '\\'", "SELECT U&'\\003b;'",
        "SELECT 1 AS \";\"\"'\"", "SELECT 1 /* ; /* ' */ ; */", "SELECT 1 -- ;'\r+1",
        "SELECT 2*/*;*/3", "SELECT 1 AS name, E'x'';\\';'", "SELECT B'1', X'1f', N'\\'"}) {
    EXPECT_TRUE(runs(std::string(statement) + "; INSERT INTO t VALUES(1)"))
        << statement << ": " << error();
    EXPECT_EQ(affected(), 1) << statement;
  }
}

TEST_F(Executing, KnowsTheRowsThatWereTouched) {
  run("INSERT INTO t VALUES(1), (2), (3)");
  EXPECT_EQ(affected(), 3);
  run("UPDATE t SET n = 9 WHERE n < 3");
  EXPECT_EQ(affected(), 2);
  run("DELETE FROM t; DELETE FROM t");
  EXPECT_EQ(affected(), 0);
  run("INSERT INTO t VALUES(1), (2) RETURNING n");
  EXPECT_EQ(affected(), 2);
  run("CREATE TABLE u()");
  EXPECT_EQ(affected(), 0);
}

TEST_F(Executing, KnowsTheRowsOfASelectWithAndWithoutItsResult) {
  auto result = run("SELECT generate_series(1, 4)");
  EXPECT_EQ(TAVODBAffectedRows(conn.get(), result.get()), 4);
  tavodb_result* freed = result.release();
  TAVODBFreeResult(freed);
  EXPECT_EQ(TAVODBAffectedRows(conn.get(), freed), 4);
  run("SHOW timezone");
  EXPECT_EQ(affected(), 1);
}

TEST_F(Executing, TouchedNothingThatIsKnownAfterAFailure) {
  EXPECT_FALSE(runs("INSERT INTO t VALUES(1); SELECT nothing"));
  EXPECT_EQ(affected(), -1);
}

class Limiting : public DbTest {
 protected:
  Limiting() { run("CREATE TABLE t AS SELECT generate_series(1, 5) AS n"); }
  /// The numbers of a SELECT with limits, as one text.
  std::string numbers(const char* sql, std::uint32_t limit, std::uint32_t offset) {
    tavodb_result* result = nullptr;
    if (TAVODBSelectLimit(conn.get(), sql, limit, offset, &result) == -1) return error();
    const OwnedRowSet rows(result);
    std::string text;
    std::uint32_t row = 0;
    while (TAVODBFetchRow(result, &row) != -1) text += TAVODBFetchField(result, row, "n");
    return text;
  }
  static constexpr const char* kAll = "SELECT n FROM t ORDER BY n    ";
};

TEST_F(Limiting, TakesNoMoreThanTheLimitBehindTheOffset) {
  EXPECT_EQ(numbers(kAll, 0, 0), "12345");
  EXPECT_EQ(numbers(kAll, 2, 0), "12");
  EXPECT_EQ(numbers(kAll, 0, 2), "345");
  EXPECT_EQ(numbers(kAll, 2, 2), "34");
  EXPECT_EQ(numbers(kAll, 9, 9), "");
  EXPECT_EQ(numbers(kAll, 4294967295U, 4294967295U), "");
}

TEST_F(Limiting, RunsTheTextAsItIsWithoutLimits) {
  const SentQueries sent;
  EXPECT_EQ(numbers("SELECT 1; SELECT n FROM t WHERE n > 3", 0, 0), "45");
  EXPECT_THAT(sent.texts(), ElementsAre("SELECT 1", "SELECT n FROM t WHERE n > 3"));
}

TEST_F(Limiting, FindsItsPlaceBehindSemicolonsAndComments) {
  EXPECT_EQ(numbers("SELECT n FROM t;", 1, 1), "2");
  EXPECT_EQ(numbers("SELECT n FROM t -- all", 1, 1), "2");
}

TEST_F(Limiting, NeedsOneStatement) {
  const SentQueries sent;
  for (const char* text : {"", "SELECT 1; SELECT 2"}) {
    EXPECT_EQ(numbers(text, 1, 0), "limits need a text of one SELECT");
  }
  EXPECT_TRUE(sent.texts().empty());
}

}  // namespace
}  // namespace mediidx::test
