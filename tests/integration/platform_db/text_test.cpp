// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include <set>

#include "../../unit/platform_db/random_text.h"
#include "db_server.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;

class Texts : public DbTest {
 protected:
  Texts() { run("CREATE TABLE t(value text UNIQUE, note text)"); }

  void insert(const std::string& text) {
    run(filled("INSERT INTO t(value) VALUES('@TAVO:VAR')", text.c_str()));
  }
  static std::string condition(const std::string& value) {
    const auto text = " value='" + value + "' ";
    std::vector<char> escaped(2 * text.size() + 1);
    EXPECT_NE(EscapeConditionEX(nullptr, text.c_str(), escaped.data()), -1);
    return escaped.data();
  }
  static std::set<std::string> random_texts(int count) {
    RandomTexts source;
    std::set<std::string> texts;
    while (static_cast<int>(texts.size()) < count) texts.insert(source.next(12));
    return texts;
  }
};

TEST_F(Texts, AreReadBackAsTheyWereWritten) {
  const auto texts = random_texts(300);
  for (const auto& text : texts) insert(text);
  const auto read = column("SELECT value FROM t");
  EXPECT_EQ(std::set<std::string>(read.begin(), read.end()), texts);
  EXPECT_EQ(read.size(), texts.size());
}

TEST_F(Texts, MatchOnlyThemselvesInAPattern) {
  const auto texts = random_texts(200);
  for (const auto& text : texts) insert(text);
  for (const auto& text : texts) {
    const auto sql = filled("SELECT value FROM t WHERE value like '@TAVO:LVAR'", text.c_str());
    EXPECT_THAT(column(sql), ElementsAre(text)) << sql;
  }
}

TEST_F(Texts, MatchOnlyWhatLiesBelowThemInAFolderPattern) {
  for (const char* folder : {"/a%b", "/a_b", "/a\\b", "/a'b", "/axb", "/a\\%b", "/a%b2"}) {
    insert(std::string(folder) + "/song");
  }
  for (const char* folder : {"/a%b", "/a_b", "/a\\b", "/a'b", "/axb", "/a\\%b", "/a%b2"}) {
    EXPECT_THAT(column(filled("SELECT value FROM t WHERE value like '@TAVO:LVAR/%'", folder)),
                ElementsAre(std::string(folder) + "/song"));
  }
}

TEST_F(Texts, MatchOnlyThemselvesWhenEscapedByHand) {
  const auto texts = random_texts(100);
  for (const auto& text : texts) insert(text);
  for (const auto& text : texts) {
    std::vector<char> literal(2 * text.size() + 1);
    ASSERT_NE(TAVODBEscapeString(literal.data(), text.data(), text.size()), -1);
    std::vector<char> pattern(3 * std::string(literal.data()).size() + 1);
    ASSERT_NE(TAVODBEscapeBackslash(pattern.data(), pattern.size(), literal.data()), -1);
    const std::string where = "SELECT value FROM t WHERE value ";
    EXPECT_THAT(column(where + "= '" + literal.data() + "'"), ElementsAre(text));
    EXPECT_THAT(column(where + "like '" + pattern.data() + "'"), ElementsAre(text));
  }
}

TEST_F(Texts, AreFoundByAConditionWhateverTheyHold) {
  auto texts = random_texts(200);
  texts.insert({"x' OR '1'='1", "x'; DELETE FROM t; --", "'", "a'", "'a", "\\", "\\'", "''"});
  for (const auto& text : texts) insert(text);
  for (const auto& text : texts) {
    EXPECT_THAT(column("SELECT value FROM t WHERE " + condition(text)), ElementsAre(text));
  }
  EXPECT_EQ(column("SELECT value FROM t").size(), texts.size());
}

TEST_F(Texts, TouchOneRowEachWhenSavedTwiceByACondition) {
  const std::string name = "x' OR '1'='1";
  insert("/other");
  for (int i = 0; i < 2; ++i) {
    const auto count = column("SELECT COUNT(*) AS value FROM t WHERE " + condition(name)).at(0);
    run(count == "0"
            ? filled("INSERT INTO t(value, note) VALUES('@TAVO:VAR', 'new')", name.c_str())
            : filled("UPDATE t SET note = 'saved again' WHERE value = '@TAVO:VAR'", name.c_str()));
  }
  EXPECT_EQ(DbServer::get().rows("SELECT value, note FROM t ORDER BY value"),
            (std::vector<std::vector<std::string>>{{"/other", "<null>"}, {name, "saved again"}}));
}

TEST_F(Texts, StayOneStatementInATextOfSeveral) {
  for (const auto& text : random_texts(100)) {
    run(
        filled("INSERT INTO t(value) VALUES('@TAVO:VAR'); DELETE FROM t WHERE value like "
               "'@TAVO:LVAR';INSERT INTO t(value) VALUES('@TAVO:VAR')",
               text.c_str(), text.c_str(), text.c_str()));
    EXPECT_EQ(TAVODBAffectedRows(conn.get(), nullptr), 1);
  }
  EXPECT_EQ(column("SELECT value FROM t").size(), 100U);
}

}  // namespace
}  // namespace mediidx::test
