// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mediidx/playlist.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "database.h"
#include "mediidx/database.h"

namespace {

using mediidx::test::clear_log;
using mediidx::test::logged;
using mediidx::test::logged_messages;
using mediidx::test::quoted;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr int kAll = MEDIIDX_KEEP_KNOWN | MEDIIDX_KEEP_UNKNOWN | MEDIIDX_KEEP_STREAMS;

class Playlist : public mediidx::test::DatabaseTest {
 protected:
  Playlist() {
    root.make_link("var/services/music", "/volume1/music");
    clear_log();
  }

  void index_song(const std::string& path, const std::string& title) {
    rows("INSERT INTO music(path, title) VALUES(" + quoted(path) + ", " + quoted(title) + ")");
  }

  /// The list of a file as "path|title".
  std::vector<std::string> read(const std::string& path, int flags = kAll, int offset = 0,
                                int limit = 0, const char* fields = "id, path, title") {
    return texts(ParsePlayListByFieldGivenPath(path.c_str(), &count, offset, limit, fields, flags));
  }

  std::vector<std::string> texts(_PLAYLIST_REC* head) {
    std::vector<std::string> all;
    records.clear();
    for (const auto* node = head; node; node = node->next) {
      all.push_back(std::string(node->info.path) + "|" + node->info.title);
      records.push_back(node->info);
    }
    TAVOPlaylistRecFree(head);
    return all;
  }

  std::string write(const std::string& name, const std::string& content) {
    return root.write("lists/" + name, content);
  }
  std::string at(const std::string& name) { return root.at("lists/" + name); }

  int count = -1;
  std::vector<__tag_TAVO_MEDIA_INFO> records;
};

TEST_F(Playlist, GivesKnownEntriesAsTheDatabaseHoldsThem) {
  index_song(at("a.mp3"), "From the database");
  const auto list = write("x.m3u", "#EXTINF:5,From the list\na.mp3\n");
  EXPECT_THAT(read(list), ElementsAre(at("a.mp3") + "|From the database"));
  EXPECT_EQ(count, 1);
  EXPECT_GT(records[0].id, 0U);
}

TEST_F(Playlist, GivesUnknownEntriesTheirTags) {
  const auto list = write("x.m3u",
                          "#EXTINF:5,Song\n#EXTINFARTIST:A\n#EXTINFALBUM:B\n#EXTINFGENRE:C\n"
                          "#EXTINFYEAR:1999\n#EXTINFDISC:2\n#EXTINFTRACK:3\na.mp3\n");
  EXPECT_THAT(read(list), ElementsAre(at("a.mp3") + "|Song"));
  EXPECT_EQ(records[0].id, 0U);
  EXPECT_EQ(records[0].duration, 5);
  EXPECT_STREQ(records[0].artist, "A");
  EXPECT_STREQ(records[0].album, "B");
  EXPECT_STREQ(records[0].genre, "C");
  EXPECT_EQ(records[0].year, 1999);
  EXPECT_EQ(records[0].disc, 2);
  EXPECT_EQ(records[0].track, 3);
}

TEST_F(Playlist, GivesUnknownEntriesWithoutATitleTheirFileName) {
  const auto list = write("x.m3u", "#EXTINF:5,\n#EXTINFARTIST:A\nb/a.mp3\n");
  EXPECT_THAT(read(list), ElementsAre(at("b/a.mp3") + "|a.mp3"));
  EXPECT_STREQ(records[0].artist, "");
  EXPECT_EQ(records[0].duration, 0);
}

TEST_F(Playlist, KeepsTagsBesideTheirEntriesWhenOthersAreKnownOrDropped) {
  index_song(at("b.mp3"), "B");
  const auto list = write("x.m3u",
                          "#EXTINF:1,One\na.mp3\n#EXTINF:2,Two\nb.mp3\n#EXTINF:3,Three\n"
                          "http://radio/c\n#EXTINF:4,Four\nd.mp3\n");
  EXPECT_THAT(read(list, MEDIIDX_KEEP_UNKNOWN),
              ElementsAre(at("a.mp3") + "|One", at("d.mp3") + "|Four"));
}

TEST_F(Playlist, ForgetsTheTagsOfAnEntryThatDoesNotResolve) {
  const auto list = write("x.m3u", "#EXTINF:1,One\n\\\\nas\na.mp3\n");
  EXPECT_THAT(read(list), ElementsAre(at("a.mp3") + "|a.mp3"));
}

TEST_F(Playlist, KeepsWhatItsFlagsSay) {
  index_song(at("a.mp3"), "A");
  const auto list = write("x.m3u", "a.mp3\nb.mp3\nhttp://radio/c\n");
  EXPECT_THAT(read(list, MEDIIDX_KEEP_KNOWN), ElementsAre(at("a.mp3") + "|A"));
  EXPECT_THAT(read(list, MEDIIDX_KEEP_UNKNOWN), ElementsAre(at("b.mp3") + "|b.mp3"));
  EXPECT_THAT(read(list, MEDIIDX_KEEP_STREAMS), ElementsAre("http://radio/c|c"));
  EXPECT_THAT(read(list, 0), IsEmpty());
  EXPECT_EQ(count, 0);
}

TEST_F(Playlist, TellsStreamsWithoutRegardToCase) {
  const auto list = write("x.m3u", "HTTP://radio/c\n");
  EXPECT_THAT(read(list, MEDIIDX_KEEP_STREAMS), ElementsAre("HTTP://radio/c|c"));
  EXPECT_THAT(read(list, MEDIIDX_KEEP_UNKNOWN), IsEmpty());
}

TEST_F(Playlist, GivesOnePageAndTheWholeCount) {
  std::string content;
  for (int i = 0; i < 30; ++i) content += std::to_string(i) + ".mp3\n";
  const auto list = write("x.m3u", content);

  EXPECT_THAT(
      read(list, kAll, 10, 5),
      ElementsAre(at("10.mp3") + "|10.mp3", at("11.mp3") + "|11.mp3", at("12.mp3") + "|12.mp3",
                  at("13.mp3") + "|13.mp3", at("14.mp3") + "|14.mp3"));
  EXPECT_EQ(count, 30);
  EXPECT_EQ(read(list, kAll, 28, 5).size(), 2U);
  EXPECT_EQ(read(list, kAll, 10, 0).size(), 20U);
  EXPECT_THAT(read(list, kAll, 30, 0), IsEmpty());
  EXPECT_EQ(count, 30);
}

TEST_F(Playlist, GivesNoRecordForANegativeLimit) {
  const auto list = write("x.m3u", "a.mp3\nb.mp3\n");
  EXPECT_THAT(read(list, kAll, 0, -1), IsEmpty());
  EXPECT_EQ(count, 2);
}

TEST_F(Playlist, CountsItsOffsetInKeptEntries) {
  index_song(at("b.mp3"), "B");
  index_song(at("d.mp3"), "D");
  const auto list = write("x.m3u", "a.mp3\nb.mp3\nc.mp3\nd.mp3\n");
  EXPECT_THAT(read(list, MEDIIDX_KEEP_KNOWN, 1, 0), ElementsAre(at("d.mp3") + "|D"));
}

TEST_F(Playlist, KeepsRepeatedEntries) {
  index_song(at("a.mp3"), "A");
  const auto list = write("x.m3u", "a.mp3\na.mp3\n");
  EXPECT_EQ(read(list).size(), 2U);
}

TEST_F(Playlist, OfPlsIsRead) {
  const auto list = write("x.pls",
                          "[playlist]\r\nFile1=a.mp3\r\nTitle1=A\r\nFile2=C:\\Music\\b.mp3\r\n"
                          "File3=http://radio/c\r\nNumberOfEntries=3\r\nVersion=2\r\n");
  EXPECT_THAT(read(list), ElementsAre(at("a.mp3") + "|a.mp3", "/volume1/music/Music/b.mp3|b.mp3",
                                      "http://radio/c|c"));
}

TEST_F(Playlist, OfWplIsRead) {
  const auto list = write("x.wpl",
                          "<?wpl version=\"1.0\"?>\r\n<smil>\r\n<body><seq>\r\n"
                          "  <media src=\"a&amp;b.mp3\"/>\r\n"
                          "  <media src=\"..\\it&apos;s.mp3\" cid=\"{1}\"/>\r\n"
                          "</seq></body>\r\n</smil>\r\n");
  EXPECT_THAT(read(list),
              ElementsAre(at("a&b.mp3") + "|a&b.mp3", root.at("it's.mp3") + "|it's.mp3"));
}

TEST_F(Playlist, InCapitalsIsRead) { EXPECT_EQ(read(write("x.M3U8", "a.mp3\n")).size(), 1U); }

TEST_F(Playlist, WithAByteOrderMarkIsRead) {
  EXPECT_THAT(read(write("x.m3u8", "\xEF\xBB\xBF#EXTM3U\n\xC3\xA9.mp3\n")),
              ElementsAre(at("\xC3\xA9.mp3") + "|\xC3\xA9.mp3"));
}

TEST_F(Playlist, WithoutALastLineEndIsRead) { EXPECT_EQ(read(write("x.m3u", "a.mp3")).size(), 1U); }

TEST_F(Playlist, IsConvertedFromTheCodePage) {
  root.write("etc/tavoinfo.conf", "codepage=\"rus\"\n");
  const auto list = write("x.m3u", "\xEF\xE5\xF1\xED\xFF.mp3\n\xD0\xBF.mp3\n");
  EXPECT_THAT(read(list), ElementsAre(at("песня.mp3") + "|песня.mp3", at("п.mp3") + "|п.mp3"));
}

TEST_F(Playlist, SkipsLinesThatCannotBeConverted) {
  root.write("etc/tavoinfo.conf", "codepage=\"jpn\"\n");
  EXPECT_THAT(read(write("x.m3u", "\xFF\xFF.mp3\na.mp3\n")), ElementsAre(at("a.mp3") + "|a.mp3"));
}

TEST_F(Playlist, TakesALineUpTo4095BytesAndALongerOneInPieces) {
  const auto folder_size = root.at("lists/").size();
  const std::string longest(4095 - folder_size, 'a');
  EXPECT_THAT(read(write("x.m3u", longest + "\n")),
              ElementsAre(at(longest) + "|" + longest.substr(0, 254)));
  EXPECT_THAT(read(write("x.m3u", longest + "a\nb.mp3\n")), ElementsAre(at("b.mp3") + "|b.mp3"));
  // 4,095 bytes that resolve to too much, then the rest of the line as an entry of its own.
  EXPECT_THAT(read(write("x.m3u", std::string(4095, 'a') + "rest.mp3\n")),
              ElementsAre(at("rest.mp3") + "|rest.mp3"));
}

TEST_F(Playlist, ResolvesEntriesThatNeedTheMusicLinkOnlyWithIt) {
  const auto list = write("x.m3u", "\\\\nas\\music\\a.mp3\nC:\\b.mp3\nc.mp3\n");
  EXPECT_EQ(read(list).size(), 3U);
  std::filesystem::remove(root.at("var/services/music"));
  EXPECT_THAT(read(list), ElementsAre(at("c.mp3") + "|c.mp3"));
}

TEST_F(Playlist, WithoutADotIsNotValid) {
  EXPECT_THAT(texts(ParsePlayListByFieldGivenPath("/lists/x", &count, 0, 0, "*", kAll)), IsEmpty());
  EXPECT_EQ(count, 0);
  EXPECT_THAT(logged_messages(), ElementsAre("Not a valid playlist."));
  EXPECT_THAT(logged()[0].text, testing::StartsWith("mediidx_playlist_parse ("));
}

TEST_F(Playlist, OfAnotherKindGivesNothingWithoutAWord) {
  EXPECT_THAT(read(write("x.txt", "a.mp3\n")), IsEmpty());
  EXPECT_EQ(count, 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(Playlist, ThatIsMissingOrEmptyOrAFolderGivesNothing) {
  EXPECT_THAT(read(at("none.m3u")), IsEmpty());
  EXPECT_EQ(count, 0);
  EXPECT_THAT(read(write("x.m3u", "")), IsEmpty());
  EXPECT_THAT(read(root.make_folder("lists/y.m3u")), IsEmpty());
  EXPECT_EQ(count, 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(Playlist, GivesNothingWhenTheLookUpFails) {
  rows("DROP TABLE music");
  EXPECT_THAT(read(write("x.m3u", "a.mp3\n")), IsEmpty());
  EXPECT_EQ(count, 0);
}

TEST_F(Playlist, GivesNothingWhenItsFieldsLackThePath) {
  index_song(at("a.mp3"), "A");
  const auto list = write("x.m3u", "a.mp3\n");
  read(list, kAll, 0, 0, "id");
  EXPECT_EQ(count, 1);
}

TEST_F(Playlist, WithHostileNamesLooksUpOnlyThese) {
  const std::vector<std::string> names{
      "it's.mp3", "100%.mp3", "a_b.mp3", "x'); DROP TABLE music;--", "\"q\".mp3", "日本.mp3"};
  std::string content;
  std::vector<std::string> expected;
  for (const auto& name : names) {
    index_song(at(name), "known");
    content += name + "\n";
    expected.push_back(at(name) + "|known");
  }
  EXPECT_EQ(read(write("x.m3u", content)), expected);
}

TEST_F(Playlist, OfARowIsReadByItsId) {
  index_song(at("a.mp3"), "A");
  const auto list = write("x.m3u", "a.mp3\nb.mp3\n");
  rows("INSERT INTO playlist(id, path) VALUES(7, " + quoted(list) + ")");

  EXPECT_THAT(texts(ParsePlayList("7", &count, 0, 0)), ElementsAre(at("a.mp3") + "|"));
  EXPECT_EQ(count, 1);
  EXPECT_EQ(texts(ParsePlayListByField("7", &count, 0, 0, "id, path, title", kAll)).size(), 2U);
  EXPECT_EQ(count, 2);
}

TEST_F(Playlist, OfAnIdWithoutARowIsNotFound) {
  EXPECT_THAT(texts(ParsePlayList("7", &count, 0, 0)), IsEmpty());
  EXPECT_EQ(count, 0);
  EXPECT_THAT(logged_messages(), ElementsAre("Failed to get playlist path."));
}

TEST_F(Playlist, OfAnIdThatIsNoNumberIsAFailedQuery) {
  for (const char* id : {"", "x", "-1", "1 OR 1=1", "1;DROP TABLE playlist", " 1"}) {
    clear_log();
    EXPECT_THAT(texts(ParsePlayList(id, &count, 0, 0)), IsEmpty());
    EXPECT_EQ(count, 0);
    EXPECT_THAT(logged_messages(), ElementsAre("Failed to query database.")) << id;
  }
  clear_log();
  EXPECT_EQ(ParsePlayList(nullptr, &count, 0, 0), nullptr);
  EXPECT_THAT(logged_messages(), ElementsAre("Failed to query database."));
}

TEST_F(Playlist, OfAnIdIsAFailedQueryWithoutItsTable) {
  rows("DROP TABLE playlist");
  EXPECT_EQ(ParsePlayList("7", &count, 0, 0), nullptr);
  EXPECT_EQ(logged_messages().back(), "Failed to query database.");
}

TEST_F(Playlist, OfARowWithoutADotIsNotValid) {
  rows("INSERT INTO playlist(id, path) VALUES(7, '/list')");
  EXPECT_EQ(ParsePlayList("7", &count, 0, 0), nullptr);
  EXPECT_THAT(logged_messages(), ElementsAre("Not a valid playlist."));
}

TEST_F(Playlist, NeedsNoCountAndNoPath) {
  const auto list = write("x.m3u", "a.mp3\n");
  auto* head = ParsePlayListByFieldGivenPath(list.c_str(), nullptr, 0, 0, "id, path", kAll);
  EXPECT_NE(head, nullptr);
  TAVOPlaylistRecFree(head);
  EXPECT_EQ(ParsePlayListByFieldGivenPath(nullptr, &count, 0, 0, "id, path", kAll), nullptr);
  EXPECT_EQ(count, 0);
  TAVOPlaylistRecFree(nullptr);
}

TEST_F(Playlist, OfManyEntriesIsLookedUpWithOneStatement) {
  std::string content;
  for (int i = 0; i < 5000; ++i) content += std::to_string(i) + ".mp3\n";
  const auto list = write("x.m3u", content);
  mediidx::test::clear_sent_statements();
  read(list, MEDIIDX_KEEP_UNKNOWN, 0, -1);
  EXPECT_EQ(count, 5000);
  EXPECT_EQ(mediidx::test::sent_statements().size(), 1U);
}

TEST_F(Playlist, IsCountedWithoutTheDatabaseWhenNoEntryIsAskedFor) {
  rows("DROP TABLE music");
  mediidx::test::clear_sent_statements();
  EXPECT_THAT(read(write("x.m3u", "a.mp3\n\\\\nas\nb.mp3\n"), kAll, 0, -1), IsEmpty());
  EXPECT_EQ(count, 2);
  EXPECT_THAT(mediidx::test::sent_statements(), IsEmpty());
}

TEST_F(Playlist, SavedAsARowHoldsTheNumberOfItsEntries) {
  auto info = std::make_unique<__tag_TAVO_MEDIA_INFO>();
  const auto list = write("x.m3u", "a.mp3\n\\\\nas\nhttp://radio/b\n#c\nd.mp3\n");
  std::strcpy(info->path, list.c_str());
  EXPECT_EQ(MediaInfoDBSave(MEDIA_TABLE_PLAYLIST, info.get()), 0);
  EXPECT_EQ(value("SELECT song_count FROM playlist"), "3");
}

TEST_F(Playlist, SavedAsARowHoldsNoEntriesWhenItCannotBeRead) {
  auto info = std::make_unique<__tag_TAVO_MEDIA_INFO>();
  std::strcpy(info->path, at("none.m3u").c_str());
  EXPECT_EQ(MediaInfoDBSave(MEDIA_TABLE_PLAYLIST, info.get()), 0);
  EXPECT_EQ(value("SELECT song_count FROM playlist"), "0");
}

struct SimpleResolution : Playlist {
  std::string resolve(std::string entry) {
    std::string out(MEDIIDX_PATH_SIZE, 'x');
    result = ABSPlayListPath("/v/s/x.m3u", entry.data(), out.data());
    given = entry.c_str();
    return out.c_str();
  }
  int result = -1;
  std::string given;
};

TEST_F(SimpleResolution, TurnsBackslashesInTheCallersText) {
  EXPECT_EQ(resolve("..\\b\\a.mp3"), "/v/b/a.mp3");
  EXPECT_EQ(result, 0);
  EXPECT_EQ(given, "../b/a.mp3");
}

TEST_F(SimpleResolution, TakesEntriesBelowTheMusicLinkAsTheyAre) {
  EXPECT_EQ(resolve("/volume1/music/../a.mp3"), "/volume1/music/../a.mp3");
  EXPECT_EQ(result, 0);
}

TEST_F(SimpleResolution, GivesTheEntryWithoutAMusicLink) {
  std::filesystem::remove(root.at("var/services/music"));
  EXPECT_EQ(resolve("b\\a.mp3"), "b/a.mp3");
  EXPECT_EQ(result, 1);
  EXPECT_THAT(logged_messages(), ElementsAre("Failed to get real path."));
  EXPECT_THAT(logged()[0].text, testing::StartsWith("mediidx_playlist_parse ("));
}

TEST_F(SimpleResolution, GivesNothingForAResultThatDoesNotFit) {
  EXPECT_EQ(resolve(std::string(4095, 'a')), "");
  EXPECT_EQ(result, 1);
}

}  // namespace
