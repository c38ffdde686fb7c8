// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "support/statement.h"

#include <gtest/gtest.h>

#include <limits>
#include <string>

namespace mediidx {
namespace {

constexpr auto kText = BindKind::kText;
constexpr auto kInt = BindKind::kInt;
constexpr auto kLongInt = BindKind::kLongInt;

constexpr bool takes(std::string_view sql, std::initializer_list<BindKind> kinds) {
  return placeholders_match(sql, {kinds.begin(), kinds.size()});
}

static_assert(takes("SELECT 1", {}));
static_assert(takes("'@TAVO:VAR'", {kText}));
static_assert(takes("'@TAVO:LVAR/%'", {kText}));
static_assert(takes("FROM @TAVO:NEVAR WHERE", {kText}));
static_assert(takes("@TAVO:INT", {kInt}));
static_assert(takes("'@TAVO:INT'", {kInt}));
static_assert(takes("@TAVO:LLINT", {kLongInt}));
static_assert(takes("@TAVO:INT,@TAVO:LLINT '@TAVO:VAR'", {kInt, kLongInt, kText}));
static_assert(takes("@TAVO:INT@TAVO:INT", {kInt, kInt}));

static_assert(!takes("SELECT 1", {kInt}), "a value too many");
static_assert(!takes("@TAVO:INT", {}), "a value too few");
static_assert(!takes("@TAVO:INT", {kInt, kInt}), "a value too many behind a good one");
static_assert(!takes("@TAVO:INT", {kLongInt}), "a wider value");
static_assert(!takes("@TAVO:LLINT", {kInt}), "a narrower value");
static_assert(!takes("@TAVO:INT", {kText}), "a text for a number");
static_assert(!takes("'@TAVO:VAR'", {kInt}), "a number for a text");
static_assert(!takes("@TAVO:INT '@TAVO:VAR'", {kText, kInt}), "values in the wrong order");
static_assert(!takes("@TAVO:INTS", {kInt}), "no such placeholder");
static_assert(!takes("@TAVO:", {kInt}), "a placeholder without a name");

constexpr Template<const char*, int, std::int64_t> kEveryKind =
    "'@TAVO:VAR' "
    "@TAVO:INT @TAVO:LLINT";

TEST(FillingATemplate, WritesEveryKindOfValue) {
  const char* text = "it's";

  const auto sql = fill(TAVODB_TYPE_POSTGRESQL, kEveryKind, text, std::numeric_limits<int>::min(),
                        std::numeric_limits<std::int64_t>::max());

  ASSERT_TRUE(sql);
  EXPECT_STREQ(sql.get(), "'it''s' -2147483648 9223372036854775807");
}

TEST(FillingATemplate, TakesValuesForNothingButText) {
  const char* text = "@TAVO:INT %s @TAVO:VAR";

  const auto sql = fill(TAVODB_TYPE_POSTGRESQL, kEveryKind, text, 1, std::int64_t{2});

  ASSERT_TRUE(sql);
  EXPECT_STREQ(sql.get(), "'@TAVO:INT %s @TAVO:VAR' 1 2");
}

TEST(FillingATemplate, GivesNothingForAnUnknownDatabase) {
  const char* text = "text";

  EXPECT_FALSE(fill(99, kEveryKind, text, 1, std::int64_t{2}));
}

}  // namespace
}  // namespace mediidx
