// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "db_server.h"

namespace mediidx::test {
namespace {

class Rows : public DbTest {
 protected:
  std::uint32_t next(const OwnedRowSet& rows) {
    std::uint32_t row = 0;
    return TAVODBFetchRow(rows.get(), &row) == -1 ? 0 : row;
  }
};

TEST_F(Rows, AreFetchedInOrderUpToTheLast) {
  const auto rows = run("SELECT generate_series(7, 9) AS n");
  EXPECT_EQ(TAVODBNumRows(rows.get()), 3);
  for (const char* text : {"7", "8", "9"}) {
    EXPECT_STREQ(TAVODBFetchField(rows.get(), next(rows), "n"), text);
  }
  std::uint32_t row = 42;
  EXPECT_EQ(TAVODBFetchRow(rows.get(), &row), -1);
  EXPECT_EQ(TAVODBFetchRow(rows.get(), &row), -1);
  EXPECT_EQ(row, 42U);
}

TEST_F(Rows, HaveCursorsThatStayGood) {
  const auto rows = run("SELECT generate_series(7, 9) AS n");
  const auto first = next(rows);
  const auto second = next(rows);
  EXPECT_STREQ(TAVODBFetchField(rows.get(), first, "n"), "7");
  EXPECT_STREQ(TAVODBFetchField(rows.get(), second, "n"), "8");
}

TEST_F(Rows, HaveNoFieldsBesideThem) {
  const auto rows = run("SELECT 1 AS n");
  EXPECT_EQ(TAVODBFetchField(rows.get(), 0, "n"), nullptr);
  EXPECT_EQ(TAVODBFetchField(rows.get(), 2, "n"), nullptr);
  EXPECT_EQ(TAVODBFetchField(rows.get(), 4294967295U, "n"), nullptr);
}

TEST_F(Rows, TellNullFromEmpty) {
  const auto rows = run("SELECT NULL AS nothing, '' AS empty");
  const auto row = next(rows);
  EXPECT_EQ(TAVODBFetchField(rows.get(), row, "nothing"), nullptr);
  EXPECT_STREQ(TAVODBFetchField(rows.get(), row, "empty"), "");
}

TEST_F(Rows, HaveNoColumnsButTheirOwn) {
  const auto rows = run("SELECT 1 AS n");
  const auto row = next(rows);
  EXPECT_EQ(TAVODBFetchField(rows.get(), row, "m"), nullptr);
  EXPECT_EQ(TAVODBFetchField(rows.get(), row, ""), nullptr);
  EXPECT_EQ(TAVODBFetchField(rows.get(), row, nullptr), nullptr);
}

TEST_F(Rows, ReadTheFirstOfSeveralColumnsOfOneName) {
  const auto rows = run("SELECT 1 AS n, 2 AS n, NULL AS m, 3 AS m");
  const auto row = next(rows);
  EXPECT_STREQ(TAVODBFetchField(rows.get(), row, "n"), "1");
  EXPECT_EQ(TAVODBFetchField(rows.get(), row, "m"), nullptr);
}

TEST_F(Rows, FindANameAsTheServerFoldsIt) {
  const auto rows = run("SELECT 640 AS resolutionX, 1 AS \"Exact\", 2 AS exact");
  const auto row = next(rows);
  EXPECT_STREQ(TAVODBFetchField(rows.get(), row, "resolutionX"), "640");
  EXPECT_STREQ(TAVODBFetchField(rows.get(), row, "Exact"), "1");
  EXPECT_STREQ(TAVODBFetchField(rows.get(), row, "EXACT"), "2");
}

TEST_F(Rows, AreFetchedFromWhereTheCursorWasSet) {
  const auto rows = run("SELECT generate_series(7, 9) AS n");
  EXPECT_EQ(TAVODBSetRowCursor(rows.get(), 2), 0);
  EXPECT_STREQ(TAVODBFetchField(rows.get(), next(rows), "n"), "9");
  EXPECT_EQ(next(rows), 0U);
  EXPECT_EQ(TAVODBSetRowCursor(rows.get(), 0), 0);
  EXPECT_STREQ(TAVODBFetchField(rows.get(), next(rows), "n"), "7");
}

TEST_F(Rows, KeepTheirCursorWhenItCannotBeSet) {
  const auto rows = run("SELECT generate_series(7, 9) AS n");
  next(rows);
  EXPECT_EQ(TAVODBSetRowCursor(rows.get(), 3), -1);
  EXPECT_EQ(TAVODBSetRowCursor(rows.get(), 4294967295U), -1);
  EXPECT_STREQ(TAVODBFetchField(rows.get(), next(rows), "n"), "8");
}

TEST_F(Rows, HaveNoCursorWhenThereAreNone) {
  const auto rows = run("SELECT 1 AS n WHERE false");
  EXPECT_EQ(TAVODBSetRowCursor(rows.get(), 0), -1);
  EXPECT_EQ(next(rows), 0U);
}

TEST_F(Rows, NeedAPlaceForTheirCursor) {
  const auto rows = run("SELECT 1 AS n");
  EXPECT_EQ(TAVODBFetchRow(rows.get(), nullptr), -1);
  EXPECT_STREQ(TAVODBFetchField(rows.get(), next(rows), "n"), "1");
}

TEST_F(Rows, OutliveTheirConnection) {
  const auto rows = run("SELECT 'kept' AS n");
  conn.reset();
  EXPECT_STREQ(TAVODBFetchField(rows.get(), next(rows), "n"), "kept");
}

}  // namespace
}  // namespace mediidx::test
