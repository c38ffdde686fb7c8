// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Emptying the whole database, and its vacuum.
#include "media_test.h"

namespace mediidx::test {
namespace {

class EmptyingTheDatabase : public MediaTest {};

TEST_F(EmptyingTheDatabase, RemovesEverythingShared) {
  for (const char* table : {"music", "virtual_music", "video", "playlist", "directory", "photo"}) {
    rows(std::string("INSERT INTO ") + table + "(path) VALUES('/a')");
  }
  rows("INSERT INTO track(path, userid) VALUES('/a', 0)");
  EXPECT_EQ(MediaInfoDBDeleteAll(), 0);
  for (const char* table :
       {"music", "virtual_music", "video", "playlist", "directory", "photo", "track"}) {
    EXPECT_EQ(count(table), 0) << table;
  }
}

TEST_F(EmptyingTheDatabase, LeavesPersonalLibrariesAndTranscodedCopiesAlone) {
  rows("INSERT INTO track(path, userid) VALUES('/mine', 1026)");
  rows("INSERT INTO personal_playlist(path) VALUES('/a')");
  rows("INSERT INTO personal_directory(path) VALUES('/a')");
  rows("INSERT INTO video_convert(video_path) VALUES('/a')");
  EXPECT_EQ(MediaInfoDBDeleteAll(), 0);
  EXPECT_EQ(value("SELECT path FROM track"), "/mine");
  for (const char* table : {"personal_playlist", "personal_directory", "video_convert"}) {
    EXPECT_EQ(count(table), 1) << table;
  }
}

TEST_F(EmptyingTheDatabase, RunsItsSevenStatements) {
  MediaInfoDBDeleteAll();
  EXPECT_THAT(sent_statements(),
              ElementsAre("DELETE FROM track WHERE userid = 0; DELETE FROM music; "
                          "DELETE FROM virtual_music; DELETE FROM video; DELETE FROM playlist; "
                          "DELETE FROM directory; DELETE FROM photo; "));
}

TEST_F(EmptyingTheDatabase, LogsAFailedStatementTwice) {
  take_away("photo");
  EXPECT_EQ(MediaInfoDBDeleteAll(), -1);
  const auto sql = last_statement();
  EXPECT_THAT(log_lines(),
              ElementsAre(failed_statement(sql), colon("Failed to exec [" + sql + "].")));
}

TEST_F(EmptyingTheDatabase, FailsWhenItsStatementCannotBeBuilt) {
  const Failing fill("TAVODBEscapeStringEX3");
  EXPECT_EQ(MediaInfoDBDeleteAll(), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre(parens("Bad parameters."), colon("Failed to exec [(null)].")));
}

TEST_F(EmptyingTheDatabase, FailsWithoutAConnection) {
  const NoServer no_server;
  EXPECT_EQ(MediaInfoDBDeleteAll(), -1);
  EXPECT_THAT(log_lines(), testing::Contains(parens("Failed to connect to database")));
}

class Vacuum : public MediaTest {};

TEST_F(Vacuum, LeavesEveryRow) {
  rows("INSERT INTO photo(path) VALUES('/a')");
  EXPECT_EQ(MediaDBVacuum(), 0);
  EXPECT_EQ(count("photo"), 1);
  EXPECT_THAT(sent_statements(), ElementsAre("VACUUM ANALYZE"));
}

TEST_F(Vacuum, FailsWithoutAConnection) {
  const NoServer no_server;
  EXPECT_EQ(MediaDBVacuum(), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database"),
                                       parens("Failed to exec [VACUUM ANALYZE].")));
}

}  // namespace
}  // namespace mediidx::test
