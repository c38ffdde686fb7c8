// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include <fstream>

#include "db_server.h"

namespace mediidx::test {
namespace {

using testing::HasSubstr;

using Connecting = DbTest;

std::string database_of(tavodb_connection* conn) {
  tavodb_result* result = nullptr;
  if (TAVODBExecute(conn, "SELECT current_database() AS value", &result) == -1) return "<none>";
  const OwnedRowSet rows(result);
  std::uint32_t row = 0;
  TAVODBFetchRow(result, &row);
  return TAVODBFetchField(result, row, "value");
}

OwnedConnection connect_by_environment(const char* database) {
  return OwnedConnection(TAVODBConnect(nullptr, "postgres", nullptr, database));
}

TEST_F(Connecting, TakesANullHostFromTheEnvironment) {
  environment.set("PGHOST", DbServer::get().host());
  EXPECT_EQ(database_of(connect_by_environment("mediaserver").get()), "mediaserver");
}

TEST_F(Connecting, PrefersTheDatabaseGivenToTheEnvironments) {
  environment.set("PGHOST", DbServer::get().host());
  environment.set("PGDATABASE", "another");
  EXPECT_EQ(database_of(connect_by_environment("mediaserver").get()), "mediaserver");
  EXPECT_EQ(database_of(connect_by_environment(nullptr).get()), "another");
}

TEST_F(Connecting, TakesTheSettingsOfAService) {
  const auto file = DbServer::get().host() + "/services";
  std::ofstream(file) << "[index]\nhost=" << DbServer::get().host() << "\ndbname=another\n";
  environment.set("PGSERVICEFILE", file);
  environment.set("PGSERVICE", "index");
  EXPECT_EQ(database_of(connect_by_environment("mediaserver").get()), "mediaserver");
  EXPECT_EQ(database_of(connect_by_environment(nullptr).get()), "another");
}

TEST_F(Connecting, TakesADatabaseNameForNothingElse) {
  const auto text = "host=" + DbServer::get().host() + " dbname=another";
  EXPECT_EQ(connect_by_environment(text.c_str()), nullptr);
}

TEST_F(Connecting, FailsWithoutAServer) {
  EXPECT_EQ(TAVODBConnect("/nowhere", "postgres", nullptr, "mediaserver"), nullptr);
  EXPECT_THAT(TAVODBErrorGet(nullptr), HasSubstr("No such file or directory"));
}

TEST_F(Connecting, FailsForADatabaseThatIsNotThere) {
  EXPECT_EQ(TAVODBConnect(DbServer::get().host().c_str(), "postgres", nullptr, "nothing"), nullptr);
  EXPECT_THAT(TAVODBErrorGet(nullptr), HasSubstr("database \"nothing\" does not exist"));
}

TEST_F(Connecting, FailsForSettingsThatTheServerRefuses) {
  environment.set("PGCLIENTENCODING", "nonsense");
  EXPECT_EQ(connect(), nullptr);
  EXPECT_THAT(TAVODBErrorGet(nullptr), HasSubstr("nonsense"));
}

TEST_F(Connecting, ForgetsTheReasonOfAnEarlierFailure) {
  EXPECT_EQ(TAVODBConnect("/nowhere", "postgres", nullptr, "mediaserver"), nullptr);
  EXPECT_NE(connect(), nullptr);
  EXPECT_STREQ(TAVODBErrorGet(nullptr), "");
}

TEST_F(Connecting, IsToPostgresql) {
  EXPECT_EQ(TAVODBDatabaseTypeGet(conn.get()), TAVODB_TYPE_POSTGRESQL);
}

class Session : public DbTest {
 protected:
  /// What the environment asks for; then a connection that was asked.
  void connect_against_other_settings() {
    environment.set("PGOPTIONS",
                    "-c standard_conforming_strings=off -c datestyle=German -c timezone=Japan");
    environment.set("PGDATESTYLE", "SQL, DMY");
    environment.set("PGTZ", "America/New_York");
    environment.set("PGCLIENTENCODING", "LATIN1");
    conn = connect();
    ASSERT_NE(conn, nullptr);
  }
  void expect_our_settings() {
    EXPECT_EQ(column("SHOW client_encoding", "client_encoding").at(0), "UTF8");
    EXPECT_EQ(column("SHOW datestyle", "DateStyle").at(0), "ISO, MDY");
    EXPECT_EQ(column("SHOW timezone", "TimeZone").at(0), "UTC");
    EXPECT_EQ(column("SHOW standard_conforming_strings", "standard_conforming_strings").at(0),
              "on");
  }
};

TEST_F(Session, HasItsSettingsWhateverTheEnvironmentSays) {
  connect_against_other_settings();
  expect_our_settings();
}

TEST_F(Session, HasItsSettingsAfterAReconnect) {
  connect_against_other_settings();
  terminate(session());
  expect_our_settings();
}

TEST_F(Session, PrintsNoNotices) {
  testing::internal::CaptureStderr();
  run("DO $$ BEGIN RAISE WARNING 'watch out'; END $$; DROP TABLE IF EXISTS nothing");
  terminate(session());
  run("DROP TABLE IF EXISTS nothing");
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
}

}  // namespace
}  // namespace mediidx::test
