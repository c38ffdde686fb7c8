// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "db_server.h"
#include "sent_queries.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

class Reconnecting : public DbTest {
 protected:
  Reconnecting() { run("CREATE TABLE t(n integer); CREATE SEQUENCE sent"); }
  static std::string stored() {
    return DbServer::get().value("SELECT coalesce(string_agg(n::text, ' ' ORDER BY n), '') FROM t");
  }
};

TEST_F(Reconnecting, TakesUpATerminatedSession) {
  const auto before = session();
  terminate(before);
  EXPECT_TRUE(runs("INSERT INTO t VALUES(1)"));
  EXPECT_EQ(stored(), "1");
  EXPECT_NE(session(), before);
}

TEST_F(Reconnecting, WorksAgainAndAgain) {
  for (int i = 0; i < 3; ++i) {
    terminate(session());
    EXPECT_TRUE(runs("INSERT INTO t VALUES(1)"));
  }
  EXPECT_EQ(stored(), "1 1 1");
}

TEST_F(Reconnecting, TakesUpALimitedSelectToo) {
  terminate(session());
  tavodb_result* result = nullptr;
  EXPECT_NE(TAVODBSelectLimit(conn.get(), "SELECT generate_series(1, 5)", 2, 0, &result), -1);
  EXPECT_EQ(TAVODBNumRows(OwnedRowSet(result).get()), 2);
}

TEST_F(Reconnecting, FollowsARestartOfTheServer) {
  DbServer::get().stop();
  DbServer::get().start();
  EXPECT_TRUE(runs("INSERT INTO t VALUES(1)"));
  EXPECT_EQ(stored(), "1");
}

TEST_F(Reconnecting, FailsWhileTheServerIsDownAndWorksAfterwards) {
  DbServer::get().stop();
  EXPECT_FALSE(runs("INSERT INTO t VALUES(1)"));
  EXPECT_THAT(error(), HasSubstr("No such file or directory"));
  EXPECT_EQ(TAVODBAffectedRows(conn.get(), nullptr), -1);
  EXPECT_FALSE(runs("INSERT INTO t VALUES(2)"));
  DbServer::get().start();
  EXPECT_TRUE(runs("INSERT INTO t VALUES(3)"));
  EXPECT_EQ(stored(), "3");
}

TEST_F(Reconnecting, HappensBetweenTheStatementsOfAText) {
  const auto before = session();
  const SentQueries sent([&](const std::string& sql) {
    if (sql == "INSERT INTO t VALUES(1)") terminate(before);
  });
  EXPECT_TRUE(runs("INSERT INTO t VALUES(1); INSERT INTO t VALUES(2); INSERT INTO t VALUES(3)"));
  EXPECT_THAT(sent.texts(), ElementsAre("INSERT INTO t VALUES(1)", "INSERT INTO t VALUES(2)",
                                        "INSERT INTO t VALUES(3)"));
  EXPECT_EQ(stored(), "1 2 3");
}

TEST_F(Reconnecting, NeverSendsAStatementTwice) {
  const SentQueries sent;
  EXPECT_FALSE(
      runs("SELECT nextval('sent'), pg_terminate_backend(pg_backend_pid()); "
           "INSERT INTO t VALUES(1)"));
  EXPECT_THAT(error(), HasSubstr("terminating connection due to administrator command"));
  EXPECT_EQ(sent.texts().size(), 1U);
  EXPECT_EQ(DbServer::get().value("SELECT last_value FROM sent WHERE is_called"), "1");
  EXPECT_EQ(stored(), "");
  EXPECT_TRUE(runs("INSERT INTO t VALUES(2)"));
  EXPECT_EQ(stored(), "2");
}

TEST_F(Reconnecting, FailsWithinATransactionSoThatNoHalfOfItIsRun) {
  run("BEGIN; INSERT INTO t VALUES(1)");
  terminate(session());
  EXPECT_FALSE(runs("INSERT INTO t VALUES(2); COMMIT"));
  EXPECT_EQ(error(), "the connection was lost within a transaction");
  EXPECT_EQ(stored(), "");
  EXPECT_TRUE(runs("INSERT INTO t VALUES(3)"));
  EXPECT_EQ(stored(), "3");
}

TEST_F(Reconnecting, IsFreeAgainBehindATransaction) {
  run("BEGIN; INSERT INTO t VALUES(1); COMMIT");
  terminate(session());
  EXPECT_TRUE(runs("INSERT INTO t VALUES(2)"));
  EXPECT_EQ(stored(), "1 2");
}

TEST_F(Reconnecting, LeavesResultsReadable) {
  const auto result = run("SELECT 'kept' AS value");
  terminate(session());
  run("SELECT 1");
  std::uint32_t row = 0;
  ASSERT_NE(TAVODBFetchRow(result.get(), &row), -1);
  EXPECT_STREQ(TAVODBFetchField(result.get(), row, "value"), "kept");
}

}  // namespace
}  // namespace mediidx::test
