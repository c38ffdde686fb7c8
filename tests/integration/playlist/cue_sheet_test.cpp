// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mediidx/cue_sheet.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "indexed_sheet.h"
#include "integration/database/faults.h"
#include "mediidx/playlist.h"

namespace {

namespace fs = std::filesystem;
using mediidx::test::Failing;
using mediidx::test::in_charset;
using mediidx::test::logged;
using testing::ElementsAre;
using testing::IsEmpty;

class CueFile : public mediidx::test::IndexedSheetTest {
 protected:
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

  /// Puts a shell script where the converter stands.
  void replace_converter(const std::string& script) {
    fs::remove(root.at("usr/bin/php"));
    fs::permissions(root.write("usr/bin/php", "#!/bin/sh\n" + script), fs::perms::owner_all);
  }

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
  root.write("etc/tavoinfo.conf", "codepage=utf8\n");
  const auto tracks =
      read(write_sheet("\xEF\xBB\xBF"
                       "FILE \"\xC3\xA9.flac\" WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n"));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_EQ(tracks[0].path, folder + "/\xC3\xA9.flac");
}

TEST_F(CueFile, OfPlainAsciiComesThroughTheConverter) {
  replace_converter("touch " + root.at("started") + "\nexec " + MEDIIDX_CONVERTER + " \"$@\"\n");
  const auto tracks = read(write_sheet(sheet_with_title("Song")));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_STREQ(tracks[0].title, "Song");
  EXPECT_TRUE(root.exists("started"));
}

TEST_F(CueFile, IsReadDirectlyWhenTheConverterCannotBeStarted) {
  fs::remove(root.at("usr/bin/php"));
  const auto tracks = read(write_sheet(sheet_with_title("Song")));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_STREQ(tracks[0].title, "Song");
}

TEST_F(CueFile, IsReadUpToALineThatIsTooLong) {
  fs::remove(root.at("usr/bin/php"));
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
  fs::remove(root.at("usr/bin/php"));
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

TEST_F(CueFile, StartsTheConverterWithItsWholeCommandLine) {
  replace_converter("printf '%s\\n' \"$@\" >" + root.at("arguments") + "\nexec " +
                    MEDIIDX_CONVERTER + " \"$@\"\n");
  set_code_page("jpn");
  const auto path = write_sheet(in_charset(sheet_with_title("日本語の歌"), "CP932"));
  EXPECT_EQ(read(path).size(), 1U);
  EXPECT_EQ(root.read("arguments"),
            "-n\n-d\nextension_dir=/lib/php/modules\n-d\nextension=iconv.so\n"
            "/var/packages/Cantivo/target/scripts/phpiconv\n--from\nCP932\n--to\nUTF-8\n" +
                path + "\n");
}

TEST_F(CueFile, OfUtf8NeedsNoConverter) {
  replace_converter("touch " + root.at("started") + "\n");
  const auto sheet = sheet_with_title("日本語の歌 Été");
  EXPECT_EQ(read(write_sheet(sheet)).size(), 1U);
  EXPECT_EQ(read(write_sheet("\xEF\xBB\xBF" + sheet)).size(), 1U);
  EXPECT_FALSE(root.exists("started"));
}

TEST_F(CueFile, KeepsItsByteOrderMarkBeforeOtherLinesThanTheFirst) {
  const auto tracks =
      read(write_sheet("REM \xC3\xA9\n\xEF\xBB\xBF"
                       "TITLE Lost\nFILE a.flac WAVE\nTRACK 01 AUDIO\n"
                       "INDEX 01 00:00:00\n"));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_STREQ(tracks[0].album, "");
}

TEST_F(CueFile, IsReadDirectlyAfterAConversionWithoutATrack) {
  replace_converter("printf 'TITLE \"Converted\"\\nPERFORMER Band\\n'\n");
  const auto tracks =
      read(write_sheet("TITLE \"Direct\"\nFILE a.flac WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n"));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_STREQ(tracks[0].album, "Direct");
  EXPECT_STREQ(tracks[0].album_artist, "Band");  // what was converted stays
}

TEST_F(CueFile, IsReadDirectlyWhenItsCharsetCannotBeConverted) {
  replace_converter("exec " + std::string(MEDIIDX_CONVERTER) +
                    " script --from NO-SUCH-SET --to UTF-8 \"${11}\" 2>/dev/null\n");
  EXPECT_EQ(read(write_sheet(sheet_with_title("Song"))).size(), 1U);
}

TEST_F(CueFile, FailsSilentlyWhenNoConverterCanBeAskedFor) {
  const auto path = write_sheet(sheet_with_title("Song"));
  const Failing open("TLIBCPopen");
  const auto tracks = read(path);
  EXPECT_EQ(open.calls(), 1);
  EXPECT_THAT(tracks, IsEmpty());
  EXPECT_EQ(result, -1);
  EXPECT_THAT(logged(), IsEmpty());
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
                       in_charset(sheet_with_title(param.title), param.charset);

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
constexpr const char* kLongRussian =
    "Песня о том, как мы пошли домой и потом долго сидели у реки, пока не взошла луна";
constexpr const char* kRussian = "Песня о том, как мы пошли домой и потом";

INSTANTIATE_TEST_SUITE_P(
    Cases, CueFileInACharset,
    testing::Values(
        CharsetCase{"Cp1252", "CP1252", "enu", kFrench, "", 0},
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
        CharsetCase{"Ucs2BigEndianWithACodePage", "UCS-2BE", "rus", kRussian, "\xFE\xFF", 2},
        CharsetCase{"Ucs2WithAnUnknownCodePage", "UCS-2LE", "nosuch", kPolish, "\xFF\xFE", 2},
        CharsetCase{"Utf8", "UTF-8", "", kJapanese, "", 0},
        CharsetCase{"Cp1254", "CP1254", "trk", "Şarkının adı güneş ığdır", "", 0},
        CharsetCase{"Cp1250Hungarian", "CP1250", "hun",
                    "Árvíztűrő tükörfúrógép és a hosszú őszi esték", "", 0},
        CharsetCase{"Cp1250Czech", "CP1250", "csy", "Příliš žluťoučký kůň úpěl ďábelské ódy", "",
                    0},
        CharsetCase{"Koi8", "KOI8-R", "rus", kRussian, "", 0},
        CharsetCase{"Ibm866", "IBM866", "rus", kRussian, "", 0},
        CharsetCase{"MacCyrillic", "MACCYRILLIC", "rus", kLongRussian, "", 0},
        CharsetCase{"Utf8UnderCodePageUtf8", "UTF-8", "utf8", kFrench, "", 0},
        CharsetCase{"Utf8WithACodePage", "UTF-8", "enu", kFrench, "", 0},
        CharsetCase{"Utf8WithAMark", "UTF-8", "", kKorean, "\xEF\xBB\xBF", 3},
        CharsetCase{"Utf8WithAMarkAndACodePage", "UTF-8", "rus", kRussian, "\xEF\xBB\xBF", 3}),
    [](const auto& test) { return test.param.name; });

class LegacyCueFile : public CueFile, public testing::WithParamInterface<CharsetCase> {};

TEST_P(LegacyCueFile, IsReadAsItIsWithoutACodePageWhenEncaCannotTell) {
  const auto content = in_charset(sheet_with_title(GetParam().title), GetParam().charset);
  const auto tracks = read(write_sheet(content));
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_EQ(std::string(tracks[0].title), in_charset(GetParam().title, GetParam().charset));
}

INSTANTIATE_TEST_SUITE_P(Cases, LegacyCueFile,
                         testing::Values(CharsetCase{"Cp1252", "CP1252", "", kFrench, "", 0},
                                         CharsetCase{"Cp932", "CP932", "", kJapanese, "", 0},
                                         CharsetCase{"Cp936", "CP936", "", kChinese, "", 0},
                                         CharsetCase{"Cp949", "CP949", "", kKorean, "", 0},
                                         CharsetCase{"Cp950", "CP950", "", kTraditional, "", 0},
                                         CharsetCase{"Cp1250", "CP1250", "", kPolish, "", 0},
                                         CharsetCase{"Cp1251", "CP1251", "", kRussian, "", 0}),
                         [](const auto& test) { return test.param.name; });

}  // namespace
