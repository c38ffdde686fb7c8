// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "verb_test.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;

class Search : public VerbTest {
 protected:
  std::vector<std::string> titles(const std::string& text) {
    return column(json({"search", "--", text}), "title");
  }
};

TEST_F(Search, FindsASongByEachOfItsNames) {
  save({.path = at("a.mp3"),
        .title = "Boarding",
        .artist = "Ada Brandt",
        .album = "Night Ferry",
        .composer = "Bo Lindqvist",
        .genre = "Folk;Sea Shanty"});
  save({.path = at("b.mp3"), .title = "Other"});
  struct Case {
    const char* text;
    const char* found_in;
  };
  for (const auto& [text, found_in] :
       {Case{"oard", "title"}, Case{"t ferr", "album"}, Case{"BRANDT", "artist"},
        Case{"lindQ", "composer"}, Case{"shanty", "genre"}, Case{"folk", "genre"},
        Case{"ar", "title"}, Case{"b", "title, artist, composer"}}) {
    const auto found = json({"search", text});
    ASSERT_EQ(found.size(), 1U) << text;
    EXPECT_EQ(found[0]["path"], at("a.mp3")) << text;
    EXPECT_EQ(found[0]["found_in"], found_in) << text;
  }
}

TEST_F(Search, FoldsTheLettersOfAsciiOnly) {
  save({.path = at("a.mp3"), .title = "Ärger im Hafen"});
  EXPECT_THAT(titles("Ärger IM hafen"), ElementsAre("Ärger im Hafen"));
  EXPECT_THAT(titles("ärger"), IsEmpty());
}

TEST_F(Search, TakesWhatIsSpecialInPatternsAsItself) {
  int number = 0;
  for (const char* title : {"100% pure", "100 pure", "snake_case", "snakeXcase", "Ferry's",
                            "Ferrys", R"(back\slash)", "backslash", "\"quoted\"", "x' OR '1'='1"}) {
    save({.path = at(std::to_string(++number) + ".mp3"), .title = title});
  }
  EXPECT_THAT(titles("100%"), ElementsAre("100% pure"));
  EXPECT_THAT(titles("%"), ElementsAre("100% pure"));
  EXPECT_THAT(titles("e_c"), ElementsAre("snake_case"));
  EXPECT_THAT(titles("_"), ElementsAre("snake_case"));
  EXPECT_THAT(titles("y's"), ElementsAre("Ferry's"));
  EXPECT_THAT(titles(R"(\)"), ElementsAre(R"(back\slash)"));
  EXPECT_THAT(titles(R"(k\s)"), ElementsAre(R"(back\slash)"));
  EXPECT_THAT(titles("\""), ElementsAre("\"quoted\""));
  EXPECT_THAT(titles("' OR '1'='1"), ElementsAre("x' OR '1'='1"));
  EXPECT_THAT(titles("'; DELETE FROM track; --"), IsEmpty());
  EXPECT_EQ(count("track"), number);
}

TEST_F(Search, PrintsLinesOfFieldsWithoutATerminal) {
  save({.path = at("a.mp3"), .title = "Two\tTabs", .artist = "Ada", .duration = 65});
  EXPECT_EQ(output({"search", "tabs"}),
            "title\tTwo\\tTabs\tAda\t\t\t\t1:05\t" + at("a.mp3") + "\n");
}

TEST_F(Search, PrintsATableThatFitsTheTerminal) {
  save({.path = at(std::string(200, 'p') + ".mp3"), .title = std::string(200, 't')});
  Setting setting;
  setting.on_terminal = true;
  const auto done = run({"search", "TT"}, setting);
  EXPECT_EQ(done.status, 0);
  const auto shown = lines(done.out);
  ASSERT_EQ(shown.size(), 2U) << done.out;
  EXPECT_THAT(shown[0], testing::StartsWith("Found in"));
  // "…" is one column of three bytes; a line ends with "\r" there.
  EXPECT_LE(shown[1].size(), 80U + 2 * 2 + 1);
}

TEST_F(Search, OfSomethingThatIsNotThereIsEmptyAndNoFailure) {
  EXPECT_EQ(output({"search", "nothing"}), "");
  EXPECT_EQ(output({"search", "nothing", "--json"}), "[]\n");
}

TEST_F(Search, RefusesATextThatNoKeyCanHold) {
  for (const auto& words :
       {Words{"search"}, Words{"search", ""}, Words{"search", "\xE9"}, Words{"search", "a", "b"}}) {
    const auto done = run(words);
    EXPECT_EQ(done.status, 2);
    EXPECT_EQ(done.out, "");
    EXPECT_NE(done.err, "");
  }
}

}  // namespace
}  // namespace mediidx::test
