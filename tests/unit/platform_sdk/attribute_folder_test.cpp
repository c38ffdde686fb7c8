// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavosdk.h>

#include <array>
#include <string>

namespace {

struct FolderCase {
  const char* name;
  const char* path;
  const char* folder;  ///< Null for a failure.
};

class TheAttributeFolder : public testing::TestWithParam<FolderCase> {};

TEST_P(TheAttributeFolder, StandsBesideTheFile) {
  std::array<char, 64> buffer{"untouched"};
  const int result = TAVOEADirPath(0, GetParam().path, buffer.data(), 64);
  EXPECT_EQ(result, GetParam().folder ? 0 : -1);
  EXPECT_STREQ(buffer.data(), GetParam().folder ? GetParam().folder : "untouched");
}

INSTANTIATE_TEST_SUITE_P(
    Cases, TheAttributeFolder,
    testing::Values(FolderCase{"File", "/v/music/a.mp3", "/v/music/@eaDir/a.mp3"},
                    FolderCase{"InTheRoot", "/a.mp3", "/@eaDir/a.mp3"},
                    FolderCase{"Relative", "a.mp3", "@eaDir/a.mp3"},
                    FolderCase{"VirtualTrack", "/v/a b.flac_12", "/v/@eaDir/a b.flac_12"},
                    FolderCase{"DoubleSlash", "/v//a", "/v//@eaDir/a"},
                    FolderCase{"TrailingSlash", "/v/music/", nullptr},
                    FolderCase{"Dot", "/v/.", nullptr}, FolderCase{"DotDot", "/v/..", nullptr},
                    FolderCase{"ThreeDots", "/v/...", "/v/@eaDir/..."},
                    FolderCase{"Root", "/", nullptr}, FolderCase{"Empty", "", nullptr},
                    FolderCase{"None", nullptr, nullptr}),
    [](const auto& test) { return test.param.name; });

TEST(TheAttributeFoldersBuffer, HasToBeLargeEnough) {
  std::array<char, 12> buffer{};
  EXPECT_EQ(TAVOEADirPath(0, "/a/b", buffer.data(), 12), 0);
  EXPECT_STREQ(buffer.data(), "/a/@eaDir/b");
  EXPECT_EQ(TAVOEADirPath(0, "/a/b", buffer.data(), 11), -1);
  EXPECT_EQ(TAVOEADirPath(0, "/a/b", buffer.data(), 0), -1);
  EXPECT_EQ(TAVOEADirPath(0, "/a/b", nullptr, 12), -1);
}

}  // namespace
