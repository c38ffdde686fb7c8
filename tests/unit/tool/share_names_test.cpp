// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/share_names.h"

#include <gtest/gtest.h>

namespace mediidx::tool {
namespace {

TEST(AFolder, GoesUnderTheDeepestShareThatHoldsIt) {
  const Shares shares{{"all", "/srv"}, {"music", "/srv/music"}};
  EXPECT_EQ(path_in_share(shares, "/srv/music/jazz"), "/music/jazz");
  EXPECT_EQ(path_in_share(shares, "/srv/music"), "/music");
  EXPECT_EQ(path_in_share(shares, "/srv/musical"), "/all/musical");
  EXPECT_EQ(path_in_share(shares, "/home/music"), std::nullopt);
}

TEST(AShare, IsNamedAfterItsFolder) { EXPECT_EQ(name_for_share({}, "/home/a/Music"), "Music"); }

TEST(AShare, OfAnEqualBaseNameGetsANumber) {
  Shares shares{{"music", "/a/music"}};
  EXPECT_EQ(name_for_share(shares, "/b/music"), "music-2");
  shares["music-2"] = "/b/music";
  EXPECT_EQ(name_for_share(shares, "/c/music"), "music-3");
}

TEST(AShare, IsToldApartWithoutRegardToCase) {
  const Shares shares{{"ÉTÉ", "/a/ÉTÉ"}, {"Music", "/a/Music"}};
  EXPECT_EQ(name_for_share(shares, "/b/music"), "music-2");
  EXPECT_EQ(name_for_share(shares, "/b/été"), "été-2");
}

TEST(AShare, OfALongBaseNameIsCutAtACharacter) {
  std::string base;
  for (int i = 0; i < 85; ++i) base += "海";
  const auto first = name_for_share({}, "/a/" + base);
  EXPECT_EQ(first, base);
  const auto second = name_for_share({{first, "/a/" + base}}, "/b/" + base);
  EXPECT_EQ(second, base.substr(0, 84 * 3) + "-2");
}

}  // namespace
}  // namespace mediidx::tool
