// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/entry_path.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using mediidx::begins_with_http;
using mediidx::join_entry;
using mediidx::resolve_entry;

const std::optional<std::string> kLink = "/volume1/music";
constexpr const char* kPlaylist = "/vol/share/lists/x.m3u";

struct PathCase {
  const char* name;
  std::string entry;
  std::string path;
};
void PrintTo(const PathCase& test, std::ostream* out) { *out << test.entry; }

class Entry : public testing::TestWithParam<PathCase> {};

TEST_P(Entry, ResolvesToAnAbsolutePath) {
  EXPECT_EQ(resolve_entry(GetParam().entry, kPlaylist, kLink), GetParam().path);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, Entry,
    testing::Values(
        PathCase{"Relative", "a.mp3", "/vol/share/lists/a.mp3"},
        PathCase{"RelativeBelow", "b/c/a.mp3", "/vol/share/lists/b/c/a.mp3"},
        PathCase{"RelativeWithBackslashes", "b\\c\\a.mp3", "/vol/share/lists/b/c/a.mp3"},
        PathCase{"DotSlash", "./a.mp3", "/vol/share/lists/a.mp3"},
        PathCase{"DotBackslash", ".\\a.mp3", "/vol/share/lists/a.mp3"},
        PathCase{"OnlyOneDotSlashIsDropped", "././a.mp3", "/vol/share/lists/./a.mp3"},
        PathCase{"Parent", "../a.mp3", "/vol/share/a.mp3"},
        PathCase{"ParentsWithBackslashes", "..\\..\\Music\\a.mp3", "/vol/Music/a.mp3"},
        PathCase{"ParentsOfBothKinds", "../..\\a.mp3", "/vol/a.mp3"},
        PathCase{"DotThenParents", "./../a.mp3", "/vol/share/a.mp3"},
        PathCase{"ParentsPastTheRootStayThere", "../../../../../a.mp3", "/a.mp3"},
        PathCase{"ParentInTheMiddleStays", "b/../a.mp3", "/vol/share/lists/b/../a.mp3"},
        PathCase{"NameOfTwoDotsOnly", "..a.mp3", "/vol/share/lists/..a.mp3"},
        PathCase{"OtherAbsolutePathIsRelative", "/x/a.mp3", "/vol/share/lists//x/a.mp3"},
        PathCase{"BelowTheMusicLink", "/volume1/music/a.mp3", "/volume1/music/a.mp3"},
        PathCase{"BeginningLikeTheMusicLink", "/volume1/musical/a.mp3", "/volume1/musical/a.mp3"},
        PathCase{"UsbVolume", "/volumeUSB1/usbshare/a.mp3", "/volumeUSB1/usbshare/a.mp3"},
        PathCase{"SataVolume", "/volumeSATA/s/a.mp3", "/volumeSATA/s/a.mp3"},
        PathCase{"UsbVolumeWithBackslashes", "/volumeUSB1\\a.mp3", "/volumeUSB1/a.mp3"},
        PathCase{"Stream", "http://radio/a", "http://radio/a"},
        PathCase{"StreamInCapitals", "HTTP://radio/a", "HTTP://radio/a"},
        PathCase{"SecureStreamIsRelative", "https://radio/a", "/vol/share/lists/https://radio/a"},
        PathCase{"NetworkPath", "\\\\nas\\music\\b\\a.mp3", "/volume1/music/b/a.mp3"},
        PathCase{"NetworkPathOfAnotherShare", "\\\\nas\\photo\\a.mp3", "/volume1/music/a.mp3"},
        PathCase{"DriveLetter", "C:\\Music\\a.mp3", "/volume1/music/Music/a.mp3"},
        PathCase{"AnyLetterBeforeTheColon", "?:\\a.mp3", "/volume1/music/a.mp3"},
        PathCase{"DriveLetterWithASlash", "C:/a.mp3", "/vol/share/lists/C:/a.mp3"},
        PathCase{"DriveAlone", "C:\\", "/volume1/music/"},
        PathCase{"OneBackslash", "\\a.mp3", "/vol/share/lists//a.mp3"}),
    [](const auto& test) { return test.param.name; });

class UnresolvableEntry : public testing::TestWithParam<PathCase> {};

TEST_P(UnresolvableEntry, Fails) {
  EXPECT_FALSE(resolve_entry(GetParam().entry, kPlaylist, kLink)) << GetParam().entry;
}

INSTANTIATE_TEST_SUITE_P(Cases, UnresolvableEntry,
                         testing::Values(PathCase{"NoServer", "\\\\", ""},
                                         PathCase{"EmptyServer", "\\\\\\share\\a.mp3", ""},
                                         PathCase{"NoShare", "\\\\nas", ""},
                                         PathCase{"EmptyShare", "\\\\nas\\\\a.mp3", ""},
                                         PathCase{"NothingBelowTheShare", "\\\\nas\\music", ""},
                                         PathCase{"EmptyRest", "\\\\nas\\music\\", ""},
                                         PathCase{"TooLong", std::string(4096, 'a'), ""}),
                         [](const auto& test) { return test.param.name; });

TEST(EntryWithoutAMusicLink, FailsWhenItNeedsTheLink) {
  EXPECT_FALSE(resolve_entry("\\\\nas\\music\\a.mp3", kPlaylist, std::nullopt));
  EXPECT_FALSE(resolve_entry("C:\\a.mp3", kPlaylist, std::nullopt));
}

TEST(EntryWithoutAMusicLink, IsRelativeWhenItIsAbsolute) {
  EXPECT_EQ(resolve_entry("/volume1/music/a.mp3", kPlaylist, std::nullopt),
            "/vol/share/lists//volume1/music/a.mp3");
}

TEST(EntryPath, MayTakeEveryByteOfAPathButTheTerminator) {
  const std::string folder = "/" + std::string(94, 'f');
  const auto longest = resolve_entry(std::string(3999, 'a'), folder + "/x.m3u", kLink);
  ASSERT_TRUE(longest);
  EXPECT_EQ(longest->size(), 4095U);
  EXPECT_FALSE(resolve_entry(std::string(4000, 'a'), folder + "/x.m3u", kLink));
}

TEST(EntryPath, OfAPlaylistInTheRootIsInTheRoot) {
  EXPECT_EQ(resolve_entry("a.mp3", "/x.m3u", kLink), "/a.mp3");
  EXPECT_EQ(resolve_entry("../a.mp3", "/x.m3u", kLink), "/a.mp3");
}

TEST(HttpEntry, IsToldWithoutRegardToCase) {
  EXPECT_TRUE(begins_with_http("http://x"));
  EXPECT_TRUE(begins_with_http("HttpS://x"));
  EXPECT_FALSE(begins_with_http("/music/http"));
  EXPECT_FALSE(begins_with_http("htt"));
}

struct JoinCase {
  const char* name;
  const char* entry;
  const char* playlist;
  const char* path;
};

class SimpleResolution : public testing::TestWithParam<JoinCase> {};

TEST_P(SimpleResolution, JoinsFolderAndEntry) {
  EXPECT_EQ(join_entry(GetParam().entry, GetParam().playlist), GetParam().path);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, SimpleResolution,
    testing::Values(JoinCase{"Plain", "a.mp3", "/v/s/x.m3u", "/v/s/a.mp3"},
                    JoinCase{"Parent", "../a.mp3", "/v/s/x.m3u", "/v/a.mp3"},
                    JoinCase{"TwoParents", "../../a.mp3", "/v/s/x.m3u", "/a.mp3"},
                    JoinCase{"PastTheRoot", "../../../../a.mp3", "/v/s/x.m3u", "/a.mp3"},
                    JoinCase{"TextBeforeTheParentIsDropped", "b/../a.mp3", "/v/s/x.m3u",
                             "/v/a.mp3"},
                    JoinCase{"LaterParentsStay", "../b/../a.mp3", "/v/s/x.m3u", "/v/b/../a.mp3"},
                    JoinCase{"PlaylistWithoutAFolder", "a.mp3", "x.m3u", "x.m3u/a.mp3"}),
    [](const auto& test) { return test.param.name; });

}  // namespace
