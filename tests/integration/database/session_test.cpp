// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The shared connection, and texts run on it at once.
#include "media_test.h"

namespace mediidx::test {
namespace {

class Session : public MediaTest {};

TEST_F(Session, BeginsWithoutAConnection) { EXPECT_EQ(gpDBConnect, nullptr); }

TEST_F(Session, ConnectsAtTheFirstUse) {
  auto* conn = MediaDBConnGet();
  EXPECT_NE(conn, nullptr);
  EXPECT_EQ(gpDBConnect, conn);
}

TEST_F(Session, ConnectsAsPostgresToTheMediaDatabase) {
  MediaDBConnGet();
  EXPECT_EQ(last_connect(), (ConnectArguments{"<null>", "postgres", "<null>", "mediaserver"}));
}

TEST_F(Session, HasNoConnectionAfterAFailedConnect) {
  const Failing connect("TAVODBConnect");
  EXPECT_EQ(MediaDBConnGet(), nullptr);
  EXPECT_EQ(gpDBConnect, nullptr);
}

TEST_F(Session, TriesAgainAfterAFailedConnect) {
  const Failing connect("TAVODBConnect");
  MediaDBConnGet();
  EXPECT_NE(MediaDBConnGet(), nullptr);
  EXPECT_EQ(connect.calls(), 2);
}

TEST_F(Session, KeepsItsConnectionWithoutAskingTheServer) {
  auto* first = MediaDBConnGet();
  cut_connections();
  const Failing connect("TAVODBConnect", 0);
  EXPECT_EQ(MediaDBConnGet(), first);
  EXPECT_EQ(connect.calls(), 0);
}

TEST_F(Session, HasNoConnectionWithoutAServer) {
  const NoServer no_server;
  EXPECT_EQ(MediaDBConnGet(), nullptr);
}

TEST_F(Session, IsClosedTwiceWithoutHarm) {
  MediaDBConnGet();
  MediaDBConnClose();
  EXPECT_EQ(gpDBConnect, nullptr);
  MediaDBConnClose();
  EXPECT_EQ(gpDBConnect, nullptr);
}

class RunningAText : public MediaTest {};

TEST_F(RunningAText, ReturnsTheAffectedRows) {
  EXPECT_EQ(MediaDBExec("INSERT INTO photo(path) VALUES('/a'), ('/b'), ('/c')"), 3);
}

TEST_F(RunningAText, ReturnsTheAffectedRowsOfTheLastOfSeveralStatements) {
  EXPECT_EQ(MediaDBExec("INSERT INTO photo(path) VALUES('/a'), ('/b'); "
                        "DELETE FROM photo WHERE path = '/a'; "),
            1);
  EXPECT_EQ(count("photo"), 1);
}

TEST_F(RunningAText, TakesAStatementThatReturnsRows) {
  EXPECT_NE(MediaDBExec("SELECT path FROM photo"), -1);
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_F(RunningAText, RefusesNull) {
  EXPECT_EQ(MediaDBExec(nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameters.")));
}

TEST_F(RunningAText, FailsWithoutAConnection) {
  const Failing connect("TAVODBConnect");
  EXPECT_EQ(MediaDBExec("SELECT 1"), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

TEST_F(RunningAText, LogsAFailedStatementWithItsTextAndItsReason) {
  EXPECT_EQ(MediaDBExec("DELETE FROM nothing"), -1);
  EXPECT_THAT(log_lines(), ElementsAre(failed_statement("DELETE FROM nothing")));
  EXPECT_TRUE(was_logged("relation \"nothing\" does not exist"));
}

TEST_F(RunningAText, LogsFailuresAsErrors) {
  MediaDBExec(nullptr);
  ASSERT_EQ(logged().size(), 1U);
  EXPECT_EQ(logged()[0].priority, 3);
}

TEST_F(RunningAText, KeepsWhatWentBeforeAFailure) {
  EXPECT_EQ(MediaDBExec("INSERT INTO photo(path) VALUES('/a'); DELETE FROM nothing"), -1);
  EXPECT_EQ(count("photo"), 1);
}

TEST_F(RunningAText, SurvivesALostConnection) {
  MediaDBExec("INSERT INTO photo(path) VALUES('/a')");
  cut_connections();
  EXPECT_EQ(MediaDBExec("DELETE FROM photo"), 1);
}

}  // namespace
}  // namespace mediidx::test
