// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <stdexcept>

#include "index_folder_test.h"

namespace mediidx::test {
namespace {

struct PartsCase {
  const char* name;
  const char* path;
  const char* share;
  const char* volume;
  const char* folder;
};

class PathParts : public testing::TestWithParam<PartsCase> {};

TEST_P(PathParts, AreCutAtTheFirstSeparator) {
  const auto& expected = GetParam();
  EXPECT_EQ(getShareName(expected.path), expected.share);
  EXPECT_EQ(getVolumePath(expected.path), expected.volume);
  EXPECT_EQ(getFolderPath(expected.path), expected.folder);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, PathParts,
    testing::Values(PartsCase{"ShareAlone", "/photo", "photo", "/photo", ""},
                    PartsCase{"FolderInShare", "/photo/2010", "photo", "/photo", "2010"},
                    PartsCase{"DeepFolder", "/photo/2010/a", "photo", "/photo", "2010/a"},
                    PartsCase{"Volume", "/volume1/photo/a", "volume1", "/volume1", "photo/a"},
                    PartsCase{"TrailingSlash", "/photo/", "photo", "/photo", ""},
                    PartsCase{"TwoSlashes", "//photo", "", "/", "photo"},
                    PartsCase{"SlashAlone", "/", "", "/", ""},
                    PartsCase{"NoLeadingSlash", "photo/a", "hoto", "photo", "a"}),
    [](const auto& test) { return test.param.name; });

TEST(ShareName, OfAnEmptyPathIsOutOfRange) { EXPECT_THROW(getShareName(""), std::out_of_range); }

TEST(VolumePath, OfAnEmptyPathIsEmpty) { EXPECT_EQ(getVolumePath(""), ""); }

TEST(FolderPath, OfAnEmptyPathIsEmpty) { EXPECT_EQ(getFolderPath(""), ""); }

struct JoinCase {
  const char* name;
  const char* first;
  const char* second;
  const char* joined;
};

class AppendedPath : public testing::TestWithParam<JoinCase> {};

TEST_P(AppendedPath, HasOneSlashAtTheSeam) {
  EXPECT_EQ(appendPath(GetParam().first, GetParam().second), GetParam().joined);
}

INSTANTIATE_TEST_SUITE_P(Cases, AppendedPath,
                         testing::Values(JoinCase{"NoSlash", "/a", "b", "/a/b"},
                                         JoinCase{"SlashInFront", "/a/", "b", "/a/b"},
                                         JoinCase{"SlashBehind", "/a", "/b", "/a/b"},
                                         JoinCase{"BothSlashesGiveThree", "/a/", "/b", "/a///b"},
                                         JoinCase{"NothingToAppend", "/a", "", "/a"},
                                         JoinCase{"NothingToAppendBehindASlash", "/a/", "", "/a/"},
                                         JoinCase{"NothingInFront", "", "b", "/b"},
                                         JoinCase{"NothingInFrontOfASlash", "", "/b", "/b"}),
                         [](const auto& test) { return test.param.name; });

struct BelowCase {
  const char* name;
  const char* path;
  const char* parent;
  bool holds;
};

class EqualOrSubPath : public testing::TestWithParam<BelowCase> {};

TEST_P(EqualOrSubPath, EndsAtASeparator) {
  EXPECT_EQ(IsEqualOrSubPath(GetParam().path, GetParam().parent), GetParam().holds);
}

INSTANTIATE_TEST_SUITE_P(Cases, EqualOrSubPath,
                         testing::Values(BelowCase{"LongerName", "/a/bc", "/a/b", false},
                                         BelowCase{"Below", "/a/b/c", "/a/b", true},
                                         BelowCase{"Equal", "/a/b", "/a/b", true},
                                         BelowCase{"Shorter", "/a", "/a/b", false},
                                         BelowCase{"OtherCase", "/A/b", "/a", false},
                                         BelowCase{"ParentWithSlash", "/a/b", "/a/", false},
                                         BelowCase{"EmptyParent", "/a", "", true},
                                         BelowCase{"BothEmpty", "", "", true}),
                         [](const auto& test) { return test.param.name; });

}  // namespace
}  // namespace mediidx::test
