// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "ratings/rating_file.h"

#include <gmock/gmock.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <iterator>

#include "integration/tool/command.h"
#include "ratings/rating_tag.h"

namespace mediidx::test {
namespace {

using testing::IsEmpty;
using testing::Pair;
using testing::ThrowsMessage;
using testing::UnorderedElementsAre;
using tool::read_ratings;
using tool::with_rating;
using tool::write_rating;

class ARatingFile : public testing::Test {
 protected:
  std::string text() const {
    std::ifstream in(file, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
  }

  OpenFolder folder;
  std::string song = folder.write("a.mp3", "x");
  std::string file = folder.at("@eaDir/a.mp3/TAVOAUDIO_SONG_RATING");
};

TEST_F(ARatingFile, IsMadeWithItsFolder) {
  write_rating(song, 1026, 4);
  EXPECT_EQ(text(), "1026=4\n");
  EXPECT_THAT(read_ratings(song), UnorderedElementsAre(Pair(1026U, 4)));
}

TEST_F(ARatingFile, KeepsTheLinesOfOthers) {
  folder.write("@eaDir/a.mp3/TAVOAUDIO_SONG_RATING", "# mine\n1000 = \"3\"\n1026=1\nodd line");
  chmod(file.c_str(), 0640);
  write_rating(song, 1026, 5);
  EXPECT_EQ(text(), "# mine\n1000 = \"3\"\n1026=5\nodd line\n");
  EXPECT_THAT(read_ratings(song), UnorderedElementsAre(Pair(1000U, 3), Pair(1026U, 5)));
  struct stat status{};
  ASSERT_EQ(stat(file.c_str(), &status), 0);
  EXPECT_EQ(status.st_mode & 0777U, 0640U);
  EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.at("@eaDir/a.mp3")), {}), 1);
}

TEST_F(ARatingFile, GoesWithItsLastRating) {
  write_rating(song, 1000, 2);
  write_rating(song, 1026, 4);
  write_rating(song, 1026, 0);
  EXPECT_EQ(text(), "1000=2\n");
  write_rating(song, 1000, 0);
  EXPECT_FALSE(std::filesystem::exists(file));
  EXPECT_THAT(read_ratings(song), IsEmpty());
}

TEST_F(ARatingFile, IsNotMadeToRemoveARating) {
  write_rating(song, 1026, 0);
  EXPECT_FALSE(std::filesystem::exists(folder.at("@eaDir")));
}

TEST_F(ARatingFile, TakesTheRatingsOfManyAtOnce) {
  constexpr std::uint32_t kUsers = 16;
  std::vector<pid_t> children;
  for (std::uint32_t user = 1; user <= kUsers; ++user) {
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
      for (int stars = 1; stars <= 5; ++stars) write_rating(song, user, stars);
      _exit(0);
    }
    children.push_back(child);
  }
  for (const pid_t child : children) {
    int status = -1;
    waitpid(child, &status, 0);
    EXPECT_EQ(status, 0);
  }
  const auto ratings = read_ratings(song);
  EXPECT_EQ(ratings.size(), kUsers);
  EXPECT_THAT(ratings, testing::Each(Pair(testing::_, 5)));
}

TEST_F(ARatingFile, IsWrittenWhereAnotherWasLeftUnfinished) {
  folder.write("@eaDir/a.mp3/TAVOAUDIO_SONG_RATING.new", "10");
  write_rating(song, 1026, 4);
  EXPECT_EQ(text(), "1026=4\n");
  EXPECT_FALSE(std::filesystem::exists(file + ".new"));
}

TEST_F(ARatingFile, BelongsToWhomTheFolderBelongs) {
  if (geteuid() == 0) {
    ASSERT_EQ(chown(folder.path().c_str(), 12345, 23456), 0);
  }
  struct stat above{};
  ASSERT_EQ(stat(folder.path().c_str(), &above), 0);
  write_rating(song, 1026, 4);
  for (const auto& made : {folder.at("@eaDir"), folder.at("@eaDir/a.mp3"), file}) {
    struct stat status{};
    ASSERT_EQ(stat(made.c_str(), &status), 0);
    EXPECT_EQ(status.st_uid, above.st_uid) << made;
    EXPECT_EQ(status.st_gid, above.st_gid) << made;
  }
}

TEST_F(ARatingFile, IsNotWrittenThroughALink) {
  const OpenFolder elsewhere;
  std::filesystem::create_directory_symlink(elsewhere.path(), folder.at("@eaDir"));
  EXPECT_THROW(write_rating(song, 1026, 4), std::runtime_error);
  EXPECT_TRUE(std::filesystem::is_empty(elsewhere.path()));
}

TEST_F(ARatingFile, IsNotWrittenInPlaceOfALink) {
  const auto secret = folder.write("secret", "keep\n");
  std::filesystem::create_directories(folder.at("@eaDir/a.mp3"));
  std::filesystem::create_symlink(secret, file);
  EXPECT_THROW(write_rating(song, 1026, 4), std::runtime_error);
  std::ifstream in(secret);
  EXPECT_EQ(std::string(std::istreambuf_iterator<char>(in), {}), "keep\n");
}

TEST_F(ARatingFile, ThatIsTooLargeIsLeftAlone) {
  folder.write("@eaDir/a.mp3/TAVOAUDIO_SONG_RATING", std::string((1 << 20) + 1, '#'));
  EXPECT_THAT([this] { write_rating(song, 1026, 4); },
              ThrowsMessage<std::runtime_error>(testing::HasSubstr("too large")));
}

TEST_F(ARatingFile, HoldsNothingFromLinesThatAreNoRatings) {
  folder.write("@eaDir/a.mp3/TAVOAUDIO_SONG_RATING",
               "1026=many\n=3\n99999999999=1\n-1=2\n1=\n7=5 \n");
  EXPECT_THAT(read_ratings(song), UnorderedElementsAre(Pair(7U, 5)));
}

TEST(ATextOfRatings, GetsOneLineAUser) {
  EXPECT_EQ(with_rating("", 7, 3), "7=3\n");
  EXPECT_EQ(with_rating("7=1\n8=2\n 7 = 2\r\n", 7, 3), "7=3\n8=2\n");
  EXPECT_EQ(with_rating("7=1\n8=2", 7, 0), "8=2\n");
  EXPECT_EQ(with_rating("77=1\n", 7, 3), "77=1\n7=3\n");
  EXPECT_EQ(with_rating("#7=1\n", 7, 0), "#7=1\n");
}

TEST(ATextOfRatings, KnowsAUserByTheNumberAtTheBeginningOfAKey) {
  EXPECT_EQ(with_rating("7\"=1\n07=2\n+7=3\n7 8=4\nx7=5\n", 7, 3), "7=3\nx7=5\n");
}

TEST(ATextOfRatings, KeepsItsByteOrderMark) {
  EXPECT_EQ(with_rating("\xEF\xBB\xBF"
                        "7=1\n8=2\n",
                        7, 3),
            "\xEF\xBB\xBF"
            "7=3\n8=2\n");
  EXPECT_EQ(with_rating("\xEF\xBB\xBF"
                        "7=1\n",
                        7, 0),
            "");
}

TEST(ARatingTag, CountsStarsAsPlayersDo) {
  EXPECT_EQ(tool::stars_of_popm(0), std::nullopt);
  for (int stars = 1; stars <= 5; ++stars) {
    EXPECT_EQ(tool::stars_of_popm(tool::popm_of_stars(stars)), stars);
    EXPECT_EQ(tool::stars_of_fmps(tool::fmps_of_stars(stars)), stars);
  }
  EXPECT_EQ(tool::stars_of_popm(13), 1);
  EXPECT_EQ(tool::stars_of_popm(186), 4);
  EXPECT_EQ(tool::stars_of_fmps("0.65"), 3);
  for (const char* text : {"", "0.0", "-1", "1.1", "4", "nan", "0.5x"}) {
    EXPECT_EQ(tool::stars_of_fmps(text), std::nullopt) << text;
  }
}

}  // namespace
}  // namespace mediidx::test
