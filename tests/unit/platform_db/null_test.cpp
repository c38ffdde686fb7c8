// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavodb.h>

#include <cstdint>

namespace mediidx::test {
namespace {

TEST(NoConnection, FailsEveryCall) {
  tavodb_result* result = nullptr;
  EXPECT_EQ(TAVODBExecute(nullptr, "SELECT 1", &result), -1);
  EXPECT_EQ(TAVODBSelectLimit(nullptr, "SELECT 1", 1, 1, &result), -1);
  EXPECT_EQ(TAVODBAffectedRows(nullptr, nullptr), -1);
  EXPECT_EQ(TAVODBDatabaseTypeGet(nullptr), -1);
  EXPECT_EQ(result, nullptr);
}

TEST(NoConnection, HasAnErrorText) { EXPECT_NE(TAVODBErrorGet(nullptr), nullptr); }

TEST(NoConnection, IsClosedAlready) { TAVODBClose(nullptr); }

TEST(NoResult, HasNoRows) {
  std::uint32_t row = 7;
  EXPECT_EQ(TAVODBNumRows(nullptr), -1);
  EXPECT_EQ(TAVODBFetchRow(nullptr, &row), -1);
  EXPECT_EQ(row, 7U);
  EXPECT_EQ(TAVODBFetchField(nullptr, 1, "id"), nullptr);
  EXPECT_EQ(TAVODBSetRowCursor(nullptr, 0), -1);
}

TEST(NoResult, IsFreedAlready) { TAVODBFreeResult(nullptr); }

}  // namespace
}  // namespace mediidx::test
