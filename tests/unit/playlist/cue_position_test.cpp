// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/cue_position.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <limits>
#include <string>

namespace {

using mediidx::add_frames;
using mediidx::frames_from_position;
using mediidx::position_from_frames;
using mediidx::subtract_frames;

struct PositionCase {
  const char* name;
  std::string text;
  int frames;
};
void PrintTo(const PositionCase& test, std::ostream* out) { *out << test.text; }

class CuePosition : public testing::TestWithParam<PositionCase> {};

TEST_P(CuePosition, IsReadAsFrames) {
  EXPECT_EQ(frames_from_position(GetParam().text), GetParam().frames);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, CuePosition,
    testing::Values(PositionCase{"Zero", "00:00:00", 0},
                    PositionCase{"TwoSeconds", "00:02:00", 150},
                    PositionCase{"All", "01:02:03", 4500 + 150 + 3},
                    PositionCase{"ManyMinutes", "100:00:00", 450000},
                    PositionCase{"MoreThanSixtySeconds", "00:75:80", 75 * 75 + 80},
                    PositionCase{"BlanksAndSigns", " 1: +2:-3", 4500 + 150 - 3},
                    PositionCase{"TrailingText", "1x:2y:3z", 4500 + 150 + 3},
                    PositionCase{"EmptyParts", "::", 0},
                    PositionCase{"MiddleOfFourParts", "1:2:9:3", 4500 + 150 + 3},
                    PositionCase{"OneColonCountsSecondsTwice", "01:02", 4500 + 150 + 2},
                    PositionCase{"NoColonCountsInEveryPart", "7", 7 * 4576},
                    PositionCase{"Empty", "", 0}, PositionCase{"Words", "a:b:c", 0}),
    [](const auto& test) { return test.param.name; });

TEST(LeadingNumber, IsThatOfStrtol) {
  for (const std::string text : {"",
                                 " ",
                                 "7",
                                 "007",
                                 "-7",
                                 "+7",
                                 "+-7",
                                 "-+7",
                                 "--7",
                                 "++7",
                                 "+",
                                 "-",
                                 " \t\n\v\f\r7",
                                 "7x",
                                 "x7",
                                 "- 7",
                                 "+ 7",
                                 "0x10",
                                 "9223372036854775807",
                                 "9223372036854775808",
                                 "-9223372036854775808",
                                 "-9223372036854775809",
                                 "+9223372036854775808"}) {
    EXPECT_EQ(mediidx::leading_number(text), std::strtol(text.c_str(), nullptr, 10)) << text;
  }
}

TEST(CuePosition, OfHugeNumbersWraps) {
  EXPECT_EQ(frames_from_position("99999999999999999999:0:0"),
            static_cast<int>(static_cast<unsigned>(-1) * 4500U));
}

TEST(FramesAsAPosition, HaveTwoDigitsAtLeast) {
  EXPECT_EQ(position_from_frames(0), "00:00:00");
  EXPECT_EQ(position_from_frames(4501), "01:00:01");
  EXPECT_EQ(position_from_frames(450000), "100:00:00");
  EXPECT_EQ(position_from_frames(-1), "00:00:-1");
  EXPECT_EQ(position_from_frames(-4501), "-1:00:-1");
}

TEST(FramesAsAPosition, AreReadBackUnchanged) {
  for (const int frames : {0, 1, 74, 75, 4499, 4500, 4501, 450000, -1, -75, -4500, -4501,
                           std::numeric_limits<int>::max(), std::numeric_limits<int>::min()}) {
    EXPECT_EQ(frames_from_position(position_from_frames(frames)), frames);
  }
}

TEST(Frames, AddAndSubtractWrapping) {
  constexpr int kMax = std::numeric_limits<int>::max();
  constexpr int kMin = std::numeric_limits<int>::min();
  EXPECT_EQ(add_frames(2, 3), 5);
  EXPECT_EQ(subtract_frames(2, 3), -1);
  EXPECT_EQ(add_frames(kMax, 1), kMin);
  EXPECT_EQ(subtract_frames(kMin, 1), kMax);
}

}  // namespace
