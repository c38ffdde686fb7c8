// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Rows as records: walking a handle, the columns of a row, the row of one path.
#include <cstring>

#include "media_test.h"
#include "support/owned.h"

namespace mediidx::test {
namespace {

using testing::Each;
using testing::MatchesRegex;

/// A record every byte of which is set.
Info used_record() {
  Info info;
  std::memset(&info, 0x7F, sizeof(info));
  return info;
}

bool is_zero_filled(const Info& info) {
  const Info zero{};
  return std::memcmp(&info, &zero, sizeof(info)) == 0;
}

class GettingRows : public MediaTest {
 protected:
  GettingRows() { rows("INSERT INTO photo(path, title) VALUES('/a', 'one'), ('/b', 'two')"); }
};

TEST_F(GettingRows, WalksThemInOrder) {
  const auto handle = open(MEDIA_TABLE_PHOTO, nullptr, nullptr, nullptr, "path");
  Info info;
  ASSERT_EQ(MediaInfoDBGet(handle.get(), &info), 0);
  EXPECT_STREQ(info.path, "/a");
  ASSERT_EQ(MediaInfoDBGet(handle.get(), &info), 0);
  EXPECT_STREQ(info.path, "/b");
  EXPECT_STREQ(info.title, "two");
}

TEST_F(GettingRows, EndsWithAZeroFilledRecord) {
  const auto handle = open(MEDIA_TABLE_PHOTO, nullptr, "path = '/none'");
  auto info = used_record();
  EXPECT_EQ(MediaInfoDBGet(handle.get(), &info), -1);
  EXPECT_TRUE(is_zero_filled(info));
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_F(GettingRows, ZeroFillsTheRecordWithoutAHandleToo) {
  auto info = used_record();
  EXPECT_EQ(MediaInfoDBGet(nullptr, &info), -1);
  EXPECT_TRUE(is_zero_filled(info));
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter.")));
}

TEST_F(GettingRows, RefusesAMissingRecord) {
  const auto handle = open(MEDIA_TABLE_PHOTO);
  EXPECT_EQ(MediaInfoDBGet(handle.get(), nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter.")));
}

TEST_F(GettingRows, ReadsTheCurrentRowAgain) {
  const auto handle = open(MEDIA_TABLE_PHOTO, nullptr, nullptr, nullptr, "path");
  Info first;
  MediaInfoDBGet(handle.get(), &first);
  Info again{};
  EXPECT_EQ(MediaInfoDBGetRecored(handle.get(), &again), 0);
  EXPECT_STREQ(again.path, "/a");
}

TEST_F(GettingRows, RefusesToReadWithoutAHandleOrARecord) {
  const auto handle = open(MEDIA_TABLE_PHOTO);
  Info info;
  EXPECT_EQ(MediaInfoDBGetRecored(nullptr, &info), -1);
  EXPECT_EQ(MediaInfoDBGetRecored(handle.get(), nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter."), parens("Bad parameter.")));
}

TEST_F(GettingRows, ReadsAHandleOverAFewColumns) {
  const auto handle = open(MEDIA_TABLE_PHOTO, "id, path", "path = '/b'");
  Info info;
  ASSERT_EQ(MediaInfoDBGet(handle.get(), &info), 0);
  EXPECT_EQ(std::to_string(info.id), value("SELECT id FROM photo WHERE path = '/b'"));
  EXPECT_STREQ(info.path, "/b");
  EXPECT_STREQ(info.title, "");
}

class ReadingColumns : public MediaTest {
 protected:
  /// The record of the one row of a SELECT, read over what `info` held.
  int read(const std::string& sql, Info& info) {
    OwnedResult result;
    TAVODBExecute(MediaDBConnGet(), sql.c_str(), out(result));
    uint32_t row = 0;
    TAVODBFetchRow(result.get(), &row);
    return MediaInfoDBGetRecoredData(result.get(), row, &info);
  }
  Info read(const std::string& sql) {
    Info info{};
    EXPECT_EQ(read(sql, info), 0);
    return info;
  }
};

TEST_F(ReadingColumns, RefusesAMissingResultOrRecord) {
  Info info;
  EXPECT_EQ(MediaInfoDBGetRecoredData(nullptr, 1, &info), -1);
  const auto handle = open(MEDIA_TABLE_PHOTO);
  EXPECT_EQ(MediaInfoDBGetRecoredData(handle->result, 1, nullptr), -1);
  EXPECT_THAT(log_lines(), Each(parens("Bad parameter.")));
}

TEST_F(ReadingColumns, CopiesTexts) {
  const auto info = read(
      "SELECT '/p' AS path, 't' AS title, 'al' AS album, 'ar' AS artist, 'aa' AS album_artist, "
      "'co' AS composer, 'cm' AS comment, 'ge' AS genre, 'vc' AS video_codec, "
      "'ct' AS container_type, 'ac' AS audio_codec, '2020-01-02 03:04:05' AS date, "
      "'2021-01-02 03:04:05' AS mdate, '2022-01-02 03:04:05' AS timetaken");
  EXPECT_STREQ(info.path, "/p");
  EXPECT_STREQ(info.title, "t");
  EXPECT_STREQ(info.album, "al");
  EXPECT_STREQ(info.artist, "ar");
  EXPECT_STREQ(info.album_artist, "aa");
  EXPECT_STREQ(info.composer, "co");
  EXPECT_STREQ(info.comment, "cm");
  EXPECT_STREQ(info.genre, "ge");
  EXPECT_STREQ(info.video_codec, "vc");
  EXPECT_STREQ(info.container_type, "ct");
  EXPECT_STREQ(info.audio_codec, "ac");
  EXPECT_STREQ(info.date, "2020-01-02 03:04:05");
  EXPECT_STREQ(info.mdate, "2021-01-02 03:04:05");
  EXPECT_STREQ(info.timetaken, "2022-01-02 03:04:05");
}

TEST_F(ReadingColumns, ConvertsNumbers) {
  const auto info = read(
      "SELECT 4000000000 AS id, 1 AS year, 2 AS bitrate, 3 AS track, 4 AS disc, 5 AS covercount, "
      "6 AS frame_rate_num, 7 AS frame_rate_den, 8 AS frame_bitrate, 9 AS video_bitrate, "
      "10 AS video_profile, 11 AS video_level, 12 AS frequency, -13 AS channel, "
      "14 AS resolutionx, 15 AS resolutiony, 9007199254740993 AS filesize, 215 AS duration");
  EXPECT_EQ(info.id, 4000000000U);
  EXPECT_EQ(info.year, 1);
  EXPECT_EQ(info.bitrate, 2);
  EXPECT_EQ(info.track, 3);
  EXPECT_EQ(info.disc, 4);
  EXPECT_EQ(info.covercount, 5);
  EXPECT_EQ(info.frame_rate_num, 6);
  EXPECT_EQ(info.frame_rate_den, 7);
  EXPECT_EQ(info.frame_bitrate, 8);
  EXPECT_EQ(info.video_bitrate, 9);
  EXPECT_EQ(info.video_profile, 10);
  EXPECT_EQ(info.video_level, 11);
  EXPECT_EQ(info.frequency, 12);
  EXPECT_EQ(info.channel, -13);
  EXPECT_EQ(info.resolutionX, 14);
  EXPECT_EQ(info.resolutionY, 15);
  EXPECT_EQ(info.filesize, 9007199254740993);
  EXPECT_EQ(info.duration, 215.0F);
}

TEST_F(ReadingColumns, ConvertsADurationWithDecimals) {
  EXPECT_EQ(read("SELECT '215.500000' AS duration").duration, 215.5F);
}

TEST_F(ReadingColumns, CutsTextsToTheirFieldsAtACharacter) {
  const auto info = read(
      "SELECT '/' || repeat('p', 5000) AS path, repeat('é', 200) AS title, "
      "repeat('c', 300) AS audio_codec, repeat('d', 40) AS date");
  EXPECT_EQ(std::string(info.path), "/" + std::string(4094, 'p'));
  EXPECT_EQ(std::strlen(info.title), 254U);
  EXPECT_EQ(std::strlen(info.audio_codec), 254U);
  EXPECT_EQ(std::strlen(info.date), 31U);
  EXPECT_EQ(std::strlen(read("SELECT 'x' || repeat('é', 200) AS title").title), 253U);
}

TEST_F(ReadingColumns, EmptiesFieldsWhoseColumnIsNullOrAbsent) {
  auto info = used_record();
  ASSERT_EQ(read("SELECT NULL AS title, NULL AS year, NULL AS filesize, NULL AS duration", info),
            0);
  EXPECT_STREQ(info.title, "");
  EXPECT_EQ(info.year, 0);
  EXPECT_EQ(info.filesize, 0);
  EXPECT_EQ(info.duration, 0.0F);
  EXPECT_STREQ(info.path, "");
  EXPECT_EQ(info.id, 0U);
  EXPECT_EQ(info.bitrate, 0);
  EXPECT_STREQ(info.timetaken, "");
}

TEST_F(ReadingColumns, ClearsTheReservedWords) {
  auto info = used_record();
  ASSERT_EQ(read("SELECT 1 AS id", info), 0);
  EXPECT_THAT(info.reserved, Each(0U));
}

TEST_F(ReadingColumns, LeavesFieldsThatNoColumnFeedsAlone) {
  auto info = used_record();
  ASSERT_EQ(read("SELECT 1 AS id, 'uuid' AS fs_uuid, 400 AS iso", info), 0);
  EXPECT_EQ(info.iso, 0x7F7F7F7F);
  EXPECT_EQ(info.fs_uuid[0], 0x7F);
  EXPECT_EQ(info.camera_make[0], 0x7F);
}

struct SharedFieldCase {
  const char* name;
  const char* columns;
  const char* codec;
  const char* container;
  int bitrate;
};

class FieldsOfTwoColumns : public ReadingColumns,
                           public testing::WithParamInterface<SharedFieldCase> {};

TEST_P(FieldsOfTwoColumns, TakeTheOneWithAValue) {
  const auto info = read(std::string("SELECT ") + GetParam().columns);
  EXPECT_STREQ(info.video_codec, GetParam().codec);
  EXPECT_STREQ(info.container_type, GetParam().container);
  EXPECT_EQ(info.bitrate, GetParam().bitrate);
}

INSTANTIATE_TEST_SUITE_P(
    Rows, FieldsOfTwoColumns,
    testing::Values(SharedFieldCase{"Music", "'mp3' AS codec, 'mpeg' AS container, 320 AS bitrate",
                                    "mp3", "mpeg", 320},
                    SharedFieldCase{"Video",
                                    "'h264' AS video_codec, 'mkv' AS container_type, "
                                    "128 AS audio_bitrate",
                                    "h264", "mkv", 128},
                    SharedFieldCase{"FirstOfBoth",
                                    "'mp3' AS codec, NULL AS video_codec, 'mpeg' AS container, "
                                    "'' AS container_type, 320 AS bitrate, NULL AS audio_bitrate",
                                    "mp3", "mpeg", 320},
                    SharedFieldCase{"SecondOfBoth",
                                    "NULL AS codec, 'h264' AS video_codec, '' AS container, "
                                    "'mkv' AS container_type, NULL AS bitrate, "
                                    "128 AS audio_bitrate",
                                    "h264", "mkv", 128},
                    SharedFieldCase{"Neither", "NULL AS codec, NULL AS video_codec", "", "", 0}),
    [](const auto& test) { return test.param.name; });

class GettingOne : public MediaTest {
 protected:
  GettingOne() {
    rows(R"(INSERT INTO photo(path, title) VALUES('/album/a.jpg', 'a'), ('/album/ba.jpg', 'ba'),
         ('/100%/x', 'percent'), ('/100 and/x', 'and'), ('/a_c', 'underscore'), ('/abc', 'letter'),
         ('/back\slash', 'backslash'))");
  }
  std::string title_of(const char* path, int suffix_match = 0) {
    Info info;
    return MediaInfoDBGetOneEx2(MEDIA_TABLE_PHOTO, path, &info, suffix_match) == 0 ? info.title
                                                                                   : "<none>";
  }
};

TEST_F(GettingOne, FindsExactlyThePath) {
  EXPECT_EQ(title_of("/album/a.jpg"), "a");
  EXPECT_EQ(title_of("a.jpg"), "<none>");
  EXPECT_EQ(title_of("/album"), "<none>");
}

TEST_F(GettingOne, FindsTheEndOfAPathOnDemand) {
  EXPECT_EQ(title_of("/a.jpg", 1), "a");
  EXPECT_EQ(title_of("/ba.jpg", 1), "ba");
  EXPECT_EQ(title_of("/album/", 1), "<none>");
}

TEST_F(GettingOne, TakesWildcardsAsThemselves) {
  EXPECT_EQ(title_of("/100%/x"), "percent");
  EXPECT_EQ(title_of("/a_c"), "underscore");
  EXPECT_EQ(title_of("/back\\slash"), "backslash");
  EXPECT_EQ(title_of("/%"), "<none>");
  EXPECT_EQ(title_of("_", 1), "<none>");
  EXPECT_EQ(title_of("%/x", 1), "percent");
  EXPECT_EQ(title_of("\\slash", 1), "backslash");
}

TEST_F(GettingOne, ZeroFillsTheRecordWhenThereIsNone) {
  auto info = used_record();
  EXPECT_EQ(MediaInfoDBGetOneEx2(MEDIA_TABLE_PHOTO, "/none", &info, 0), -1);
  EXPECT_TRUE(is_zero_filled(info));
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_F(GettingOne, RefusesAMissingPathOrRecord) {
  Info info;
  EXPECT_EQ(MediaInfoDBGetOneEx2(MEDIA_TABLE_PHOTO, nullptr, &info, 0), -1);
  EXPECT_EQ(MediaInfoDBGetOneEx2(MEDIA_TABLE_PHOTO, "/a", nullptr, 0), -1);
}

TEST_F(GettingOne, RefusesATypeThatCannotBeSelected) {
  Info info;
  EXPECT_EQ(MediaInfoDBGetOneEx2(MEDIA_TABLE_VIDEO_CONVERT, "/a", &info, 0), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad table type.")));
}

TEST_F(GettingOne, FailsWithoutItsCondition) {
  const Failing fill("TAVODBEscapeStringEX3");
  EXPECT_EQ(title_of("/album/a.jpg"), "<none>");
  EXPECT_THAT(log_lines(),
              ElementsAre(MatchesRegex("mediidx_database \\(N\\) Failed to TLIBCStrGetEx\\(\\)"
                                       "\\[0x[0-9A-F]{4,} .*:[0-9]+\\]")));
}

TEST_F(GettingOne, IsTheSameUnderItsShortNames) {
  Info info;
  ASSERT_EQ(MediaInfoDBGetOneEx(MEDIA_TABLE_PHOTO, "/a.jpg", &info, 1), 0);
  EXPECT_STREQ(info.title, "a");
  ASSERT_EQ(MediaInfoDBGetOne(MEDIA_TABLE_PHOTO, "/ba.jpg", &info, 1), 0);
  EXPECT_STREQ(info.title, "ba");
  EXPECT_EQ(MediaInfoDBGetOneEx(MEDIA_TABLE_PHOTO, "/a.jpg", &info, 0), -1);
  EXPECT_EQ(MediaInfoDBGetOne(MEDIA_TABLE_PHOTO, "/a.jpg", &info, 0), -1);
}

class GettingOneByField : public GettingOne {
 protected:
  Info info{};
};

TEST_F(GettingOneByField, ReadsTheColumnsOfThePath) {
  ASSERT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, "/album/a.jpg", "path", &info), 0);
  EXPECT_STREQ(info.path, "/album/a.jpg");
  EXPECT_STREQ(info.title, "");
  EXPECT_THAT(sent_statements(),
              ElementsAre("SELECT path FROM photo WHERE path like '/album/a.jpg'  "));
}

TEST_F(GettingOneByField, TakesWildcardsAndQuotesAsThemselves) {
  rows("INSERT INTO photo(path, title) VALUES('/it''s 100%', 'quote')");
  ASSERT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, "/it's 100%", "title", &info), 0);
  EXPECT_STREQ(info.title, "quote");
  ASSERT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, "/back\\slash", "title", &info), 0);
  EXPECT_STREQ(info.title, "backslash");
  EXPECT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, "/%", "title", &info), -1);
}

TEST_F(GettingOneByField, LogsThatThereIsNone) {
  EXPECT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, "/none", "path", &info), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to get mediainfo.")));
}

TEST_F(GettingOneByField, RefusesAMissingPathOrRecord) {
  EXPECT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, nullptr, "path", &info), -1);
  EXPECT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, "/a", "path", nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter."), parens("Bad parameter.")));
}

TEST_F(GettingOneByField, FailsWhenThePathCannotBeEscaped) {
  for (const char* escape : {"TAVODBEscapeString", "TAVODBEscapeBackslash"}) {
    clear_log();
    const Failing failing(escape);
    EXPECT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, "/album/a.jpg", "path", &info), -1);
    EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to escape condition."))) << escape;
  }
}

TEST_F(GettingOneByField, FailsWithoutItsCondition) {
  const Failing format("TLIBCStrGet");
  EXPECT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, "/album/a.jpg", "path", &info), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre(MatchesRegex("mediidx_database \\(N\\) Failed to TLIBCStrGetEx\\(\\)"
                                       "\\[0x[0-9A-F]{4,} .*:[0-9]+\\]")));
}

TEST_F(GettingOneByField, FailsWhenItCannotBeOpened) {
  EXPECT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, "/a_c", "nonsense", &info), -1);
  EXPECT_THAT(
      log_lines(),
      ElementsAre(failed_statement(R"(SELECT nonsense FROM photo WHERE path like '/a\_c'  )")));
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_F(GettingOneByField, FailsWithoutMemory) {
  const std::string path(1234, 'x');
  for (const std::size_t bytes : {2U * 1234U + 1U, 3U * 1234U + 1U}) {
    clear_log();
    const FailingAllocation allocation(Allocator::kMalloc, bytes);
    EXPECT_EQ(MediaInfoDBGetOneByField(MEDIA_TABLE_PHOTO, path.c_str(), "path", &info), -1);
    EXPECT_THAT(log_lines(),
                ElementsAre(parens("Failed to malloc(" + std::to_string(bytes) + ")")));
  }
}
#endif

class GettingPlaylistPaths : public MediaTest {};

TEST_F(GettingPlaylistPaths, WalksThePathsAndEndsWithNull) {
  rows("INSERT INTO playlist(path) VALUES('/a.m3u'), ('/b.m3u')");
  const auto handle = open(MEDIA_TABLE_PLAYLIST, "path", nullptr, nullptr, "path");
  EXPECT_STREQ(PlaylistDBGet(handle.get()), "/a.m3u");
  EXPECT_STREQ(PlaylistDBGet(handle.get()), "/b.m3u");
  EXPECT_EQ(PlaylistDBGet(handle.get()), nullptr);
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_F(GettingPlaylistPaths, ReadsANullPathAsEmpty) {
  rows("INSERT INTO playlist(path) VALUES(NULL)");
  const auto handle = open(MEDIA_TABLE_PLAYLIST);
  EXPECT_STREQ(PlaylistDBGet(handle.get()), "");
}

TEST_F(GettingPlaylistPaths, RefusesNull) {
  EXPECT_EQ(PlaylistDBGet(nullptr), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter.")));
}

}  // namespace
}  // namespace mediidx::test
