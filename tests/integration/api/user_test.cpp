// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

#include <array>
#include <memory>
#include <string>

#include "request_test.h"

namespace mediidx::test {
namespace {

class Users : public HelperTest {};

TEST_F(Users, AreFoundByName) {
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromName("ann"), 1026U);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(Users, WithoutANameAreNobody) {
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromName(nullptr), 0U);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Bad Parameters."));
  EXPECT_EQ(logged()[0].priority, 3);
}

TEST_F(Users, ThatAreUnknownSetThePlatformsError) {
  TLIBCErrSetEx(0, "", 0);
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromName("nobody here"), 0U);
  EXPECT_EQ(TLIBCErrGet(), 7424);
  EXPECT_STREQ(TLIBCErrorGetFile(), "mediidx");
  EXPECT_GT(TLIBCErrorGetLine(), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(Users, AreFoundByAPathInTheirHome) {
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromPath(root.at("homes/ann/x/a.mp3").c_str()), 1026U);
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromPath(root.at("homes/ann").c_str()), 1026U);
}

TEST_F(Users, AreNobodyOutsideOfEveryHome) {
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromPath(root.at("homes/anna/a.mp3").c_str()), 0U);
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromPath(root.at("volume1/a.mp3").c_str()), 0U);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(Users, WhoWereDeletedAreNobody) {
  platform_answers().home_user = "deleted";
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromPath("/homes/deleted/a.mp3"), 0U);
}

TEST_F(Users, AreNobodyWhenHomesCannotBeChecked) {
  platform_answers().home_check_fails = true;
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromPath("/a%s"), 0U);
  EXPECT_EQ(TAVOMediaIndexGetUserIdFromPath(nullptr), 0U);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N TAVOServiceHomePathCheck(/a%s) fail",
                                       "mediidx:N TAVOServiceHomePathCheck((null)) fail"));
}

struct LibraryCase {
  const char* name;
  const char* home;
  const char* path;
  int expected;
};

class PersonalLibrary : public testing::TestWithParam<LibraryCase> {};

TEST_P(PersonalLibrary, IsTheMusicFolderOfAHome) {
  EXPECT_EQ(TAVOMediaIndexIsUnderPersonalLibPath(GetParam().home, GetParam().path),
            GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, PersonalLibrary,
    testing::Values(LibraryCase{"TheFolder", "/home/u/", "/home/u/Music", 1},
                    LibraryCase{"BelowIt", "/home/u/", "/home/u/MUSIC/x.mp3", 1},
                    LibraryCase{"DeepBelowIt", "/home/u/", "/home/u/music/a/b.mp3", 1},
                    LibraryCase{"TrailingSlash", "/home/u/", "/home/u/music/", 1},
                    LibraryCase{"LongerWord", "/home/u/", "/home/u/musicx", 0},
                    LibraryCase{"Musical", "/home/u/", "/home/u/musical/x.mp3", 0},
                    LibraryCase{"DeeperMusic", "/home/u/", "/home/u/other/music", 0},
                    LibraryCase{"HomeInOtherCase", "/home/u/", "/home/U/music", 0},
                    LibraryCase{"HomeItself", "/home/u/", "/home/u/", 0},
                    LibraryCase{"ShorterThanHome", "/home/u/", "/home", 0},
                    LibraryCase{"ShorterWord", "/home/u/", "/home/u/mus", 0},
                    LibraryCase{"NoSeparatorIsAdded", "/home/u", "/home/u/music", 0},
                    LibraryCase{"NorTaken", "/home/u", "/home/umusic", 1}),
    [](const auto& test) { return test.param.name; });

class PersonalLibraryPath : public HelperTest {};

TEST_F(PersonalLibraryPath, NeedsBothPaths) {
  EXPECT_EQ(TAVOMediaIndexIsUnderPersonalLibPath(nullptr, "/home/u/music"), 0);
  EXPECT_EQ(TAVOMediaIndexIsUnderPersonalLibPath("/home/u/", nullptr), 0);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Bad Parameters.", "mediidx:N Bad Parameters."));
}

class SongRatings : public HelperTest {
 protected:
  using Hash = std::unique_ptr<TLIBSZHASH, decltype(&TLIBCSzHashFree)>;

  std::string rating(const char* user) {
    const char* stars = TLIBCSzHashGetValue(hash.get(), user);
    return stars ? stars : "none";
  }

  Hash hash{TLIBCSzHashAlloc(64), TLIBCSzHashFree};
  std::string song = root.at("volume1/a.mp3");
};

TEST_F(SongRatings, AreReadByUser) {
  root.write("volume1/@eaDir/a.mp3/TAVOAUDIO_SONG_RATING", "1026=4\n1027=5\n");
  EXPECT_EQ(TAVOMediaIndexGetAllUserDefinedSongRating(song.c_str(), hash.get()), 1);
  EXPECT_EQ(TLIBCSzHashCount(hash.get()), 2);
  EXPECT_EQ(rating("1026"), "4");
  EXPECT_EQ(rating("1027"), "5");
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(SongRatings, AreNoneWithoutAFile) {
  EXPECT_EQ(TAVOMediaIndexGetAllUserDefinedSongRating(song.c_str(), hash.get()), 1);
  EXPECT_EQ(TLIBCSzHashCount(hash.get()), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(SongRatings, NeedAPathAndAHash) {
  EXPECT_EQ(TAVOMediaIndexGetAllUserDefinedSongRating(nullptr, hash.get()), 0);
  EXPECT_EQ(TAVOMediaIndexGetAllUserDefinedSongRating(song.c_str(), nullptr), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(SongRatings, FailWithoutAnAttributeFolder) {
  EXPECT_EQ(TAVOMediaIndexGetAllUserDefinedSongRating("/a%s/", hash.get()), 0);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Failed to get @eaDir [path=/a%s/]"));
  EXPECT_EQ(logged()[0].priority, 3);
}

TEST_F(SongRatings, FailWhenTheFileCannotBeRead) {
  const auto file = root.make_folder("volume1/@eaDir/a.mp3/TAVOAUDIO_SONG_RATING");
  EXPECT_EQ(TAVOMediaIndexGetAllUserDefinedSongRating(song.c_str(), hash.get()), 0);
  EXPECT_THAT(log_lines(),
              ElementsAre("mediidx:N Failed to get song rating from path[" + file + "]"));
}

struct KeyCase {
  const char* test;
  const char* name;
  const char* search;
  const char* sort;
};

class SortAndSearchKeys : public testing::TestWithParam<KeyCase> {};

TEST_P(SortAndSearchKeys, AreWrittenIntoTheBuffers) {
  std::array<char, 256> search;
  std::array<char, 256> sort;
  search.fill('#');
  sort.fill('#');
  EXPECT_EQ(
      TAVOMediaIndexGetSortAndSearchProperty(GetParam().name, search.data(), 256, sort.data(), 256),
      sort.data());
  EXPECT_STREQ(search.data(), GetParam().search);
  EXPECT_STREQ(sort.data(), GetParam().sort);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, SortAndSearchKeys,
    testing::Values(KeyCase{"A", "a day in the life", "A DAY IN THE LIFE", "DAY IN THE LIFE"},
                    KeyCase{"An", "An Evening", "AN EVENING", "EVENING"},
                    KeyCase{"The", "the end", "THE END", "END"},
                    KeyCase{"NoBlankBehindAn", "Anthem", "ANTHEM", "ANTHEM"},
                    KeyCase{"TheAlone", "The", "THE", "THE"}, KeyCase{"AAlone", "A ", "A ", ""},
                    KeyCase{"OneArticleOnly", "The A Team", "THE A TEAM", "A TEAM"},
                    KeyCase{"Empty", "", "", ""}, KeyCase{"Null", nullptr, "", ""}),
    [](const auto& test) { return test.param.test; });

}  // namespace
}  // namespace mediidx::test
