// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavoindex.h>

#include <string>

#include "extension_table.h"

namespace {

struct ExtensionCase {
  const char* name;
  const char* path;
  const char* extension;  ///< Null when there is none.
};

class AnExtension : public testing::TestWithParam<ExtensionCase> {};

TEST_P(AnExtension, StandsBehindTheLastDotOfTheName) {
  EXPECT_STREQ(TAVOIndexExtGet(GetParam().path), GetParam().extension);
}

INSTANTIATE_TEST_SUITE_P(Cases, AnExtension,
                         testing::Values(ExtensionCase{"File", "/v/a.mp3", "mp3"},
                                         ExtensionCase{"NoFolder", "a.mp3", "mp3"},
                                         ExtensionCase{"KeepsItsCase", "/v/a.Mp3", "Mp3"},
                                         ExtensionCase{"LastDotCounts", "/v/a.tar.gz", "gz"},
                                         ExtensionCase{"FolderHasTheDot", "/v.x/a", nullptr},
                                         ExtensionCase{"OnlyBeginsWithADot", "/v/.mp3", nullptr},
                                         ExtensionCase{"HiddenFile", "/v/.a.mp3", "mp3"},
                                         ExtensionCase{"EndsWithADot", "/v/a.", nullptr},
                                         ExtensionCase{"TrailingSlash", "/v/a.mp3/", nullptr},
                                         ExtensionCase{"NoDot", "/v/a", nullptr},
                                         ExtensionCase{"Empty", "", nullptr},
                                         ExtensionCase{"None", nullptr, nullptr}),
                         [](const auto& test) { return test.param.name; });

TEST(AnExtension, LiesWithinThePath) {
  const char* path = "/v/a.mp3";
  EXPECT_EQ(TAVOIndexExtGet(path), path + 5);
}

struct KindCase {
  const char* extension;
  char kind;  ///< m, p, v, l, or blank for none.
};

class AFile : public testing::TestWithParam<KindCase> {};

TEST_P(AFile, IsOfOneKindByItsExtension) {
  const auto [extension, kind] = GetParam();
  EXPECT_EQ(BlTAVOIndexIsMusic(extension), kind == 'm');
  EXPECT_EQ(BlTAVOIndexIsPhoto(extension), kind == 'p');
  EXPECT_EQ(BlTAVOIndexIsVideo(extension), kind == 'v');
  EXPECT_EQ(BlTAVOIndexIsPlaylist(extension), kind == 'l');
}

INSTANTIATE_TEST_SUITE_P(
    Cases, AFile,
    testing::Values(
        KindCase{"mp3", 'm'}, KindCase{"MP3", 'm'}, KindCase{"Flac", 'm'}, KindCase{"m4a", 'm'},
        KindCase{"ogg", 'm'}, KindCase{"opus", 'm'}, KindCase{"wav", 'm'}, KindCase{"wma", 'm'},
        KindCase{"ape", 'm'}, KindCase{"3ga", 'm'}, KindCase{"wv", 'm'}, KindCase{"jpg", 'p'},
        KindCase{"JPEG", 'p'}, KindCase{"heic", 'p'}, KindCase{"3fr", 'p'}, KindCase{"x3f", 'p'},
        KindCase{"nef", 'p'}, KindCase{"mp4", 'v'}, KindCase{"MKV", 'v'}, KindCase{"m2ts", 'v'},
        KindCase{"ts", 'v'}, KindCase{"3g2", 'v'}, KindCase{"xvid", 'v'}, KindCase{"wmv", 'v'},
        KindCase{"m3u", 'l'}, KindCase{"m3u8", 'l'}, KindCase{"pls", 'l'}, KindCase{"WPL", 'l'},
        KindCase{"Cue", 'l'}, KindCase{"", ' '}, KindCase{".mp3", ' '}, KindCase{"mp3 ", ' '},
        KindCase{"txt", ' '}, KindCase{"mp", ' '}, KindCase{"mp33", ' '}, KindCase{"mid", ' '},
        KindCase{"verylongextension", ' '}, KindCase{"mp\xB3", ' '}, KindCase{nullptr, ' '}));

TEST(TheKinds, ShareNoExtension) {
  using namespace mediidx::platform;
  for (const auto extension : kMusicExtensions) {
    EXPECT_FALSE(has_extension(kPhotoExtensions, extension)) << extension;
    EXPECT_FALSE(has_extension(kVideoExtensions, extension)) << extension;
    EXPECT_FALSE(has_extension(kPlaylistExtensions, extension)) << extension;
  }
  for (const auto extension : kVideoExtensions) {
    EXPECT_FALSE(has_extension(kPhotoExtensions, extension)) << extension;
    EXPECT_FALSE(has_extension(kPlaylistExtensions, extension)) << extension;
  }
}

TEST(TheKinds, FindEveryExtensionOfTheirs) {
  using namespace mediidx::platform;
  for (const auto extension : kMusicExtensions) EXPECT_TRUE(BlTAVOIndexIsMusic(extension.data()));
  for (const auto extension : kPhotoExtensions) EXPECT_TRUE(BlTAVOIndexIsPhoto(extension.data()));
  for (const auto extension : kVideoExtensions) EXPECT_TRUE(BlTAVOIndexIsVideo(extension.data()));
}

TEST(AMusicFile, IsOneByItsPath) {
  EXPECT_EQ(BlTAVOIndexIsMusicFile("/v/a.MP3"), 1);
  EXPECT_EQ(BlTAVOIndexIsMusicFile("/v/a.mp3/b"), 0);
  EXPECT_EQ(BlTAVOIndexIsMusicFile("/v/.mp3"), 0);
  EXPECT_EQ(BlTAVOIndexIsMusicFile("/v/a.mkv"), 0);
  EXPECT_EQ(BlTAVOIndexIsMusicFile(nullptr), 0);
}

}  // namespace
