// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/replay_gain.h"

#include <gtest/gtest.h>

#include "tags/tag_table.h"

namespace mediidx::tool {
namespace {

TEST(ReplayGainText, IsReadWithAndWithoutItsUnit) {
  EXPECT_EQ(parse_gain("-6.25 dB"), -6.25);
  EXPECT_EQ(parse_gain("+1.5 dB"), 1.5);
  EXPECT_EQ(parse_gain("3"), 3);
  EXPECT_EQ(parse_peak("0.5"), 0.5);
}

TEST(ReplayGainText, ThatIsNoGainIsNone) {
  EXPECT_EQ(parse_gain(""), std::nullopt);
  EXPECT_EQ(parse_gain("loud"), std::nullopt);
  EXPECT_EQ(parse_gain("nan"), std::nullopt);
  EXPECT_EQ(parse_gain("-inf dB"), std::nullopt);
  EXPECT_EQ(parse_gain("1e300"), std::nullopt);
  EXPECT_EQ(parse_peak("-0.5"), std::nullopt);
}

TEST(OpusGain, IsIn256thsAndFiveDecibelsQuieter) {
  EXPECT_EQ(parse_r128_gain("0"), 5);
  EXPECT_EQ(parse_r128_gain("-1280"), 0);
  EXPECT_EQ(parse_r128_gain("-640"), 2.5);
  EXPECT_EQ(parse_r128_gain("32769"), std::nullopt);
}

TEST(ReplayGain, IsTakenFromItsOwnTagsFirst) {
  NamedTags tags{TagFamily::kVorbis, {}};
  tags.add("REPLAYGAIN_TRACK_GAIN", "-2 dB");
  tags.add("R128_TRACK_GAIN", "0");
  tags.add("R128_ALBUM_GAIN", "-1280");
  tags.add("REPLAYGAIN_TRACK_PEAK", "0.5");
  MediaFile file;
  store_tags({tags}, file);
  EXPECT_EQ(file.gain.track_gain, -2);
  EXPECT_EQ(file.gain.track_peak, 0.5);
  EXPECT_EQ(file.gain.album_gain, 0);
  EXPECT_EQ(file.gain.album_peak, std::nullopt);
}

TEST(ReplayGain, ThatCannotBeReadLeavesTheOtherTag) {
  NamedTags tags{TagFamily::kVorbis, {}};
  tags.add("replaygain_track_gain", "?");
  tags.add("r128_track_gain", "0");
  MediaFile file;
  store_tags({tags}, file);
  EXPECT_EQ(file.gain.track_gain, 5);
}

}  // namespace
}  // namespace mediidx::tool
