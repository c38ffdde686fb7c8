// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/track_genre.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace mediidx::catalogue {
namespace {

std::vector<std::string> tokens_of(const char* genres) {
  GenreTokens tokens(genres);
  std::vector<std::string> all;
  while (const char* token = tokens.next()) all.emplace_back(token);
  return all;
}

TEST(GenreTokens, ComeInOrder) {
  EXPECT_EQ(tokens_of("Rock;Pop;Jazz"), (std::vector<std::string>{"Rock", "Pop", "Jazz"}));
}

TEST(GenreTokens, AreNeverEmpty) {
  EXPECT_EQ(tokens_of(";;Rock;;;Pop;"), (std::vector<std::string>{"Rock", "Pop"}));
}

TEST(GenreTokens, KeepTheirBlanks) {
  EXPECT_EQ(tokens_of(" Rock ; ;Pop"), (std::vector<std::string>{" Rock ", " ", "Pop"}));
}

TEST(GenreTokens, AreNoneInSeparatorsAlone) {
  EXPECT_TRUE(tokens_of(";;;").empty());
  EXPECT_TRUE(tokens_of("").empty());
}

TEST(GenreTokens, StayAtTheirEnd) {
  GenreTokens tokens(";");

  EXPECT_EQ(tokens.next(), nullptr);
  EXPECT_EQ(tokens.next(), nullptr);
}

struct GenreCase {
  const char* name;
  std::string genres;
  std::string text;
  std::string sort;
  std::string search;
};

class AggregatedGenres : public testing::TestWithParam<GenreCase> {};

TEST_P(AggregatedGenres, JoinTheTokens) {
  const auto all = aggregate_genres(GetParam().genres.c_str());

  ASSERT_TRUE(all);
  EXPECT_EQ(all->text, GetParam().text);
  EXPECT_EQ(all->sort, GetParam().sort);
  EXPECT_EQ(all->search, GetParam().search);
}

INSTANTIATE_TEST_SUITE_P(
    Genres, AggregatedGenres,
    testing::Values(GenreCase{"Single", "Rock", "Rock", "ROCK", "ROCK"},
                    GenreCase{"Empty", "", "", "", ""},
                    GenreCase{"Several", ";;Rock; Pop ;;Jazz", "Rock; Pop; Jazz", "ROCK; POP; JAZZ",
                              "ROCK; POP; JAZZ"},
                    GenreCase{"OnlyTheFirstKeepsItsBlanks", " Rock; Pop", " Rock; Pop",
                              " ROCK; POP", " ROCK; POP"},
                    GenreCase{"ABlankTokenLeavesItsSeparator", "Rock; ", "Rock; ", "ROCK; ",
                              "ROCK; "},
                    GenreCase{"SeparatorsAloneStay", ";;;", ";;;", ";;;", ";;;"},
                    GenreCase{"EachDropsItsArticle", "The Blues;A Cappella",
                              "The Blues; A Cappella", "BLUES; CAPPELLA", "THE BLUES; A CAPPELLA"},
                    GenreCase{"ATrailingSeparatorVanishes", "Rock;", "Rock", "ROCK", "ROCK"}),
    [](const auto& test) { return std::string(test.param.name); });

TEST(AggregatedGenres, AreCutAtTheirWidth) {
  std::string genres;
  for (int i = 0; i < 127; ++i) genres += "a;";

  const auto all = aggregate_genres(genres.c_str());

  ASSERT_TRUE(all);
  EXPECT_EQ(all->text.size(), kAggregatedWidth);
  EXPECT_TRUE(all->text.ends_with("a; a; a; "));
  EXPECT_EQ(all->search.size(), kAggregatedWidth);
}

TEST(AggregatedGenres, AreCutAtTheBorderOfACharacter) {
  // 249 bytes, two of the separator, and three of each character: half of the second would fit.
  const std::string first(249, 'x');

  const auto all = aggregate_genres((first + ";愛愛").c_str());

  ASSERT_TRUE(all);
  EXPECT_EQ(all->text, first + "; 愛");
  EXPECT_EQ(all->search, std::string(249, 'X') + "; 愛");
  EXPECT_EQ(all->sort, std::string(249, 'X') + "; 愛");
}

}  // namespace
}  // namespace mediidx::catalogue
