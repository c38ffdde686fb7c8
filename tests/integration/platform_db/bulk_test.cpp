// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <tavodbbulk.h>

#include "db_server.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

class ValuesApart : public DbTest {
 protected:
  /// The column "value" of the rows of a statement that is to succeed.
  std::vector<std::string> select(const char* sql, const std::vector<const char*>& values) {
    tavodb_result* result = nullptr;
    EXPECT_EQ(TAVODBExecuteParams(conn.get(), sql, static_cast<int>(values.size()), values.data(),
                                  &result),
              0)
        << error();
    const OwnedRowSet owner(result);
    std::vector<std::string> texts;
    std::uint32_t row = 0;
    while (TAVODBFetchRow(result, &row) == 0) {
      const char* text = TAVODBFetchField(result, row, "value");
      texts.emplace_back(text ? text : "<null>");
    }
    return texts;
  }
};

TEST_F(ValuesApart, AreTakenAsTheyAre) {
  EXPECT_THAT(select("SELECT $1::text || $2::text AS value", {"it's; --", "\\ $1 100%"}),
              ElementsAre("it's; --\\ $1 100%"));
}

TEST_F(ValuesApart, MayBeNullOrArrays) {
  EXPECT_THAT(select("SELECT $1::text AS value", {nullptr}), ElementsAre("<null>"));
  EXPECT_THAT(select("SELECT unnest($1::text[]) AS value", {R"({"a,b","\"\\",NULL,"NULL"})"}),
              ElementsAre("a,b", "\"\\", "<null>", "NULL"));
}

TEST_F(ValuesApart, NeedNoRowsInReturn) {
  run("CREATE TABLE t(n integer)");
  EXPECT_THAT(select("SELECT 1 AS value", {}), ElementsAre("1"));
  const char* values[] = {"7"};
  EXPECT_EQ(TAVODBExecuteParams(conn.get(), "INSERT INTO t VALUES($1)", 1, values, nullptr), 0);
  EXPECT_EQ(TAVODBAffectedRows(conn.get(), nullptr), 1);
  EXPECT_EQ(value("SELECT n AS value FROM t"), "7");
}

TEST_F(ValuesApart, FailWithTheServersReason) {
  const char* values[] = {"x"};
  tavodb_result* result = nullptr;
  EXPECT_EQ(TAVODBExecuteParams(conn.get(), "SELECT $1::integer", 1, values, &result), -1);
  EXPECT_EQ(result, nullptr);
  EXPECT_THAT(error(), HasSubstr("invalid input syntax for type integer: \"x\""));
  EXPECT_EQ(TAVODBAffectedRows(conn.get(), nullptr), -1);
  EXPECT_EQ(TAVODBExecuteParams(conn.get(), "SELECT 1; SELECT 2", 0, nullptr, nullptr), -1)
      << "one statement at a time";
}

TEST_F(ValuesApart, AreRefusedWhereSomethingIsMissing) {
  EXPECT_EQ(TAVODBExecuteParams(nullptr, "SELECT 1", 0, nullptr, nullptr), -1);
  EXPECT_EQ(TAVODBExecuteParams(conn.get(), nullptr, 0, nullptr, nullptr), -1);
  EXPECT_EQ(error(), "no statement");
  EXPECT_EQ(TAVODBExecuteParams(conn.get(), "SELECT $1", 1, nullptr, nullptr), -1);
  EXPECT_EQ(error(), "no values");
  EXPECT_EQ(TAVODBExecuteParams(conn.get(), "SELECT 1", -1, nullptr, nullptr), -1);
}

TEST_F(ValuesApart, TakeUpATerminatedSession) {
  terminate(session());
  EXPECT_THAT(select("SELECT 1 AS value", {}), ElementsAre("1"));
}

class Copying : public DbTest {
 protected:
  Copying() { run("CREATE TABLE t(n integer, text text)"); }
  int copy(std::string_view rows, const char* sql = "COPY t(n, text) FROM STDIN") {
    return TAVODBCopy(conn.get(), sql, rows.data(), rows.size());
  }
  std::vector<std::string> stored() {
    return column(
        "SELECT coalesce(n::text, '-') || coalesce(text, '<null>') AS value FROM t "
        "ORDER BY n");
  }
};

TEST_F(Copying, WritesTheRows) {
  EXPECT_EQ(copy("1\tit's\n2\ta\\tb\\\\\n3\t\\N\n"), 0);
  EXPECT_EQ(TAVODBAffectedRows(conn.get(), nullptr), 3);
  EXPECT_THAT(stored(), ElementsAre("1it's", "2a\tb\\", "3<null>"));
}

TEST_F(Copying, WritesMoreThanOneMessageHolds) {
  std::string rows;
  for (int i = 0; i < 30000; ++i) rows += std::to_string(i) + '\t' + std::string(100, 'x') + '\n';
  EXPECT_EQ(copy(rows), 0);
  EXPECT_EQ(value("SELECT count(*) AS value FROM t WHERE length(text) = 100"), "30000");
}

TEST_F(Copying, WritesNothingWhenOneRowIsBad) {
  EXPECT_EQ(copy("1\ta\nx\tb\n"), -1);
  EXPECT_THAT(error(), HasSubstr("invalid input syntax for type integer: \"x\""));
  EXPECT_EQ(TAVODBAffectedRows(conn.get(), nullptr), -1);
  EXPECT_THAT(stored(), IsEmpty());
  EXPECT_EQ(copy("1\t\xff\n"), -1);
  EXPECT_THAT(error(), HasSubstr("invalid byte sequence"));
  EXPECT_EQ(copy("1\ta\n"), 0) << "the session goes on";
}

TEST_F(Copying, TakesNoRows) {
  EXPECT_EQ(copy(""), 0);
  EXPECT_EQ(TAVODBAffectedRows(conn.get(), nullptr), 0);
}

TEST_F(Copying, RefusesWhatIsNoCopyFromTheClient) {
  EXPECT_EQ(copy("1\ta\n", "SELECT 1"), -1);
  EXPECT_EQ(error(), "not a COPY from the client");
  EXPECT_EQ(copy("1\ta\n", "COPY t TO STDOUT"), -1);
  EXPECT_EQ(error(), "COPY from or to the client is not supported");
  EXPECT_EQ(copy("1\ta\n", "COPY nowhere FROM STDIN"), -1);
  EXPECT_THAT(error(), HasSubstr("\"nowhere\" does not exist"));
  EXPECT_EQ(value("SELECT 1 AS value"), "1");
}

TEST_F(Copying, NeedsAStatementAndRows) {
  EXPECT_EQ(TAVODBCopy(nullptr, "COPY t FROM STDIN", "", 0), -1);
  EXPECT_EQ(copy("", nullptr), -1);
  EXPECT_EQ(error(), "no statement");
  EXPECT_EQ(TAVODBCopy(conn.get(), "COPY t FROM STDIN", nullptr, 1), -1);
  EXPECT_EQ(error(), "no rows");
}

TEST_F(Copying, TakesUpATerminatedSessionButNotWithinATransaction) {
  terminate(session());
  EXPECT_EQ(copy("1\ta\n"), 0);
  run("BEGIN");
  EXPECT_EQ(copy("2\tb\n"), 0);
  terminate(session());
  EXPECT_EQ(copy("3\tc\n"), -1);
  EXPECT_EQ(error(), "the connection was lost within a transaction");
  EXPECT_THAT(stored(), ElementsAre("1a"));
}

class ATransaction : public DbTest {};

TEST_F(ATransaction, IsKnownToItsConnection) {
  EXPECT_EQ(TAVODBInTransaction(nullptr), 0);
  EXPECT_EQ(TAVODBInTransaction(conn.get()), 0);
  run("BEGIN");
  EXPECT_EQ(TAVODBInTransaction(conn.get()), 1);
  EXPECT_EQ(TAVODBExecute(conn.get(), "nonsense", nullptr), -1);
  EXPECT_EQ(TAVODBInTransaction(conn.get()), 1) << "it has failed, and is still to be ended";
  run("ROLLBACK");
  EXPECT_EQ(TAVODBInTransaction(conn.get()), 0);
}

TEST_F(ATransaction, EndsWithItsSession) {
  run("BEGIN");
  terminate(session());
  EXPECT_EQ(TAVODBExecute(conn.get(), "SELECT 1", nullptr), -1);
  EXPECT_EQ(TAVODBInTransaction(conn.get()), 0);
}

}  // namespace
}  // namespace mediidx::test
