// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "store/row_arrays.h"

#include <gtest/gtest.h>

namespace mediidx::tool {
namespace {

TEST(RowArrays, HoldAnArrayForEachColumn) {
  RowArrays rows{"integer", "text"};
  rows.add(1, "one");
  rows.add(-2, std::string("two"));
  EXPECT_EQ(rows.unnest(), R"(unnest('{1,-2}'::integer[], '{"one","two"}'::text[]))");
}

TEST(RowArrays, TakeTextsAsTheyAre) {
  RowArrays rows{"text"};
  for (const char* text : {"", "NULL", "it's", "a,b", "\"{}\\"}) rows.add(text);
  EXPECT_EQ(rows.unnest(), R"(unnest('{"","NULL","it''s","a,b","\"{}\\"}'::text[]))");
}

TEST(RowArrays, TakeNulls) {
  RowArrays rows{"text", "bigint"};
  rows.add(std::optional<std::string>(), std::optional(7));
  EXPECT_EQ(rows.unnest(), "unnest('{NULL}'::text[], '{7}'::bigint[])");
}

TEST(RowArrays, MayBeEmpty) {
  EXPECT_EQ(RowArrays({"integer"}).unnest(), "unnest('{}'::integer[])");
}

}  // namespace
}  // namespace mediidx::tool
