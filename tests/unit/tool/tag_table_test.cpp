// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/tag_table.h"

#include <gtest/gtest.h>

#include <fstream>
#include <sstream>

#include "tags_document.h"

namespace mediidx::tool {
namespace {

NamedTags id3(std::initializer_list<std::pair<const char*, const char*>> tags) {
  NamedTags out{TagFamily::kId3v2, {}};
  for (const auto& [name, value] : tags) out.add(name, value);
  return out;
}

MediaFile stored(const std::vector<NamedTags>& sources) {
  MediaFile file;
  store_tags(sources, file);
  return file;
}

TEST(TheDocumentOfTags, IsPrintedFromTheTables) {
  std::ifstream file(MEDIIDX_TAGS_DOCUMENT);
  std::ostringstream text;
  text << file.rdbuf();
  EXPECT_EQ(text.str(), test::tags_document()) << "make it anew: ninja tags_document";
}

TEST(TheDocumentOfTags, TellsTheSamplesOfEveryFormat) {
  const auto formats = music_formats();
  const auto sampled = test::sampled_music();
  ASSERT_LE(formats.size(), sampled.size());
  for (std::size_t i = 0; i < formats.size(); ++i) EXPECT_EQ(formats[i].name, sampled[i].name);
}

TEST(ATag, IsFoundByItsNameInAnyCase) {
  EXPECT_EQ(stored({id3({{"txxx:Album Artist", "Ada"}})}).album_artist, "Ada");
}

TEST(ATag, GivesWayToAnEarlierNameOfItsColumn) {
  EXPECT_EQ(stored({id3({{"TXXX:BAND", "Bo"}, {"TPE2", "Ada"}})}).album_artist, "Ada");
}

TEST(ATag, OfBlanksCountsAsNone) {
  EXPECT_EQ(stored({id3({{"TPE2", " \n"}, {"TXXX:BAND", "Bo"}})}).album_artist, "Bo");
}

TEST(ATag, ThatIsNoNumberGivesWay) {
  EXPECT_EQ(stored({id3({{"TDRC", "May"}, {"TDRL", "2004-05"}})}).year, 2004);
}

TEST(ATag, OfALaterSourceFillsAGap) {
  const auto first = id3({{"TIT2", "A"}});
  const auto second = id3({{"TIT2", "B"}, {"TALB", "C"}});
  const auto file = stored({first, second});
  EXPECT_EQ(file.title, "A");
  EXPECT_EQ(file.album, "C");
}

TEST(ATag, IsCleanUtf8) {
  EXPECT_EQ(stored({id3({{"TIT2", " a\n\xFF\x01z "}})}).title, "a \xEF\xBF\xBDz");
}

TEST(SeveralValues, StandOnceEachAndWithoutBlanks) {
  EXPECT_EQ(stored({id3({{"TPE1", "A"}, {"TPE1", ""}, {"TPE1", "B"}, {"TPE1", "A "}})}).artist,
            "A; B");
  EXPECT_EQ(stored({id3({{"TCON", "A"}, {"TCON", "B"}})}).genre, "A;B");
}

TEST(SeveralValues, EndSomewhere) {
  NamedTags tags{TagFamily::kId3v2, {}};
  for (int i = 0; i < 100'000; ++i) tags.add("TPE1", std::to_string(i));
  const auto file = stored({tags});
  EXPECT_TRUE(file.artist.starts_with("0; 1; 2"));
  EXPECT_LT(file.artist.size(), 5000U);
}

}  // namespace
}  // namespace mediidx::tool
