// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "support/sort_key.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <clocale>
#include <cstdlib>
#include <iterator>
#include <random>
#include <string>

namespace mediidx {
namespace {

struct KeyCase {
  const char* name;
  const char* text;
  const char* search;
  const char* sort;
};

class SortKey : public testing::TestWithParam<KeyCase> {};

TEST_P(SortKey, FollowsTheName) {
  const NameKeys keys(GetParam().text);

  EXPECT_STREQ(keys.search, GetParam().search);
  EXPECT_STREQ(keys.sort, GetParam().sort);
}

INSTANTIATE_TEST_SUITE_P(
    Names, SortKey,
    testing::Values(
        KeyCase{"DropsOneA", "a day in the life", "A DAY IN THE LIFE", "DAY IN THE LIFE"},
        KeyCase{"DropsOneAn", "An Ending", "AN ENDING", "ENDING"},
        KeyCase{"DropsOneThe", "tHe Wall", "THE WALL", "WALL"},
        KeyCase{"DropsOneArticleOnly", "The A Team", "THE A TEAM", "A TEAM"},
        KeyCase{"DropsTheSameArticleOnce", "A A", "A A", "A"},
        KeyCase{"KeepsAWordThatBeginsWithAn", "Anthem", "ANTHEM", "ANTHEM"},
        KeyCase{"KeepsAWordThatBeginsWithThe", "Theory", "THEORY", "THEORY"},
        KeyCase{"KeepsAnArticleAlone", "The", "THE", "THE"},
        KeyCase{"KeepsAnArticleBehindABlank", " The Wall", " THE WALL", " THE WALL"},
        KeyCase{"KeepsAnArticleBeforeATab", "A\tB", "A\tB", "A\tB"},
        KeyCase{"KeepsForeignArticles", "die Kunst", "DIE KUNST", "DIE KUNST"},
        KeyCase{"IsEmptyForAnArticleAndABlank", "A ", "A ", ""},
        KeyCase{"IsEmptyForNoName", "", "", ""},
        KeyCase{"FoldsOnlyAToZ", "`az{@AZ[09", "`AZ{@AZ[09", "`AZ{@AZ[09"},
        KeyCase{"LeavesOtherLettersAlone", "Émile ça ı ß я 愛", "ÉMILE çA ı ß я 愛",
                "ÉMILE çA ı ß я 愛"},
        KeyCase{"LeavesBytesThatAreNoTextAlone", "a\xff\xe1z", "A\xff\xe1Z", "A\xff\xe1Z"}),
    [](const auto& test) { return std::string(test.param.name); });

TEST(SortKey, KeepsAllButTheTerminatorOfItsWidth) {
  const NameKeys fits(std::string(kKeySize - 1, 'x'));
  const NameKeys cut(std::string(kKeySize + 40, 'x'));

  EXPECT_EQ(fits.search, std::string(kKeySize - 1, 'X'));
  EXPECT_EQ(fits.sort, std::string(kKeySize - 1, 'X'));
  EXPECT_EQ(cut.search, std::string(kKeySize - 1, 'X'));
}

TEST(SortKey, EndsAtTheBorderOfACharacter) {
  const NameKeys keys(std::string(kKeySize - 3, 'x') + "愛" + "tail");

  EXPECT_EQ(keys.search, std::string(kKeySize - 3, 'X'));
  EXPECT_EQ(keys.sort, std::string(kKeySize - 3, 'X'));
}

TEST(SortKey, IsMadeOfTheSearchKeyAsItWasCut) {
  std::array<char, 6> search;
  std::array<char, 64> sort;

  sort_and_search_keys("the wall", search, sort);

  EXPECT_STREQ(search.data(), "THE W");
  EXPECT_STREQ(sort.data(), "W");
}

TEST(SortKey, IsPaddedWithZeroBytes) {
  std::array<char, 64> search;
  std::array<char, 16> sort;
  sort.fill('#');

  EXPECT_EQ(make_sort_and_search_keys("a b", search.data(), 64, sort.data(), 16), sort.data());

  EXPECT_EQ(std::string(sort.data(), sort.size()), std::string("B") + std::string(15, '\0'));
}

TEST(SortKey, IsCutAtItsOwnWidthToo) {
  std::array<char, 64> search;
  std::array<char, 5> sort;

  make_sort_and_search_keys("an 愛愛", search.data(), 64, sort.data(), 5);

  EXPECT_STREQ(search.data(), "AN 愛愛");
  EXPECT_STREQ(sort.data(), "愛");
}

TEST(SortKey, OfANameThatIsMissingIsEmpty) {
  std::array<char, 8> search{'#', '#'};
  std::array<char, 8> sort{'#', '#'};

  make_sort_and_search_keys(nullptr, search.data(), 8, sort.data(), 8);

  EXPECT_STREQ(search.data(), "");
  EXPECT_STREQ(sort.data(), "");
}

TEST(SortKey, IsEmptyWhenTheSearchKeyHasNoRoom) {
  for (const int length : {1, 0, -1, -256}) {
    std::array<char, 4> search{'#', '#', '#', '\0'};
    std::array<char, 8> sort{'#', '#'};

    make_sort_and_search_keys("wall", search.data(), length, sort.data(), 8);

    EXPECT_STREQ(search.data(), length == 1 ? "" : "###");
    EXPECT_STREQ(sort.data(), "");
  }
}

TEST(SortKey, WritesNothingOutsideItsBuffers) {
  std::array<char, 3> search{'#', '#', '#'};
  std::array<char, 3> sort{'#', '#', '#'};

  make_sort_and_search_keys("wall", search.data(), 2, sort.data(), 1);

  EXPECT_EQ(std::string(search.data(), 3), std::string("W\0#", 3));
  EXPECT_EQ(std::string(sort.data(), 3), std::string("\0##", 3));
  EXPECT_EQ(make_sort_and_search_keys("wall", search.data(), 2, sort.data(), -5), sort.data());
  EXPECT_EQ(std::string(sort.data(), 3), std::string("\0##", 3));
  EXPECT_EQ(make_sort_and_search_keys("wall", nullptr, 200, nullptr, 200), nullptr);
}

/// A locale that raises other letters than the "C" locale, set while it lives.
class OtherLocale {
 public:
  explicit OtherLocale(const char* name) : set_(std::setlocale(LC_ALL, name)) {}
  ~OtherLocale() { std::setlocale(LC_ALL, "C"); }
  OtherLocale(const OtherLocale&) = delete;
  OtherLocale& operator=(const OtherLocale&) = delete;
  bool set() const { return set_ != nullptr; }

 private:
  const char* set_;
};

TEST(SortKey, DoesNotDependOnTheLocale) {
  // Compiled by the build into a folder of its own: the machine may have none but "C".
  ASSERT_EQ(setenv("LOCPATH", MEDIIDX_LOCALES, 1), 0);
  for (const char* name : {"tr_TR.UTF-8", "tr_TR.ISO-8859-9", "de_DE.ISO-8859-1"}) {
    const OtherLocale locale(name);
    ASSERT_TRUE(locale.set()) << name;

    const NameKeys keys("the \xe4\xfd iI");

    EXPECT_STREQ(keys.search, "THE \xe4\xfd II") << name;
    EXPECT_STREQ(keys.sort, "\xe4\xfd II") << name;
  }
  unsetenv("LOCPATH");
}

TEST(SortKey, NeverGrows) {
  std::mt19937 random(20240611);
  const std::string letters = "aAtThHeE nN\xc3\xa9\xe6\x84\x9b";
  for (int round = 0; round < 2000; ++round) {
    std::string name;
    for (auto length = random() % 300; length > 0; --length) {
      name += letters[random() % letters.size()];
    }

    const NameKeys keys(name);
    const std::string search = keys.search;
    const std::string sort = keys.sort;

    EXPECT_LE(search.size(), std::min(name.size(), kKeySize - 1));
    EXPECT_LE(sort.size(), search.size());
    EXPECT_TRUE(search.ends_with(sort)) << name;
  }
}

}  // namespace
}  // namespace mediidx
