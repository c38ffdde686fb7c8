// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "playlist/entry_readers.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

using mediidx::clean_line;
using mediidx::M3uReader;
using mediidx::playlist_format;
using mediidx::PlaylistFormat;
using mediidx::read_pls_line;
using mediidx::read_wpl_line;

TEST(PlaylistFormatOfAPath, IsToldByThreeLettersInAnyCase) {
  EXPECT_EQ(playlist_format("/a/x.m3u"), PlaylistFormat::kM3u);
  EXPECT_EQ(playlist_format("/a/x.M3U8"), PlaylistFormat::kM3u);
  EXPECT_EQ(playlist_format("/a/x.pls"), PlaylistFormat::kPls);
  EXPECT_EQ(playlist_format("/a/x.y.Wpl"), PlaylistFormat::kWpl);
}

TEST(PlaylistFormatOfAPath, IsNoneForOtherExtensions) {
  EXPECT_FALSE(playlist_format("/a/x.cue"));
  EXPECT_FALSE(playlist_format("/a/x.m3"));
  EXPECT_FALSE(playlist_format("/a/x."));
  EXPECT_FALSE(playlist_format("/a.m3u/x.txt"));
}

struct LineCase {
  const char* name;
  std::string line;
  std::string entry;  ///< Empty: the line gives none.
};
void PrintTo(const LineCase& test, std::ostream* out) { *out << test.line; }

class PlsLine : public testing::TestWithParam<LineCase> {};

TEST_P(PlsLine, GivesItsEntry) {
  EXPECT_EQ(read_pls_line(GetParam().line).value_or(""), GetParam().entry);
}

INSTANTIATE_TEST_SUITE_P(Cases, PlsLine,
                         testing::Values(LineCase{"Numbered", "File1=a.mp3", "a.mp3"},
                                         LineCase{"Trimmed", "File12= \t a b.mp3 \t", "a b.mp3"},
                                         LineCase{"EqualsInTheName", "File1=a=b.mp3", "a=b.mp3"},
                                         LineCase{"FileInTheMiddle", "xFile=a.mp3", "a.mp3"},
                                         LineCase{"EqualsBeforeFile", "a=File", ""},
                                         LineCase{"LowerCase", "file1=a.mp3", ""},
                                         LineCase{"NoEquals", "File1 a.mp3", ""},
                                         LineCase{"NothingAfterEquals", "File1=", ""},
                                         LineCase{"BlanksAfterEquals", "File1= \t ", ""},
                                         LineCase{"Title", "Title1=Song", ""},
                                         LineCase{"Header", "[playlist]", ""},
                                         LineCase{"Empty", "", ""}),
                         [](const auto& test) { return test.param.name; });

class WplLine : public testing::TestWithParam<LineCase> {};

TEST_P(WplLine, GivesItsValue) {
  EXPECT_EQ(read_wpl_line(GetParam().line).value_or(""), GetParam().entry);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, WplLine,
    testing::Values(
        LineCase{"Plain", R"(<media src="a.mp3"/>)", "a.mp3"},
        LineCase{"BlankBeforeTheSlash", R"(  <media src="a.mp3" />)", "a.mp3"},
        LineCase{"OtherAttributes", R"(<media src="a.mp3" cid="{1}"/>)", "a.mp3"},
        LineCase{"ClosedByABracket", R"(<media src="a.mp3"></media>)", "a.mp3"},
        LineCase{"BlanksAroundEquals", "<media src = \t\"a.mp3\"/>", "a.mp3"},
        LineCase{"Ampersand", R"(<media src="a&amp;b.mp3"/>)", "a&b.mp3"},
        LineCase{"Apostrophe", R"(<media src="it&apos;s.mp3"/>)", "it's.mp3"},
        LineCase{"AmpersandsUntilNoneIsLeft", R"(<media src="a&amp;amp;amp;b.mp3"/>)", "a&b.mp3"},
        LineCase{"AmpersandThatMakesAnApostrophe", R"(<media src="a&amp;apos;b"/>)", "a'b"},
        LineCase{"OtherEntitiesStay", R"(<media src="a&lt;b&quot;.mp3"/>)", "a&lt;b&quot;.mp3"},
        LineCase{"QuoteWithinTheValue", R"(<media src="a"b.mp3"/>)", "a\"b.mp3"},
        LineCase{"ThreeBytesForAQuote",
                 "<media src=\xEF\x80\xA0"
                 "a.mp3\xEF\x80\xA0/>",
                 "a.mp3"},
        LineCase{"NoEnd", R"(<media src="a.mp3)", ""},
        LineCase{"QuoteAtTheEndOfTheLine", R"(<media src="a.mp3")", ""},
        LineCase{"OnlyBlanks", R"(<media src="   "/>)", ""},
        LineCase{"NothingAfterTheName", "<media src", ""},
        LineCase{"NoMedia", R"(<seq src="a.mp3"/>)", ""}),
    [](const auto& test) { return test.param.name; });

TEST(LineOfAPlaylist, LosesItsEnd) {
  EXPECT_EQ(clean_line("a.mp3\r\n", PlaylistFormat::kPls), "a.mp3");
  EXPECT_EQ(clean_line("a.mp3\r\r\n\n", PlaylistFormat::kM3u), "a.mp3");
  EXPECT_EQ(clean_line("a.mp3", PlaylistFormat::kWpl), "a.mp3");
}

TEST(LineOfAPlaylist, LosesAByteOrderMarkInM3uOnly) {
  EXPECT_EQ(clean_line("\xEF\xBB\xBF"
                       "a.mp3\n",
                       PlaylistFormat::kM3u),
            "a.mp3");
  EXPECT_EQ(clean_line("\xEF\xBB\xBF"
                       "a.mp3\n",
                       PlaylistFormat::kPls),
            "\xEF\xBB\xBF"
            "a.mp3");
}

TEST(LineOfAPlaylist, LosesThreeBytesAfterTheFirstTwoOfAMark) {
  EXPECT_EQ(clean_line("\xEF\xBB"
                       "xa.mp3",
                       PlaylistFormat::kM3u),
            "a.mp3");
  EXPECT_EQ(clean_line("\xEF\xBB\n", PlaylistFormat::kM3u), "");
}

std::vector<std::string> m3u_entries(const std::vector<std::string>& lines) {
  M3uReader reader;
  std::vector<std::string> entries;
  for (const auto& line : lines) {
    if (const auto entry = reader.read_line(line)) {
      entries.push_back(*entry + "|" + reader.take_tags().title);
    }
  }
  return entries;
}

TEST(M3uReader, GivesTheTagLinesToTheEntryThatFollows) {
  EXPECT_EQ(m3u_entries({"#EXTM3U", "#EXTINF:5,One", "a.mp3", "b.mp3", "#EXTINF:6,Three", "c.mp3"}),
            (std::vector<std::string>{"a.mp3|One", "b.mp3|", "c.mp3|Three"}));
}

TEST(M3uReader, LetsALaterTagLineReplaceAnEarlierOne) {
  EXPECT_EQ(m3u_entries({"#EXTINF:5,One", "#EXTINF:5,Two", "a.mp3"}),
            (std::vector<std::string>{"a.mp3|Two"}));
}

TEST(M3uReader, SkipsCommentsAndBlankLines) {
  EXPECT_EQ(m3u_entries({"# remark", "", " \t ", "#", "a.mp3"}),
            (std::vector<std::string>{"a.mp3|"}));
}

TEST(M3uReader, KeepsBlanksAroundAnEntry) {
  EXPECT_EQ(m3u_entries({" a.mp3 "}), (std::vector<std::string>{" a.mp3 |"}));
}

}  // namespace
