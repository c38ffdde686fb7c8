// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Every statement that the library sent in the runs of the other test programs, on a database of
// 100,000 songs: the tables take it, and it reads no table as a whole.
#include <gmock/gmock.h>

#include <regex>

#include "big_library.h"
#include "database.h"
#include "recorded_statements.h"

namespace mediidx::test {
namespace {

using testing::IsEmpty;
using testing::Not;

struct Exception {
  std::regex shape;
  const char* reason;
};

/// Statements that read whole tables, and why they may.
const std::vector<Exception>& exceptions() {
  static const auto optimize = std::regex::ECMAScript | std::regex::optimize;
  static const std::vector<Exception> all{
      {std::regex("DELETE FROM (music|virtual_music|video|playlist|directory|photo)", optimize),
       "the reset empties these tables"},
      {std::regex("DELETE FROM track WHERE userid = 0", optimize),
       "the reset takes every track outside the personal libraries"},
      {std::regex(R"(UPDATE \w+ set fs_online = '\?')", optimize),
       "the online state of everything"},
      {std::regex(R"(SELECT .+ FROM (music|video|photo|playlist|directory)( (GROUP|ORDER) BY .+)?)",
                  optimize),
       "a caller asks for all rows, or for their number"},
      {std::regex(R"(SELECT .+ FROM (music|video|photo|playlist|directory) WHERE )"
                  R"((?!.*\b(path|id)\b).+)",
                  optimize),
       "a caller's own condition, on columns that the library never searches"},
      {std::regex(R"((SELECT|UPDATE|DELETE) .+ (WHERE|where) path like '/?%'.*)", optimize),
       "a prefix over everything"},
      {std::regex(R"(SELECT .+ WHERE path (< >|! =) '\?'.*)", optimize),
       "a caller asks for all rows but those of one path"},
  };
  return all;
}

bool may_read_whole_tables(const std::string& shape) {
  for (const auto& exception : exceptions()) {
    if (std::regex_match(shape, exception.shape)) return true;
  }
  return false;
}

/// True for what can be prepared and explained; VACUUM cannot.
bool is_planned(const std::string& shape) {
  return std::regex_search(shape, std::regex("^(SELECT|INSERT|UPDATE|DELETE) "));
}

TEST(RecordedStatements, AreThere) {
  EXPECT_THAT(recorded_statements(), Not(IsEmpty()))
      << "run the other test programs by ctest first; they record into " MEDIIDX_JOURNAL_FOLDER;
}

TEST(RecordedStatements, NameEveryTable) {
  std::vector<std::string> unnamed;
  for (const auto& [table, rows] : BigLibrary::get().tables()) {
    const std::regex name("(FROM|INTO|UPDATE) " + table + "\\b");
    bool is_named = false;
    for (const auto& [shape, statement] : recorded_statements()) {
      is_named = is_named || std::regex_search(shape, name);
    }
    if (!is_named) unnamed.push_back(table);
  }
  EXPECT_THAT(unnamed, IsEmpty());
}

TEST(EveryStatement, IsTakenByTheTables) {
  BigLibrary::get();
  ASSERT_THAT(recorded_statements(), Not(IsEmpty()));
  for (const auto& [shape, statement] : recorded_statements()) {
    const auto text = is_planned(shape) ? "PREPARE recorded AS " + statement : statement;
    EXPECT_NO_THROW(TestServer::get().rows(text)) << text;
  }
}

TEST(EveryStatement, ReadsOnlyTheRowsThatItNames) {
  ASSERT_THAT(recorded_statements(), Not(IsEmpty()));
  for (const auto& [shape, statement] : recorded_statements()) {
    if (!is_planned(shape) || may_read_whole_tables(shape)) continue;
    EXPECT_THAT(BigLibrary::get().wide_scans(statement), IsEmpty())
        << "shape: " << shape << "\nstatement: " << statement;
  }
}

TEST(TheCheckOfPlans, NoticesAScanOfATable) {
  EXPECT_THAT(BigLibrary::get().wide_scans("SELECT * FROM music WHERE title = 'x'"),
              Not(IsEmpty()));
}

TEST(TheCheckOfPlans, NoticesAnIndexReadAsAWhole) {
  EXPECT_THAT(BigLibrary::get().wide_scans("SELECT id FROM track ORDER BY id LIMIT 1"),
              Not(IsEmpty()));
}

TEST(TheCheckOfPlans, NoticesASearchThatFindsMuch) {
  EXPECT_THAT(
      BigLibrary::get().wide_scans("SELECT * FROM photo WHERE path like '/volume3/pictures/1%'"),
      Not(IsEmpty()));
}

}  // namespace
}  // namespace mediidx::test
