// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/progress.h"

#include <gtest/gtest.h>

#include <clocale>

#include "text/utf8.h"

namespace mediidx::tool {
namespace {

ProgressState state(std::size_t done, std::size_t total, double seconds = 0) {
  return {done, total, seconds};
}

TEST(ProgressLine, ShowsBarShareCountRateTimeAndName) {
  std::setlocale(LC_CTYPE, "C.UTF-8");
  EXPECT_EQ(progress_line(state(50, 100, 10), "a.mp3", 80),
            "[############            ]  50%  50/100  5.0/s  0:10 left  a.mp3");
  EXPECT_EQ(progress_line(state(1000, 10000, 2), "z", 80),
            "[##                      ]  10%  1000/10000  500/s  0:18 left  z");
}

TEST(ProgressLine, SaysThatItDoesNotKnow) {
  EXPECT_EQ(progress_line(state(0, 10), "a", 80),
            "[                        ]   0%  0/10  ?/s  ? left  a");
  EXPECT_EQ(progress_line(state(20, 100, 0.5), "a", 80),
            "[####                    ]  20%  20/100  ?/s  ? left  a");
}

TEST(ProgressLine, OfNothingIsDone) {
  EXPECT_EQ(progress_line(state(0, 0), "", 80),
            "[########################] 100%  0/0  ?/s  ? left  ");
}

TEST(ProgressLine, FitsItsWidthAndHasNoControlCharacters) {
  std::setlocale(LC_CTYPE, "C.UTF-8");
  const auto line = progress_line(state(1, 3), "夜\n" + std::string(100, 'x'), 70);
  EXPECT_EQ(display_width(line), 70);
  EXPECT_NE(line.find("夜\\n"), std::string::npos);
}

TEST(ProgressWords, CountHoursToo) {
  EXPECT_EQ(progress_words(state(100, 100'100, 10)), "100 of 100100 files, 10/s, 2:46:40 left");
  EXPECT_EQ(progress_words(state(5, 7)), "5 of 7 files, ?/s, ? left");
}

TEST(ProgressJson, HasNullForWhatIsNotKnown) {
  EXPECT_EQ(progress_json(state(3, 0), "/a \"b\""),
            R"({"done":3,"path":"/a \"b\"","rate":null,"remaining":null,"total":null})");
  EXPECT_EQ(progress_json(state(10, 20, 5), "/a"),
            R"({"done":10,"path":"/a","rate":2.0,"remaining":5.0,"total":20})");
}

}  // namespace
}  // namespace mediidx::tool
