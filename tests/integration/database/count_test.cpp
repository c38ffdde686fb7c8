// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Counting rows.
#include "media_test.h"

namespace mediidx::test {
namespace {

using testing::MatchesRegex;

class CountingRows : public MediaTest {
 protected:
  CountingRows() {
    rows("INSERT INTO photo(path, album) VALUES('/a', 'x'), ('/b', 'y'), ('/c', 'y')");
  }
};

TEST_F(CountingRows, CountsAllWithoutACondition) {
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", nullptr, nullptr, 0), 3);
  EXPECT_THAT(sent_statements(), ElementsAre("SELECT COUNT(*) as result_count FROM photo   "));
}

TEST_F(CountingRows, CountsTheValuesOfAColumn) {
  rows("INSERT INTO photo(path) VALUES('/no album')");
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "album", "", "", 0), 3);
}

TEST_F(CountingRows, CountsRowsWithoutAColumn) {
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, nullptr, nullptr, nullptr, 0), 3);
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "", nullptr, nullptr, 0), 3);
}

TEST_F(CountingRows, CountsThoseOfACondition) {
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", "album = 'y'", "", 0), 2);
}

TEST_F(CountingRows, EscapesTheValuesOfItsConditionOnDemand) {
  rows("INSERT INTO photo(path) VALUES('/it''s')");
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", " path='/it's' ", "", 1), 1);
}

TEST_F(CountingRows, TakesItsConditionAsItStandsWithAnyOtherFlag) {
  const Failing escape("EscapeConditionEX");
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", "path = '/a'", "", 2), 1);
  EXPECT_EQ(escape.calls(), 0);
}

TEST_F(CountingRows, ReturnsTheCountOfTheFirstGroup) {
  rows("DELETE FROM photo WHERE album = 'x'");
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", "", "album", 0), 2);
  EXPECT_THAT(sent_statements(),
              ElementsAre("SELECT COUNT(*) as result_count FROM photo   GROUP BY album"));
}

TEST_F(CountingRows, ReturnsNoCountWithoutAGroup) {
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", "path = '/none'", "album", 0), -1);
}

TEST_F(CountingRows, ReturnsNoneWithoutARow) {
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", "path = '/none'", "", 0), 0);
}

TEST_F(CountingRows, RefusesATypeThatCannotBeSelected) {
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_VIDEO_CONVERT, "*", "", "", 0), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad table type.")));
}

TEST_F(CountingRows, FailsWithoutAConnection) {
  const NoServer no_server;
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", "", "", 0), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

TEST_F(CountingRows, FailsWhenItsConditionCannotBeEscaped) {
  const Failing escape("EscapeConditionEX");
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", "path = '/a'", "", 1), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to escape condition.")));
}

class CountingWithoutATextOfIt : public MediaTest, public testing::WithParamInterface<int> {};

TEST_P(CountingWithoutATextOfIt, Fails) {
  const Failing format("TLIBCStrGet", GetParam());
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", "", "album", 0), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre(MatchesRegex("mediidx_database \\(N\\) Failed to TLIBCStrGet\\(\\) "
                                       "\\[0x[0-9A-F]{4,} .*:[0-9]+\\]")));
}

INSTANTIATE_TEST_SUITE_P(GroupAndStatement, CountingWithoutATextOfIt, testing::Range(1, 3));

TEST_F(CountingRows, LogsAFailedStatement) {
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "nonsense", "", "", 0), -1);
  EXPECT_THAT(
      log_lines(),
      ElementsAre(failed_statement("SELECT COUNT(nonsense) as result_count FROM photo   ")));
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_F(CountingRows, FailsWithoutMemory) {
  const FailingAllocation allocation(Allocator::kCalloc, sizeof(MEDIA_DB_HANDLE));
  EXPECT_EQ(MediaInfoDBGetCount(MEDIA_TABLE_PHOTO, "*", "", "", 0), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to malloc")));
}
#endif

}  // namespace
}  // namespace mediidx::test
