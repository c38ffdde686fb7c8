// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <tavodb.h>

#include "command.h"
#include "database.h"

namespace mediidx::test {
namespace {

using testing::HasSubstr;

class TheDatabase : public DatabaseTest {
 protected:
  Outcome init() { return run_mediidx({"db", "init", "--data-dir", data.at("d")}); }
  static void drop() {
    auto* conn = TAVODBConnect(nullptr, "postgres", nullptr, "postgres");
    ASSERT_NE(conn, nullptr);
    EXPECT_GE(TAVODBExecute(conn, "DROP DATABASE mediaserver WITH (FORCE)", nullptr), 0);
    TAVODBClose(conn);
  }

  OpenFolder data;
};

TEST_F(TheDatabase, IsMadeWhereItIsMissing) {
  drop();
  const auto run = init();
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_THAT(run.out, HasSubstr(" is ready, with version 3 of its tables.\n"));
  EXPECT_EQ(rows("SELECT pg_encoding_to_char(encoding), datcollate, datctype FROM pg_database "
                 "WHERE datname = 'mediaserver'"),
            (std::vector<Row>{{"UTF8", "C", "C.UTF-8"}}));
  EXPECT_EQ(count("music"), 0);
}

TEST_F(TheDatabase, KeepsItsRowsWhenItIsThere) {
  rows("INSERT INTO music (path) VALUES ('/a')");
  const auto run = init();
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_THAT(run.out, HasSubstr(" was ready, with version 3 of its tables.\n"));
  EXPECT_EQ(count("music"), 1);
}

TEST_F(TheDatabase, GetsItsTablesWhenItIsEmpty) {
  rows("DROP SCHEMA mediidx CASCADE");
  rows("DROP SCHEMA public CASCADE");
  rows("CREATE SCHEMA public");
  EXPECT_EQ(init().status, 0);
  EXPECT_EQ(count("track"), 0);
}

TEST_F(TheDatabase, OfANewerVersionIsLeftAlone) {
  rows("INSERT INTO mediidx.schema_version (version) VALUES (999)");
  const auto run = init();
  EXPECT_EQ(run.status, 5);
  EXPECT_EQ(run.err, "mediidx: the database was made by a newer mediidx\n");
}

TEST_F(TheDatabase, ThatCannotBeReachedIsNamed) {
  Setting setting;
  setting.environment["PGHOST"] = data.at("nowhere");
  const auto run = run_mediidx({"list", "music", "--data-dir", data.at("d")}, setting);
  EXPECT_EQ(run.status, 5);
  EXPECT_THAT(run.err,
              HasSubstr("mediidx: no connection to the database server as the role postgres"));
}

TEST_F(TheDatabase, IsMadeByAListToo) {
  drop();
  const auto run = run_mediidx({"list", "music", "--json", "--data-dir", data.at("d")});
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_EQ(run.out, "[]\n");
}

TEST(TheCommand, ShowsItsHelpAndVersion) {
  EXPECT_THAT(run_mediidx({"help"}).out, HasSubstr("mediidx index FOLDER..."));
  EXPECT_EQ(run_mediidx({"help"}).out, run_mediidx({"--help"}).out);
  EXPECT_THAT(run_mediidx({"help", "db", "init"}).out, HasSubstr("Usage: mediidx db init"));
  EXPECT_THAT(run_mediidx({"--version"}).out, testing::StartsWith("mediidx "));
}

TEST(TheCommand, EndsWithTwoWhenItIsNotUnderstood) {
  const std::vector<std::vector<std::string>> lines{
      {}, {"frobnicate"}, {"index"}, {"list"}, {"--what"}};
  for (const auto& line : lines) {
    const auto run = run_mediidx(line);
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.out, "");
    EXPECT_THAT(run.err, HasSubstr("Try \"mediidx help\"."));
  }
}

}  // namespace
}  // namespace mediidx::test
