// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/musepack_gain.h"

#include <gtest/gtest.h>

#include <string>

namespace mediidx::tool {
namespace {

using namespace std::string_literals;

const std::string kHeader = "SH\x05xx"s;
const std::string kGain = "RG\x0C\x01\x3A\x8F\x45\x3E\xFF\xFE\x80\x00"s;

TEST(MusepackGainPacket, IsFoundBehindOthers) {
  const auto gain = parse_musepack_gain("MPCK" + kHeader + kGain + "AP");
  ASSERT_TRUE(gain);
  EXPECT_EQ(gain->track_gain, 0x3A8F);
  EXPECT_EQ(gain->track_peak, 0x453E);
  EXPECT_EQ(gain->album_gain, -2);
  EXPECT_EQ(gain->album_peak, 0x8000);
}

TEST(MusepackGainPacket, MayHaveALongerSize) {
  EXPECT_TRUE(parse_musepack_gain("MPCKSH\x81\x00"s + std::string(124, 'x') + kGain));
}

TEST(MusepackGainPacket, IsNoneWhereNothingStands) {
  EXPECT_FALSE(parse_musepack_gain(""));
  EXPECT_FALSE(parse_musepack_gain("MPCK"));
  EXPECT_FALSE(parse_musepack_gain("MP+" + kGain));
  EXPECT_FALSE(parse_musepack_gain("MPCK" + kHeader));
  EXPECT_FALSE(parse_musepack_gain("MPCK" + kGain.substr(0, 11)));
  EXPECT_FALSE(parse_musepack_gain("MPCKRG\x04\x01"s));
}

TEST(MusepackGainPacket, StandsSizesThatCannotBe) {
  EXPECT_FALSE(parse_musepack_gain("MPCKSH\x00"s + kGain));
  EXPECT_FALSE(parse_musepack_gain("MPCKSH\x02"s + kGain));
  EXPECT_FALSE(parse_musepack_gain("MPCKSH\x7F"s + kGain));
  EXPECT_FALSE(parse_musepack_gain("MPCKSH" + std::string(20, '\xFF') + kGain));
}

}  // namespace
}  // namespace mediidx::tool
