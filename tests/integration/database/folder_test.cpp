// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Storing folders.
#include "media_test.h"

namespace mediidx::test {
namespace {

using testing::MatchesRegex;

int save(const DIR_INFO_REC& dir) { return DirInfoDBSave(&dir); }

class SavingAFolder : public MediaTest {};

TEST_F(SavingAFolder, InsertsANewOne) {
  auto dir = folder("/d");
  set(dir.title, "ti");
  set(dir.date, "2020-01-02 03:04:05");
  set(dir.mdate, "2021-01-02 03:04:05");
  set(dir.fs_uuid, "uuid");
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  EXPECT_EQ(
      rows("SELECT path, title, date, mdate, fs_uuid, fs_online FROM directory"),
      (std::vector<Row>{{"/d", "ti", "2020-01-02 03:04:05", "2021-01-02 03:04:05", "uuid", "t"}}));
}

TEST_F(SavingAFolder, TakesARecordThatCarriesOnlyAPath) {
  ASSERT_EQ(save(folder("/d")), 0);
  EXPECT_EQ(rows("SELECT title, date, mdate, fs_uuid FROM directory"),
            (std::vector<Row>{{"", "1970-01-01 00:00:00", "1970-01-01 00:00:00", ""}}));
}

TEST_F(SavingAFolder, RewritesTheOneThatIsThere) {
  rows("INSERT INTO directory(path, title) VALUES('/d', 'old'), ('/other', 'other')");
  auto dir = folder("/d");
  set(dir.title, "new");
  set(dir.date, "2020-01-02 03:04:05");
  set(dir.fs_uuid, "uuid");
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  EXPECT_EQ(rows("SELECT path, title, date, fs_uuid FROM directory ORDER BY path"),
            (std::vector<Row>{{"/d", "new", "2020-01-02 03:04:05", "uuid"},
                              {"/other", "other", "<null>", "<null>"}}));
}

TEST_F(SavingAFolder, LeavesOneRowOfAHostileNameAndTouchesNoOther) {
  rows("INSERT INTO directory(path, title) VALUES('/other', 'other')");
  auto dir = folder("x' OR '1'='1");
  set(dir.title, "first");
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  set(dir.title, "second");
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  EXPECT_EQ(rows("SELECT path, title FROM directory ORDER BY path"),
            (std::vector<Row>{{"/other", "other"}, {"x' OR '1'='1", "second"}}));
}

TEST_F(SavingAFolder, StoresAPersonalOneInItsOwnTable) {
  auto dir = folder(personal("d"));
  set(dir.title, "ti");
  set(dir.fs_uuid, "uuid");
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  EXPECT_EQ(rows("SELECT userid, path, title, date, mdate, fs_uuid, updated "
                 "FROM personal_directory"),
            (std::vector<Row>{{"1026", dir.path, "ti", "1970-01-01 00:00:00", "1970-01-01 00:00:00",
                               "uuid", "1"}}));
  EXPECT_EQ(count("directory"), 0);
}

TEST_F(SavingAFolder, RewritesThePersonalOneThatIsThere) {
  auto dir = folder(personal("d"));
  rows("INSERT INTO personal_directory(userid, path, updated) VALUES(7, " + quoted(dir.path) +
       ", '0'), (7, '/other', '0')");
  set(dir.title, "ti");
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  EXPECT_EQ(rows("SELECT userid, path, title, updated FROM personal_directory ORDER BY updated"),
            (std::vector<Row>{{"7", "/other", "<null>", "0"}, {"1026", dir.path, "ti", "1"}}));
}

TEST_F(SavingAFolder, RefusesNull) {
  EXPECT_EQ(DirInfoDBSave(nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter")));
}

TEST_F(SavingAFolder, FailsWithoutAConnection) {
  const NoServer no_server;
  EXPECT_EQ(save(folder("/d")), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

TEST_F(SavingAFolder, LogsAFailedStatement) {
  rows("ALTER TABLE directory DROP COLUMN title");
  EXPECT_EQ(save(folder("/d")), -1);
  EXPECT_THAT(log_lines(), ElementsAre(failed_statement(last_statement())));
}

TEST_F(SavingAFolder, LogsAFailedPersonalStatement) {
  const auto path = personal("d");
  rows("ALTER TABLE personal_directory DROP COLUMN title");
  EXPECT_EQ(save(folder(path)), -1);
  EXPECT_THAT(log_lines(), ElementsAre(failed_statement(last_statement())));
}

TEST_F(SavingAFolder, FailsWhenItsStatementCannotBeBuilt) {
  const Failing fill("TAVODBEscapeStringEX3");
  EXPECT_EQ(save(folder("/d")), -1);
  EXPECT_THAT(log_lines(), ElementsAre(failed_statement("(null)")));
}

TEST_F(SavingAFolder, FailsWithoutTheConditionOfItsCount) {
  const Failing format("TLIBCStrGet");
  EXPECT_EQ(save(folder("/d")), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre(MatchesRegex("mediidx_database \\(N\\) Failed to TLIBCStrGet\\(\\) "
                                       "\\[0x[0-9A-F]{4,} .*:[0-9]+\\]")));
}

}  // namespace
}  // namespace mediidx::test
