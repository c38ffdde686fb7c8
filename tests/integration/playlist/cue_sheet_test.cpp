// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mediidx/cue_sheet.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <iconv.h>
#include <tavocore.h>

#include <cerrno>
#include <memory>
#include <string>
#include <vector>

#include "database.h"
#include "mediidx/database.h"
#include "mediidx/playlist.h"
#include "mediidx/request.h"

namespace {

using mediidx::test::clear_log;
using mediidx::test::logged;
using mediidx::test::quoted;
using mediidx::test::Row;
using testing::ElementsAre;
using testing::IsEmpty;

std::string converted(const std::string& text, const char* to) {
  iconv_t descriptor = iconv_open(to, "UTF-8");
  std::string in = text;
  std::string out(text.size() * 4 + 16, '\0');
  char* from = in.data();
  char* into = out.data();
  std::size_t left = in.size();
  std::size_t room = out.size();
  if (iconv(descriptor, &from, &left, &into, &room) == static_cast<std::size_t>(-1)) {
    ADD_FAILURE() << "no " << to << " for " << text;
  }
  iconv_close(descriptor);
  out.resize(out.size() - room);
  return out;
}

class CueFile : public mediidx::test::DatabaseTest {
 protected:
  CueFile() {
    root.index_everything("music", folder);
    root.make_link("usr/bin/php", MEDIIDX_CONVERTER);
    clear_log();
  }

  void set_code_page(const std::string& code) {
    root.write("etc/tavoinfo.conf", "codepage=\"" + code + "\"\n");
  }

  std::string write_sheet(const std::string& content) {
    return root.write("volume1/music/album.cue", content);
  }

  std::vector<__tag_TAVO_MEDIA_INFO> read(const std::string& path) {
    _PLAYLIST_REC* head = nullptr;
    result = TAVOParseCueByPath(&head, path.c_str());
    std::vector<__tag_TAVO_MEDIA_INFO> tracks;
    for (const auto* node = head; node; node = node->next) tracks.push_back(node->info);
    TAVOPlaylistRecFree(head);
    return tracks;
  }

  static std::string sheet_with_title(const std::string& title) {
    return "PERFORMER \"" + title +
           "\"\r\nFILE \"a.flac\" WAVE\r\n  TRACK 01 AUDIO\r\n    TITLE \"" + title +
           "\"\r\n    INDEX 01 00:00:00\r\n";
  }

  std::string folder = root.make_folder("volume1/music");
  int result = 1;
};

TEST_F(CueFile, ThatIsMissingFails) {
  EXPECT_THAT(read(folder + "/none.cue"), IsEmpty());
  EXPECT_EQ(result, -1);
  ASSERT_EQ(logged().size(), 1U);
  EXPECT_EQ(logged()[0].text, "mediidx_playlist_cue_parse:483 open cue file error");
  EXPECT_EQ(logged()[0].priority, 3);
}

TEST_F(CueFile, ThatIsEmptyFails) {
  const auto path = write_sheet("");
  EXPECT_THAT(read(path), IsEmpty());
  EXPECT_EQ(result, -1);
  EXPECT_EQ(logged().back().text,
            "mediidx_playlist_cue_parse:521 Failed to output result list of [" + path + "]");
}

TEST_F(CueFile, WithoutATrackFails) {
  const auto path = write_sheet("TITLE x\nFILE a.flac WAVE\n");
  read(path);
  EXPECT_EQ(result, -1);
  EXPECT_EQ(logged().back().text,
            "mediidx_playlist_cue_parse:521 Failed to output result list of [" + path + "]");
}

TEST_F(CueFile, ThatIsAFolderFails) {
  EXPECT_THAT(read(folder), IsEmpty());
  EXPECT_EQ(result, -1);
}

TEST_F(CueFile, OfNoMusicGivesAnEmptyListWithSuccess) {
  EXPECT_THAT(read(write_sheet("FILE x.bin BINARY\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n")),
              IsEmpty());
  EXPECT_EQ(result, 0);
}

TEST_F(CueFile, WithoutAListOrAPathFails) {
  _PLAYLIST_REC* list = nullptr;
  EXPECT_EQ(TAVOParseCueByPath(nullptr, "/a.cue"), -1);
  EXPECT_EQ(TAVOParseCueByPath(&list, nullptr), -1);
}

TEST_F(CueFile, WithAByteOrderMarkBeforeFileIsUnderstood) {
  // No converter: the file is read as it is.
  root.write("etc/tavoinfo.conf", "codepage=utf8\n");
  const auto tracks =
      read(write_sheet("\xEF\xBB\xBF"
                       "FILE \"\xC3\xA9.flac\" WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n"));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_EQ(tracks[0].path, folder + "/\xC3\xA9.flac");
}

TEST_F(CueFile, OfPlainAsciiComesThroughTheConverter) {
  const auto tracks = read(write_sheet(sheet_with_title("Song")));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_STREQ(tracks[0].title, "Song");
}

TEST_F(CueFile, IsReadDirectlyWhenTheConverterCannotBeStarted) {
  std::filesystem::remove(root.at("usr/bin/php"));
  const auto tracks = read(write_sheet(sheet_with_title("Song")));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_STREQ(tracks[0].title, "Song");
}

TEST_F(CueFile, IsReadUpToALineThatIsTooLong) {
  std::filesystem::remove(root.at("usr/bin/php"));
  const auto head = sheet_with_title("One");
  const auto tail = std::string("TRACK 02 AUDIO\nINDEX 01 01:00:00\n");
  EXPECT_EQ(read(write_sheet(head + "REM " + std::string(1019, 'x') + "\n" + tail)).size(), 2U);
  EXPECT_EQ(read(write_sheet(head + "REM " + std::string(1020, 'x') + "\n" + tail)).size(), 1U);
  EXPECT_EQ(result, 0);
}

TEST_F(CueFile, ThatIsConvertedGivesALongLineInPieces) {
  const auto head = sheet_with_title("One");
  const auto tracks = read(write_sheet(head + "REM " + std::string(3000, 'x') +
                                       "\nTRACK 02 AUDIO\nINDEX 01 01:00:00\n"));
  EXPECT_EQ(tracks.size(), 2U);
}

TEST_F(CueFile, LogsTheLineThatFailed) {
  rows("DROP TABLE music");
  std::filesystem::remove(root.at("usr/bin/php"));
  const std::string lines = "FILE a.flac WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n";
  read(write_sheet(lines + "FILE b.flac WAVE\n"));
  EXPECT_EQ(result, -1);
  EXPECT_EQ(logged().back().text,
            "mediidx_playlist_cue_parse:514 Failed to parse command [FILE b.flac WAVE]");
}

TEST_F(CueFile, LogsTheConvertedLineThatFailed) {
  rows("DROP TABLE music");
  const std::string lines = "FILE a.flac WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n";
  read(write_sheet(lines + "FILE b.flac WAVE\n"));
  EXPECT_EQ(result, -1);
  EXPECT_EQ(logged().back().text,
            "mediidx_playlist_cue_parse:498 Failed to parse command [FILE b.flac WAVE\n]");
}

struct CharsetCase {
  const char* name;
  const char* charset;    ///< Of the file; iconv's name.
  const char* code_page;  ///< Empty: none is set.
  const char* title;
  const char* mark;
  std::size_t mark_size;
  friend void PrintTo(const CharsetCase& test, std::ostream* out) { *out << test.name; }
};

class CueFileInACharset : public CueFile, public testing::WithParamInterface<CharsetCase> {};

TEST_P(CueFileInACharset, GivesItsTitlesInUtf8) {
  const auto& param = GetParam();
  if (*param.code_page) set_code_page(param.code_page);
  const auto content = std::string(param.mark, param.mark_size) +
                       converted(sheet_with_title(param.title), param.charset);

  const auto tracks = read(write_sheet(content));

  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_EQ(result, 0);
  EXPECT_STREQ(tracks[0].title, param.title);
  EXPECT_STREQ(tracks[0].album_artist, param.title);
}

constexpr const char* kFrench = "Les été français à l'hôtel";
constexpr const char* kJapanese = "日本語の歌のなまえはなんですか";
constexpr const char* kChinese = "中文歌曲的名字是什么我们不知道";
constexpr const char* kTraditional = "中文歌曲的名字是什麼我們不知道這個問題";
constexpr const char* kKorean = "한국어 노래의 제목은 무엇입니까";
constexpr const char* kPolish = "Zażółć gęślą jaźń, mój miły, w Łodzi świeci słońce";
constexpr const char* kRussian = "Песня о том, как мы пошли домой и потом";

INSTANTIATE_TEST_SUITE_P(
    Cases, CueFileInACharset,
    testing::Values(CharsetCase{"Cp1252", "CP1252", "enu", kFrench, "", 0},
                    CharsetCase{"Cp1252Danish", "CP1252", "dan", "Rødgrød med fløde på", "", 0},
                    CharsetCase{"Cp932", "CP932", "jpn", kJapanese, "", 0},
                    CharsetCase{"Cp936", "CP936", "chs", kChinese, "", 0},
                    CharsetCase{"Cp949", "CP949", "krn", kKorean, "", 0},
                    CharsetCase{"Cp950", "CP950", "cht", kTraditional, "", 0},
                    CharsetCase{"Cp1250", "CP1250", "plk", kPolish, "", 0},
                    CharsetCase{"Cp1251", "CP1251", "rus", kRussian, "", 0},
                    CharsetCase{"Ucs2BigEndian", "UCS-2BE", "", kFrench, "\xFE\xFF", 2},
                    CharsetCase{"Ucs2LittleEndian", "UCS-2LE", "", kRussian, "\xFF\xFE", 2},
                    CharsetCase{"Ucs2WithACodePage", "UCS-2LE", "jpn", kJapanese, "\xFF\xFE", 2},
                    CharsetCase{"Utf8", "UTF-8", "", kJapanese, "", 0},
                    CharsetCase{"Utf8WithACodePage", "UTF-8", "enu", kFrench, "", 0},
                    CharsetCase{"Utf8WithAMark", "UTF-8", "", kKorean, "\xEF\xBB\xBF", 3},
                    CharsetCase{"Utf8WithAMarkAndACodePage", "UTF-8", "rus", kRussian,
                                "\xEF\xBB\xBF", 3}),
    [](const auto& test) { return test.param.name; });

class LegacyCueFile : public CueFile, public testing::WithParamInterface<CharsetCase> {};

TEST_P(LegacyCueFile, IsReadAsItIsWithoutACodePageWhenEncaCannotTell) {
  const auto content = converted(sheet_with_title(GetParam().title), GetParam().charset);
  const auto tracks = read(write_sheet(content));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_EQ(std::string(tracks[0].title), converted(GetParam().title, GetParam().charset));
}

INSTANTIATE_TEST_SUITE_P(Cases, LegacyCueFile,
                         testing::Values(CharsetCase{"Cp1252", "CP1252", "", kFrench, "", 0},
                                         CharsetCase{"Cp1250", "CP1250", "", kPolish, "", 0},
                                         CharsetCase{"Cp1251", "CP1251", "", kRussian, "", 0}),
                         [](const auto& test) { return test.param.name; });

}  // namespace
