// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Removing rows by path.
#include "media_test.h"

namespace mediidx::test {
namespace {

struct Target {
  const char* table;
  const char* column;
  MEDIA_TABLE_TYPE type;
};

constexpr Target kTargets[] = {
    {"music", "path", MEDIA_TABLE_MUSIC},
    {"track", "path", MEDIA_TABLE_MUSIC},
    {"video", "path", MEDIA_TABLE_VIDEO},
    {"photo", "path", MEDIA_TABLE_PHOTO},
    {"playlist", "path", MEDIA_TABLE_PLAYLIST},
    {"personal_playlist", "path", MEDIA_TABLE_PLAYLIST},
    {"directory", "path", MEDIA_TABLE_DIRECTORY},
    {"video_convert", "video_path", MEDIA_TABLE_VIDEO_CONVERT},
};

std::string target_name(const testing::TestParamInfo<Target>& test) { return test.param.table; }

class DeletingRows : public MediaTest {
 protected:
  void insert(const Target& target, const std::string& path) {
    const bool flagged = std::string_view(target.table) == "track";
    rows(std::string("INSERT INTO ") + target.table + "(" + target.column +
         (flagged ? ", is_virtual" : "") + ") VALUES(" + quoted(path) +
         (flagged ? ", 'FALSE'" : "") + ")");
  }
  std::vector<std::string> left(const Target& target) {
    std::vector<std::string> paths;
    const std::string column = target.column;
    for (const auto& row :
         rows("SELECT " + column + " FROM " + target.table + " ORDER BY " + column)) {
      paths.push_back(row[0]);
    }
    return paths;
  }
};

class DeletingAPath : public DeletingRows, public testing::WithParamInterface<Target> {};

TEST_P(DeletingAPath, RemovesItsRowOnly) {
  for (const char* path : {"/a", "/a/b", "/ab", "/b"}) insert(GetParam(), path);
  EXPECT_EQ(MediaInfoDBDelete(GetParam().type, "/a"), 0);
  EXPECT_THAT(left(GetParam()), ElementsAre("/a/b", "/ab", "/b"));
}

TEST_P(DeletingAPath, TakesWildcardsQuotesAndBackslashesAsThemselves) {
  const std::vector<std::string> hostile{"/%",    "/_",      "/'",          "/\\",
                                         "/a\\%", "/%/_'\\", "/' OR '1'='1"};
  for (const auto& path : hostile) insert(GetParam(), path);
  for (const char* path : {"/a", "/b", "/x/yz"}) insert(GetParam(), path);
  for (const auto& path : hostile) {
    EXPECT_EQ(MediaInfoDBDelete(GetParam().type, path.c_str()), 0) << path;
    EXPECT_THAT(left(GetParam()), testing::Not(testing::Contains(path)));
  }
  EXPECT_THAT(left(GetParam()), ElementsAre("/a", "/b", "/x/yz"));
}

TEST_P(DeletingAPath, SucceedsWithoutARow) {
  EXPECT_EQ(MediaInfoDBDelete(GetParam().type, "/none"), 0);
}

INSTANTIATE_TEST_SUITE_P(Tables, DeletingAPath, testing::ValuesIn(kTargets), target_name);

using Deleting = DeletingRows;

TEST_F(Deleting, RefusesNull) {
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_PHOTO, nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter")));
}

TEST_F(Deleting, RefusesATypeThatHasNothingToDelete) {
  for (const MEDIA_TABLE_TYPE type : {7U, 0xFFFFFFFFU}) {
    clear_log();
    EXPECT_EQ(MediaInfoDBDelete(type, "/a"), -1);
    EXPECT_THAT(log_lines(),
                ElementsAre(parens("Bad parameters."), parens("Failed to exec [(null)].")));
  }
}

TEST_F(Deleting, FailsWithoutAConnection) {
  const NoServer no_server;
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_PHOTO, "/a"), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_F(Deleting, FailsWithoutMemory) {
  const FailingAllocation allocation(Allocator::kCalloc, sizeof(MEDIA_DB_HANDLE));
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_PHOTO, "/a"), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to malloc")));
}
#endif

TEST_F(Deleting, FailsWhenItsStatementCannotBeBuilt) {
  const Failing fill("TAVODBEscapeStringEX3");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_PHOTO, "/a"), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre(parens("Bad parameters."), parens("Failed to exec [(null)].")));
}

TEST_F(Deleting, LogsAFailedStatementTwice) {
  take_away("photo");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_PHOTO, "/a"), -1);
  const std::string sql = "DELETE FROM photo WHERE path like '/a'";
  EXPECT_THAT(log_lines(),
              ElementsAre(failed_statement(sql), parens("Failed to exec [" + sql + "].")));
}

TEST_F(Deleting, MarksMusicAndVideoOnly) {
  for (const MEDIA_TABLE_TYPE type : {2U, 3U, 4U, 5U, 6U}) {
    EXPECT_EQ(MediaInfoDBDelete(type, "/a"), 0);
    EXPECT_FALSE(marked()) << type;
  }
  for (const MEDIA_TABLE_TYPE type : {0U, 1U}) {
    EXPECT_EQ(MediaInfoDBDelete(type, "/a"), 0);
    EXPECT_TRUE(marked()) << type;
    unmark();
  }
}

TEST_F(Deleting, MarksNothingWhenItFails) {
  take_away("video");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_VIDEO, "/a"), -1);
  EXPECT_FALSE(marked());
}

class DeletingMusic : public DeletingRows {};

TEST_F(DeletingMusic, LeavesTheVirtualTracksOfTheFile) {
  rows("INSERT INTO track(path, is_virtual) VALUES('/a', 'TRUE'), ('/a', 'FALSE')");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_MUSIC, "/a"), 0);
  EXPECT_EQ(value("SELECT is_virtual FROM track"), "TRUE");
}

TEST_F(DeletingMusic, TakesItsSideRowsAlong) {
  auto info = record(shared("m.mp3"));
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_MUSIC, &info), 0);
  ASSERT_EQ(MediaInfoDBDelete(MEDIA_TABLE_MUSIC, info.path), 0);
  for (const char* table :
       {"music", "track", "genre_track", "composer_track", "artist_track", "album_track"}) {
    EXPECT_EQ(count(table), 0) << table;
  }
}

TEST_F(DeletingMusic, FailsFirstWhenAlbumsCannotBeUpdated) {
  insert(kTargets[0], "/a");
  take_away("album_track");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_MUSIC, "/a"), -1);
  EXPECT_EQ(last_log_line(), colon("Failed to update album_track table"));
  EXPECT_EQ(count("music"), 1);
}

TEST_F(DeletingMusic, KeepsWhatWentBeforeAFailure) {
  insert(kTargets[1], "/a");
  take_away("music");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_MUSIC, "/a"), -1);
  EXPECT_EQ(count("track"), 0);
}

class DeletingAPlaylist : public DeletingRows {};

TEST_F(DeletingAPlaylist, TakesTheVirtualTracksOfACueSheetAlong) {
  rows("INSERT INTO virtual_music(comment) VALUES('00:00:00/a.cue'), ('00:00:00/b.cue')");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_PLAYLIST, "/a.cue"), 0);
  EXPECT_EQ(value("SELECT comment FROM virtual_music"), "00:00:00/b.cue");
}

TEST_F(DeletingAPlaylist, FailsFirstWhenVirtualTracksCannotBeDeleted) {
  insert(kTargets[4], "/a.cue");
  take_away("virtual_music");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_PLAYLIST, "/a.cue"), -1);
  EXPECT_EQ(last_log_line(), colon("Failed to delete virtual files"));
  EXPECT_EQ(count("playlist"), 1);
}

class DeletingADirectory : public DeletingRows {};

TEST_F(DeletingADirectory, LeavesThePersonalRowOfItsPath) {
  rows("INSERT INTO directory(path) VALUES('/d')");
  rows("INSERT INTO personal_directory(path) VALUES('/d')");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_DIRECTORY, "/d"), 0);
  EXPECT_EQ(count("directory"), 0);
  EXPECT_EQ(count("personal_directory"), 1);
}

class DeletingAFolder : public DeletingRows {
 protected:
  static constexpr Target kPersonalDirectory{"personal_directory", "path", MEDIA_TABLE_FOLDER};
  void insert_everywhere(const std::string& path) {
    for (const auto& target : kTargets) insert(target, path);
    insert(kPersonalDirectory, path);
    rows("INSERT INTO virtual_music(path, comment) VALUES('/elsewhere', '00:00:00' || " +
         quoted(path) + ")");
  }
  std::vector<std::string> virtual_left() {
    return left({"virtual_music", "comment", MEDIA_TABLE_FOLDER});
  }
};

TEST_F(DeletingAFolder, RemovesItsWholeTreeAndNoSibling) {
  for (const char* path : {"/f/a", "/f/sub/b", "/fa", "/fa/c", "/e"}) insert_everywhere(path);
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_FOLDER, "/f"), 0);
  for (const auto& target : kTargets) {
    EXPECT_THAT(left(target), ElementsAre("/e", "/fa", "/fa/c")) << target.table;
  }
  EXPECT_THAT(left(kPersonalDirectory), ElementsAre("/e", "/fa", "/fa/c"));
  EXPECT_THAT(virtual_left(), ElementsAre("00:00:00/e", "00:00:00/fa", "00:00:00/fa/c"));
}

TEST_F(DeletingAFolder, RemovesItsOwnRowOfFoldersOnly) {
  insert_everywhere("/f");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_FOLDER, "/f"), 0);
  for (const auto& target : kTargets) {
    const bool folders = std::string_view(target.table) == "directory";
    EXPECT_EQ(count(target.table), folders ? 0 : 1) << target.table;
  }
  EXPECT_EQ(count("personal_directory"), 0);
}

TEST_F(DeletingAFolder, TakesWildcardsQuotesAndBackslashesAsThemselves) {
  const std::vector<std::string> hostile{"/%", "/_", "/'", "/\\", "/' OR '1'='1"};
  for (const auto& folder : hostile) insert_everywhere(folder + "/a");
  insert_everywhere("/x/a");
  for (const auto& folder : hostile) {
    EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_FOLDER, folder.c_str()), 0) << folder;
  }
  for (const auto& target : kTargets) {
    EXPECT_THAT(left(target), ElementsAre("/x/a")) << target.table;
  }
  EXPECT_THAT(virtual_left(), ElementsAre("00:00:00/x/a"));
}

TEST_F(DeletingAFolder, NeverEmptiesTheIndex) {
  insert_everywhere("/f/a");
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_FOLDER, ""), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter")));
  EXPECT_THAT(sent_statements(), IsEmpty());
}

TEST_F(DeletingAFolder, RunsItsTwelveStatements) {
  EXPECT_EQ(MediaInfoDBDelete(MEDIA_TABLE_FOLDER, "/f"), 0);
  EXPECT_THAT(sent_statements(),
              ElementsAre("DELETE FROM track WHERE path like '/f/%'; "
                          "DELETE FROM music WHERE path like '/f/%'; "
                          "DELETE FROM virtual_music WHERE comment like '%/f/%'; "
                          "DELETE FROM video WHERE path like '/f/%'; "
                          "DELETE FROM video_convert WHERE video_path like '/f/%'; "
                          "DELETE FROM playlist WHERE path like '/f/%'; "
                          "DELETE FROM personal_playlist WHERE path like '/f/%'; "
                          "DELETE FROM photo WHERE path like '/f/%'; "
                          "DELETE FROM directory WHERE path like '/f/%'; "
                          "DELETE FROM directory WHERE path = '/f';"
                          "DELETE FROM personal_directory WHERE path like '/f/%'; "
                          "DELETE FROM personal_directory WHERE path = '/f';"));
}

}  // namespace
}  // namespace mediidx::test
