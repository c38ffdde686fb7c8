// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "text/table.h"

#include <gtest/gtest.h>

#include <clocale>

namespace mediidx::tool {
namespace {

const std::vector<Column> kColumns{
    {"Title", false, false}, {"No.", true, false}, {"Path", false, true}};

class Table : public testing::Test {
 protected:
  Table() { std::setlocale(LC_CTYPE, "C.UTF-8"); }
};

TEST_F(Table, AlignsTextLeftAndNumbersRight) {
  EXPECT_EQ(format_table(kColumns, {{"Weir", "2", "/m/weir.ogg"}, {"夜", "10", "/m/y.ogg"}}, 80),
            "Title  No.  Path\n"
            "Weir     2  /m/weir.ogg\n"
            "夜      10  /m/y.ogg\n");
}

TEST_F(Table, CutsTheWidestColumnsToTheTerminal) {
  EXPECT_EQ(format_table(kColumns, {{"A title", "2", "/music/albums/song.mp3"}}, 30),
            "Title    No.  Path\n"
            "A title    2  …albums/song.mp3\n");
}

TEST_F(Table, HasNoLineWiderThanTheTerminal) {
  const std::vector<TableRow> rows{{std::string(300, 't'), "123456", std::string(300, 'p')}};
  for (const int width : {30, 80, 200}) {
    const auto text = format_table(kColumns, rows, width);
    const auto line = text.substr(text.find('\n') + 1);
    EXPECT_EQ(line.substr(line.find("123456"), 6), "123456");
    // Two ellipses of three bytes and one column each.
    EXPECT_EQ(line.size() - 1 - 4, static_cast<std::size_t>(width));
  }
}

TEST_F(Table, EscapesControlCharacters) {
  EXPECT_EQ(format_table({{"Title", false, false}}, {{"a\x1B[2Jb\nc"}}, 80),
            "Title\na\\x1B[2Jb\\nc\n");
}

TEST_F(Table, WithoutRowsHasItsTitles) {
  EXPECT_EQ(format_table(kColumns, {}, 80), "Title  No.  Path\n");
}

TEST(Lines, AreSeparatedByTabsAlone) {
  EXPECT_EQ(format_lines({{"a\tb", "", "/x\ny"}, {"c", "1", "d"}}), "a\\tb\t\t/x\\ny\nc\t1\td\n");
}

}  // namespace
}  // namespace mediidx::tool
