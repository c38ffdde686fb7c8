// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "db_server.h"
#include "wire_server.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

class AServerThatMisbehaves : public DbTest {
 protected:
  static OwnedConnection connect_to(const WireServer& server) {
    return OwnedConnection(
        TAVODBConnect(server.host().c_str(), "postgres", nullptr, "mediaserver"));
  }
  static WireServer::Answer done(const std::string&) { return {WireServer::done()}; }
};

TEST_F(AServerThatMisbehaves, GetsAStatementOnceWhenItHangsUpInsteadOfAnswering) {
  const WireServer server(WireServer::let_in(), [](const std::string& sql) {
    return sql == "hang up" ? WireServer::Answer{"", true} : WireServer::Answer{WireServer::done()};
  });
  const auto client = connect_to(server);
  ASSERT_NE(client, nullptr);
  EXPECT_EQ(TAVODBExecute(client.get(), "hang up; never sent", nullptr), -1);
  EXPECT_THAT(TAVODBErrorGet(client.get()), HasSubstr("server closed the connection unexpectedly"));
  EXPECT_EQ(server.sessions(), 1);
  EXPECT_NE(TAVODBExecute(client.get(), "next", nullptr), -1);
  EXPECT_THAT(server.received(), ElementsAre("hang up", "next"));
  EXPECT_EQ(server.sessions(), 2);
}

TEST_F(AServerThatMisbehaves, IsLeftWhenItSaidFarewellThoughItStaysOnTheLine) {
  const WireServer server(WireServer::let_in(), [](const std::string& sql) {
    return WireServer::Answer{WireServer::done() + (sql == "last" ? WireServer::farewell() : "")};
  });
  const auto client = connect_to(server);
  ASSERT_NE(client, nullptr);
  EXPECT_NE(TAVODBExecute(client.get(), "last; next; next", nullptr), -1);
  EXPECT_THAT(server.received(), ElementsAre("last", "next", "next"));
  EXPECT_EQ(server.sessions(), 2);
}

TEST_F(AServerThatMisbehaves, IsNotLeftForANotice) {
  const WireServer server(WireServer::let_in(), [](const std::string&) {
    return WireServer::Answer{WireServer::done() + WireServer::notice("the volume is full")};
  });
  const auto client = connect_to(server);
  ASSERT_NE(client, nullptr);
  EXPECT_NE(TAVODBExecute(client.get(), "one; two; three", nullptr), -1);
  EXPECT_EQ(server.sessions(), 1);
}

TEST_F(AServerThatMisbehaves, IsLeftAfterOneTryWhenItLetsNobodyIn) {
  const WireServer server(WireServer::farewell(), done);
  EXPECT_EQ(connect_to(server), nullptr);
  EXPECT_THAT(TAVODBErrorGet(nullptr), HasSubstr("goodbye"));
  EXPECT_EQ(server.sessions(), 1);
}

TEST_F(AServerThatMisbehaves, PrintsNothingWhenItGreetsWithANotice) {
  const WireServer server(WireServer::let_in(WireServer::notice("an old collation")), done);
  testing::internal::CaptureStderr();
  EXPECT_NE(connect_to(server), nullptr);
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
}

TEST_F(AServerThatMisbehaves, IsGivenUpAfterTheTimeThatTheEnvironmentGrants) {
  environment.set("PGCONNECT_TIMEOUT", "2");  // the least that libpq waits
  const WireServer server("", done);
  EXPECT_EQ(connect_to(server), nullptr);
  EXPECT_STREQ(TAVODBErrorGet(nullptr), "timeout expired");
}

}  // namespace
}  // namespace mediidx::test
