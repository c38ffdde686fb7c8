// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/progress.h"

#include <gtest/gtest.h>

#include <clocale>

#include "text/utf8.h"

namespace mediidx::tool {
namespace {

TEST(ProgressLine, ShowsBarShareCountAndName) {
  std::setlocale(LC_CTYPE, "C.UTF-8");
  EXPECT_EQ(progress_line(5, 10, "a.mp3", 80), "[############            ]  50%  5/10  a.mp3");
  EXPECT_EQ(progress_line(10, 10, "z", 80), "[########################] 100%  10/10  z");
}

TEST(ProgressLine, OfNothingIsDone) {
  EXPECT_EQ(progress_line(0, 0, "", 80), "[########################] 100%  0/0  ");
}

TEST(ProgressLine, FitsItsWidthAndHasNoControlCharacters) {
  std::setlocale(LC_CTYPE, "C.UTF-8");
  const auto line = progress_line(1, 3, "夜\n" + std::string(100, 'x'), 60);
  EXPECT_EQ(display_width(line), 60);
  EXPECT_NE(line.find("夜\\n"), std::string::npos);
}

}  // namespace
}  // namespace mediidx::tool
