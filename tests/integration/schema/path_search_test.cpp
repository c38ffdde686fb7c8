// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// How paths are looked for, on a database of 100,000 songs.
#include <gmock/gmock.h>

#include "big_library.h"
#include "database.h"

namespace mediidx::test {
namespace {

using testing::Contains;
using testing::Field;
using testing::IsEmpty;

struct PathColumn {
  const char* table;
  const char* column;
  const char* index;
};

void expect_searched(const PathColumn& searched, const std::string& condition) {
  const auto statement = std::string("SELECT * FROM ") + searched.table + " WHERE " +
                         searched.column + " " + condition;
  EXPECT_THAT(BigLibrary::get().scans(statement), Contains(Field(&Scan::index, searched.index)))
      << statement;
  EXPECT_THAT(BigLibrary::get().wide_scans(statement), IsEmpty()) << statement;
}

class PathSearch : public testing::TestWithParam<PathColumn> {};
TEST_P(PathSearch, FindsAnEqualPathByIndex) {
  expect_searched(GetParam(), "= '/volume3/films/7/Summer_Film 107.mkv'");
}
TEST_P(PathSearch, FindsOneOfSeveralPathsByIndex) {
  expect_searched(GetParam(), "in ('/volume3/films/7/a.mkv', '/volume3/films/8/b.mkv')");
}
TEST_P(PathSearch, FindsAPatternWithoutWildcardsByIndex) {
  expect_searched(GetParam(), R"(like '/volume3/films/7/100\% Summer\_Film\\107.mkv')");
}
TEST_P(PathSearch, FindsWhatLiesBelowAFolderByIndex) {
  expect_searched(GetParam(), R"(like '/volume3/films/7/100\% 夏の\_映画/%')");
}
INSTANTIATE_TEST_SUITE_P(
    Columns, PathSearch,
    testing::Values(
        PathColumn{"music", "path", "music_path"}, PathColumn{"video", "path", "video_path"},
        PathColumn{"photo", "path", "photo_path"}, PathColumn{"playlist", "path", "playlist_path"},
        PathColumn{"directory", "path", "directory_path"},
        PathColumn{"personal_playlist", "path", "personal_playlist_path"},
        PathColumn{"personal_directory", "path", "personal_directory_path"},
        PathColumn{"track", "path", "track_path"},
        PathColumn{"video_convert", "video_path", "video_convert_video_path"},
        PathColumn{"virtual_info_track", "cue_sheet_path", "virtual_info_track_cue_sheet_path"}),
    [](const auto& test) { return std::string(test.param.table); });

class SuffixSearch : public testing::TestWithParam<PathColumn> {};
TEST_P(SuffixSearch, FindsTheEndOfALatinNameByIndex) {
  expect_searched(GetParam(), R"(like '%/Summer\_Film 107.mkv')");
}
TEST_P(SuffixSearch, FindsTheEndOfACjkNameByIndex) {
  expect_searched(GetParam(), "like '%/夏の映画と日本の音楽の秋の夜 7.mp3'");
}
TEST_P(SuffixSearch, FindsAPartOfACjkNameByIndex) {
  expect_searched(GetParam(), "like '%秋葉原の音楽と花火の夜%.mp3'");
}
INSTANTIATE_TEST_SUITE_P(Columns, SuffixSearch,
                         testing::Values(PathColumn{"music", "path", "music_path_trigram"},
                                         PathColumn{"video", "path", "video_path_trigram"},
                                         PathColumn{"photo", "path", "photo_path_trigram"},
                                         PathColumn{"playlist", "path", "playlist_path_trigram"},
                                         PathColumn{"directory", "path", "directory_path_trigram"},
                                         PathColumn{"virtual_music", "comment",
                                                    "virtual_music_comment_trigram"}),
                         [](const auto& test) { return std::string(test.param.table); });

TEST(SuffixSearchOfVirtualTracks, UsesTheIndexForALongPath) {
  std::string folders;
  for (int i = 1000; i < 1050; ++i) folders += "/夏" + std::to_string(i);
  expect_searched({"virtual_music", "comment", "virtual_music_comment_trigram"},
                  "LIKE '%" + folders + "/album.cue'");
}

class OfflinePurge : public testing::TestWithParam<const char*> {};
TEST_P(OfflinePurge, ReadsOnlyOfflineRows) {
  const auto purge = std::string("DELETE FROM ") + GetParam() + " WHERE fs_online = false ";
  for (const auto& statement : {purge, purge + "AND  path LIKE '/volume%/sounds/%'"}) {
    EXPECT_THAT(BigLibrary::get().wide_scans(statement), IsEmpty()) << statement;
  }
}
INSTANTIATE_TEST_SUITE_P(Tables, OfflinePurge,
                         testing::Values("music", "video", "photo", "playlist", "directory"));

}  // namespace
}  // namespace mediidx::test
