// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavodb.h>

#include <cstdlib>
#include <cstring>
#include <optional>
#include <string>
#include <vector>

#include "random_text.h"

namespace mediidx::test {
namespace {

using Text = std::optional<std::string>;

/// Runs a call on a buffer of exactly `size` bytes; its text, or nothing when it failed.
template <class Call>
Text in_buffer(std::size_t size, Call call) {
  std::vector<char> buffer(size, '#');
  const int result = call(buffer.data(), size);
  if (result == -1) return std::nullopt;
  EXPECT_EQ(result, 0);
  EXPECT_NE(std::memchr(buffer.data(), '\0', size), nullptr) << "not terminated";
  return buffer.data();
}

Text literal(const std::string& text) {
  return in_buffer(2 * text.size() + 1, [&](char* to, std::size_t) {
    return TAVODBEscapeString(to, text.data(), text.size());
  });
}
Text literal(int type, std::size_t size, const std::string& text) {
  return in_buffer(size, [&](char* to, std::size_t bytes) {
    return TAVODBEscapeStringEX2(type, to, bytes, text.data(), text.size());
  });
}
Text pattern(std::size_t size, const std::string& text) {
  return in_buffer(size, [&](char* to, std::size_t bytes) {
    return TAVODBEscapeBackslash(to, bytes, text.c_str());
  });
}
Text pattern(int type, std::size_t size, const std::string& text) {
  return in_buffer(size, [&](char* to, std::size_t bytes) {
    return TAVODBEscapeBackslashEX2(type, to, bytes, text.c_str());
  });
}

struct EscapeCase {
  const char* name;
  const char* text;
  const char* as_literal;
  const char* as_pattern;  ///< Of the literal.
};

class Escaping : public testing::TestWithParam<EscapeCase> {};

TEST_P(Escaping, MakesALiteralThenAPattern) {
  const auto escaped = literal(GetParam().text);
  EXPECT_EQ(escaped, GetParam().as_literal);
  EXPECT_EQ(pattern(3 * escaped->size() + 1, *escaped), GetParam().as_pattern);
}

INSTANTIATE_TEST_SUITE_P(Cases, Escaping,
                         testing::Values(EscapeCase{"Empty", "", "", ""},
                                         EscapeCase{"Plain", "/a b", "/a b", "/a b"},
                                         EscapeCase{"Quote", "it's", "it''s", "it''s"},
                                         EscapeCase{"OnlyQuotes", "'''", "''''''", "''''''"},
                                         EscapeCase{"Backslash", "a\\b", "a\\b", "a\\\\b"},
                                         EscapeCase{"Wildcards", "%_", "%_", "\\%\\_"},
                                         EscapeCase{"Unicode", "音楽é", "音楽é", "音楽é"}),
                         [](const auto& test) { return test.param.name; });

TEST(EscapingALiteral, ReadsNoMoreThanItsLength) {
  char to[] = "#########";
  EXPECT_EQ(TAVODBEscapeString(to, "a'bc", 2), 0);
  EXPECT_STREQ(to, "a''");
}

TEST(EscapingALiteral, EndsAtANul) { EXPECT_EQ(literal(std::string("a\0'b", 4)), "a"); }

TEST(EscapingALiteral, FitsItsSizeToTheByte) {
  EXPECT_EQ(literal(TAVODB_TYPE_POSTGRESQL, 5, "a'b"), "a''b");
  EXPECT_EQ(literal(TAVODB_TYPE_POSTGRESQL, 1, ""), "");
}

TEST(EscapingALiteral, FailsInTooSmallASpace) {
  char to[] = "####";
  EXPECT_EQ(TAVODBEscapeStringEX2(TAVODB_TYPE_POSTGRESQL, to, 4, "a'b", 3), -1);
  EXPECT_STREQ(to, "");
  EXPECT_EQ(TAVODBEscapeStringEX2(TAVODB_TYPE_POSTGRESQL, to, 0, "", 0), -1);
}

TEST(EscapingAPattern, FitsItsSizeToTheByte) {
  EXPECT_EQ(pattern(4, "a%"), "a\\%");
  EXPECT_EQ(pattern(TAVODB_TYPE_POSTGRESQL, 4, "a%"), "a\\%");
}

TEST(EscapingAPattern, FailsInTooSmallASpace) {
  EXPECT_EQ(pattern(3, "a%"), std::nullopt);
  EXPECT_EQ(pattern(TAVODB_TYPE_POSTGRESQL, 3, "a%"), std::nullopt);
  char to[] = "#";
  EXPECT_EQ(TAVODBEscapeBackslash(to, 0, ""), -1);
  EXPECT_STREQ(to, "#");
}

TEST(Escaping, IsForPostgresqlOnly) {
  for (const int type : {-1, 0, 2}) {
    EXPECT_EQ(literal(type, 9, "a"), std::nullopt) << type;
    EXPECT_EQ(pattern(type, 9, "a"), std::nullopt) << type;
  }
}

TEST(Escaping, NeedsBothTexts) {
  char to[8];
  EXPECT_EQ(TAVODBEscapeString(nullptr, "a", 1), -1);
  EXPECT_EQ(TAVODBEscapeString(to, nullptr, 1), -1);
  EXPECT_EQ(TAVODBEscapeStringEX2(TAVODB_TYPE_POSTGRESQL, nullptr, 8, "a", 1), -1);
  EXPECT_EQ(TAVODBEscapeStringEX2(TAVODB_TYPE_POSTGRESQL, to, 8, nullptr, 0), -1);
  EXPECT_EQ(TAVODBEscapeBackslash(nullptr, 8, "a"), -1);
  EXPECT_EQ(TAVODBEscapeBackslash(to, 8, nullptr), -1);
}

TEST(Escaping, MakesWhatATemplateMakes) {
  RandomTexts texts;
  for (int i = 0; i < 2000; ++i) {
    const auto text = texts.next();
    const auto escaped = literal(text);
    ASSERT_TRUE(escaped);
    EXPECT_EQ(literal(TAVODB_TYPE_POSTGRESQL, 2 * text.size() + 1, text), escaped);
    char* filled = TAVODBEscapeStringEX3(TAVODB_TYPE_POSTGRESQL, "@TAVO:VAR|@TAVO:LVAR",
                                         text.c_str(), text.c_str());
    ASSERT_NE(filled, nullptr);
    EXPECT_EQ(*escaped + "|" + pattern(3 * escaped->size() + 1, *escaped).value(), filled);
    std::free(filled);
  }
}

}  // namespace
}  // namespace mediidx::test
