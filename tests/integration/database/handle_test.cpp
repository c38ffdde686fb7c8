// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Opening, walking and closing a SELECT over one table.
#include <cstring>

#include "media_test.h"

namespace mediidx::test {
namespace {

using testing::MatchesRegex;

class OpeningAHandle : public MediaTest {
 protected:
  OpeningAHandle() {
    rows("INSERT INTO video(path, title) VALUES('/a', 'one'), ('/b', 'two'), ('/c', 'one')");
  }
};

struct TableCase {
  MEDIA_TABLE_TYPE type;
  const char* statement;
};

class OpeningATable : public MediaTest, public testing::WithParamInterface<TableCase> {};

TEST_P(OpeningATable, SelectsFromIt) {
  const auto handle = open(GetParam().type);
  ASSERT_NE(handle, nullptr);
  EXPECT_EQ(handle->tableType, GetParam().type);
  EXPECT_THAT(sent_statements(), ElementsAre(GetParam().statement));
}

INSTANTIATE_TEST_SUITE_P(
    Tables, OpeningATable,
    testing::Values(TableCase{MEDIA_TABLE_MUSIC, "SELECT * FROM music    "},
                    TableCase{MEDIA_TABLE_VIDEO, "SELECT * FROM video    "},
                    TableCase{MEDIA_TABLE_PHOTO, "SELECT * FROM photo    "},
                    TableCase{MEDIA_TABLE_PLAYLIST, "SELECT * FROM playlist    "},
                    TableCase{MEDIA_TABLE_DIRECTORY, "SELECT * FROM directory    "}),
    [](const auto& test) { return std::to_string(test.param.type); });

class OpeningNoTable : public MediaTest, public testing::WithParamInterface<MEDIA_TABLE_TYPE> {};

TEST_P(OpeningNoTable, IsRefused) {
  EXPECT_EQ(open(GetParam()), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad table type.")));
  EXPECT_THAT(sent_statements(), IsEmpty());
}

INSTANTIATE_TEST_SUITE_P(Types, OpeningNoTable,
                         testing::Values(MEDIA_TABLE_VIDEO_CONVERT, MEDIA_TABLE_FOLDER, 7U,
                                         0xFFFFFFFFU),
                         [](const auto& test) { return std::to_string(test.param); });

TEST_F(OpeningAHandle, HoldsTheSharedConnectionAndTheNumberOfRows) {
  const auto handle = open(MEDIA_TABLE_VIDEO);
  ASSERT_NE(handle, nullptr);
  EXPECT_EQ(handle->conn, gpDBConnect);
  EXPECT_NE(handle->result, nullptr);
  EXPECT_EQ(handle->row, 0U);
  EXPECT_EQ(handle->rowCount, 3U);
  EXPECT_EQ(handle->tableType, static_cast<MEDIA_TABLE_TYPE>(MEDIA_TABLE_VIDEO));
}

TEST_F(OpeningAHandle, PutsEveryClauseInItsPlace) {
  const auto handle = open(MEDIA_TABLE_VIDEO, "title", "path like '/%'", "title", "title DESC");
  ASSERT_NE(handle, nullptr);
  EXPECT_THAT(sent_statements(),
              ElementsAre("SELECT title FROM video WHERE path like '/%' GROUP BY title "
                          "ORDER BY title DESC"));
  EXPECT_EQ(handle->rowCount, 2U);
}

TEST_F(OpeningAHandle, LeavesOutEmptyClauses) {
  const auto handle = open(MEDIA_TABLE_VIDEO, "", "", "", "");
  EXPECT_NE(handle, nullptr);
  EXPECT_THAT(sent_statements(), ElementsAre("SELECT * FROM video    "));
}

TEST_F(OpeningAHandle, SkipsTheFirstRangeAndReturnsAtMostTheSecond) {
  const auto handle = open(MEDIA_TABLE_VIDEO, "path", nullptr, nullptr, "path", 1, 1);
  EXPECT_THAT(paths(handle.get()), ElementsAre("/b"));
}

TEST_F(OpeningAHandle, ReturnsAllRowsWithoutARange) {
  const auto handle = open(MEDIA_TABLE_VIDEO, "path", nullptr, nullptr, "path", 0, 0);
  EXPECT_THAT(paths(handle.get()), ElementsAre("/a", "/b", "/c"));
}

TEST_F(OpeningAHandle, EscapesTheValuesOfItsConditionOnDemand) {
  rows("INSERT INTO video(path) VALUES('/it''s')");
  const auto handle = open(MEDIA_TABLE_VIDEO, "path", " path='/it's' ", nullptr, nullptr, 0, 0, 1);
  EXPECT_THAT(paths(handle.get()), ElementsAre("/it's"));
}

TEST_F(OpeningAHandle, TakesItsConditionAsItStandsWithAnyOtherFlag) {
  const Failing escape("EscapeConditionEX");
  const auto handle = open(MEDIA_TABLE_VIDEO, "path", "path='/a'", nullptr, nullptr, 0, 0, 2);
  EXPECT_THAT(paths(handle.get()), ElementsAre("/a"));
  EXPECT_EQ(escape.calls(), 0);
}

TEST_F(OpeningAHandle, EscapesNothingOfAnEmptyCondition) {
  const Failing escape("EscapeConditionEX");
  EXPECT_NE(open(MEDIA_TABLE_VIDEO, nullptr, "", nullptr, nullptr, 0, 0, 1), nullptr);
  EXPECT_NE(open(MEDIA_TABLE_VIDEO, nullptr, nullptr, nullptr, nullptr, 0, 0, 1), nullptr);
  EXPECT_EQ(escape.calls(), 0);
}

TEST_F(OpeningAHandle, FailsWhenItsConditionCannotBeEscaped) {
  const Failing escape("EscapeConditionEX");
  EXPECT_EQ(open(MEDIA_TABLE_VIDEO, nullptr, "path='/a'", nullptr, nullptr, 0, 0, 1), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to escape condition.")));
}

TEST_F(OpeningAHandle, LooksAtItsTypeAfterTheCondition) {
  const Failing escape("EscapeConditionEX");
  EXPECT_EQ(open(9, nullptr, "path='/a'", nullptr, nullptr, 0, 0, 1), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to escape condition.")));
}

class OpeningWithoutATextOfIt : public MediaTest, public testing::WithParamInterface<int> {};

TEST_P(OpeningWithoutATextOfIt, Fails) {
  const Failing format("TLIBCStrGet", GetParam());
  EXPECT_EQ(open(MEDIA_TABLE_VIDEO, "path", nullptr, "path", "path"), nullptr);
  EXPECT_EQ(format.calls(), GetParam());
  EXPECT_THAT(log_lines(),
              ElementsAre(MatchesRegex("mediidx_database \\(N\\) Failed to TLIBCStrGet\\(\\) "
                                       "\\[0x[0-9A-F]{4,} .*:[0-9]+\\]")));
}

INSTANTIATE_TEST_SUITE_P(GroupOrderAndStatement, OpeningWithoutATextOfIt, testing::Range(1, 4));

TEST_F(OpeningAHandle, FailsWithoutAConnection) {
  const NoServer no_server;
  EXPECT_EQ(open(MEDIA_TABLE_VIDEO), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

TEST_F(OpeningAHandle, LogsAFailedSelect) {
  EXPECT_EQ(open(MEDIA_TABLE_VIDEO, "nonsense"), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(failed_statement("SELECT nonsense FROM video    ")));
  EXPECT_TRUE(was_logged("column \"nonsense\" does not exist"));
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_F(OpeningAHandle, FailsWithoutMemory) {
  const FailingAllocation allocation(Allocator::kCalloc, sizeof(MEDIA_DB_HANDLE));
  EXPECT_EQ(open(MEDIA_TABLE_VIDEO), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to malloc")));
}

TEST_F(OpeningAHandle, FailsInSilenceWithoutMemoryForItsCondition) {
  const std::string where = "path='" + std::string(3210, 'x') + "'";
  MediaDBConnGet();
  const FailingAllocation allocation(Allocator::kCalloc, 2 * where.size() + 1);
  EXPECT_EQ(open(MEDIA_TABLE_VIDEO, nullptr, where.c_str(), nullptr, nullptr, 0, 0, 0), nullptr);
  EXPECT_THAT(log_lines(), IsEmpty());
}
#endif

TEST_F(OpeningAHandle, IsTheSameUnderItsShortName) {
  const Handle handle(
      MediaInfoDBOpen(MEDIA_TABLE_VIDEO, "path", "path <> '/b'", nullptr, "path", 1, 1, 0),
      MediaInfoDBClose);
  EXPECT_THAT(paths(handle.get()), ElementsAre("/c"));
}

class ClosingAHandle : public MediaTest {};

TEST_F(ClosingAHandle, IgnoresNull) {
  MediaInfoDBClose(nullptr);
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_F(ClosingAHandle, LeavesTheConnectionOpen) {
  open(MEDIA_TABLE_VIDEO).reset();
  EXPECT_NE(gpDBConnect, nullptr);
  EXPECT_NE(MediaDBExec("SELECT 1"), -1);
}

TEST_F(ClosingAHandle, LeavesOtherHandlesAlone) {
  rows("INSERT INTO photo(path) VALUES('/p')");
  const auto photos = open(MEDIA_TABLE_PHOTO);
  open(MEDIA_TABLE_VIDEO).reset();
  EXPECT_THAT(paths(photos.get()), ElementsAre("/p"));
}

}  // namespace
}  // namespace mediidx::test
