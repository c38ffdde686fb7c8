// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/many_batch.h"

#include <gtest/gtest.h>

namespace mediidx::many {
namespace {

TEST(AnArray, WithoutElementsIsEmpty) {
  ArrayText array;
  EXPECT_TRUE(array.empty());
  EXPECT_STREQ(array.value(), "{}");
}

TEST(AnArray, QuotesItsTexts) {
  ArrayText array(std::vector<std::string>{"a", "", "NULL", "{x,y}", R"("\)"});
  array.add(Text());
  EXPECT_FALSE(array.empty());
  EXPECT_STREQ(array.value(), R"({"a","","NULL","{x,y}","\"\\",NULL})");
}

TEST(AnArray, GoesOnAfterItsValueWasTaken) {
  ArrayText array;
  array.add("a");
  EXPECT_STREQ(array.value(), R"({"a"})");
  array.add("b");
  EXPECT_STREQ(array.value(), R"({"a","b"})");
}

TEST(CopiedRows, StandOneOnALine) {
  CopyRows rows("t(a, b, c, d)");
  EXPECT_TRUE(rows.empty());
  rows.add(1, "text", Text(), std::int64_t{5'000'000'000});
  rows.add(-2, std::string(), Text("x"), std::nullopt);
  EXPECT_FALSE(rows.empty());
  EXPECT_EQ(rows.statement(), "COPY t(a, b, c, d) FROM STDIN");
  EXPECT_EQ(rows.text(), "1\ttext\t\\N\t5000000000\n-2\t\tx\t\\N\n");
}

TEST(CopiedRows, EscapeWhatMeansSomethingToCopy) {
  CopyRows rows("t(a)");
  rows.add("a\tb\nc\rd\\N");
  rows.add("\\.");
  EXPECT_EQ(rows.text(), "a\\tb\\nc\\rd\\\\N\n\\\\.\n");
}

}  // namespace
}  // namespace mediidx::many
