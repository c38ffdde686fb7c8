// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Rows whose volume went away: marked offline, marked online again, purged.
#include "media_test.h"

namespace mediidx::test {
namespace {

using testing::Each;
using testing::UnorderedElementsAre;

constexpr const char* kTables[] = {"music", "video", "photo", "playlist", "directory"};

class OnlineState : public MediaTest {
 protected:
  void insert(const std::string& path, bool online = true) {
    for (const char* table : kTables) {
      rows(std::string("INSERT INTO ") + table + "(path, fs_online) VALUES(" + quoted(path) +
           (online ? ", 't')" : ", 'f')"));
    }
  }
  std::vector<std::string> paths_of(const std::string& table, const std::string& where) {
    std::vector<std::string> paths;
    for (const auto& row :
         rows("SELECT path FROM " + table + " WHERE " + where + " ORDER BY path")) {
      paths.push_back(row[0]);
    }
    return paths;
  }
};

class MarkingRows : public OnlineState {
 protected:
  void expect_offline(const std::vector<std::string>& paths) {
    for (const char* table : kTables) {
      EXPECT_EQ(paths_of(table, "fs_online = false"), paths) << table;
    }
  }
};

TEST_F(MarkingRows, FlipsEveryRowWithoutAPath) {
  insert("/a");
  insert("/b");
  MediaInfoDBSetOnline("", 0, 0);
  expect_offline({"/a", "/b"});
  MediaInfoDBSetOnline(nullptr, 1, 1);
  expect_offline({});
}

TEST_F(MarkingRows, RunsOneStatementForEachTableThatHasAState) {
  MediaInfoDBSetOnline(nullptr, 1, 1);
  MediaInfoDBSetOnline("/it's 100%", 1, 0);
  EXPECT_THAT(
      sent_statements(),
      ElementsAre("UPDATE music set fs_online = 't'", "UPDATE video set fs_online = 't'",
                  "UPDATE photo set fs_online = 't'", "UPDATE playlist set fs_online = 't'",
                  "UPDATE directory set fs_online = 't'",
                  R"(UPDATE music set fs_online = 'f' where path like '/it''s 100\%%')",
                  R"(UPDATE video set fs_online = 'f' where path like '/it''s 100\%%')",
                  R"(UPDATE photo set fs_online = 'f' where path like '/it''s 100\%%')",
                  R"(UPDATE playlist set fs_online = 'f' where path like '/it''s 100\%%')",
                  R"(UPDATE directory set fs_online = 'f' where path like '/it''s 100\%%')"));
}

TEST_F(MarkingRows, MarksExactlyThePath) {
  for (const char* path : {"/a", "/a/b", "/ab"}) insert(path);
  MediaInfoDBSetOnline("/a", 0, 0);
  expect_offline({"/a"});
}

TEST_F(MarkingRows, MarksWhatBeginsWithThePathOnDemand) {
  for (const char* path : {"/a", "/a/b", "/ab", "/b"}) insert(path);
  MediaInfoDBSetOnline("/a", 1, 0);
  expect_offline({"/a", "/a/b", "/ab"});
}

TEST_F(MarkingRows, TakesWildcardsQuotesAndBackslashesAsThemselves) {
  const std::vector<std::string> hostile{"/%", "/'", "/\\", "/_"};
  for (const auto& path : hostile) insert(path);
  insert("/x");
  for (const auto& path : hostile) MediaInfoDBSetOnline(path.c_str(), 0, 0);
  expect_offline(hostile);
  for (const auto& path : hostile) MediaInfoDBSetOnline(path.c_str(), 1, 1);
  expect_offline({});
}

TEST_F(MarkingRows, LosesNoRowOfAVolumeThatComesBack) {
  for (const char* path : {"/volume1/a", "/volume1/b", "/volume2/c"}) insert(path);
  MediaInfoDBSetOnline("/volume1", 1, 0);
  MediaInfoDBSetOnline("/volume1", 1, 1);
  for (const char* table : kTables) EXPECT_EQ(count(table, "fs_online"), 3) << table;
}

TEST_F(MarkingRows, LogsThatThereIsNoConnection) {
  const NoServer no_server;
  MediaInfoDBSetOnline("/a", 0, 0);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

TEST_F(MarkingRows, GoesOnAfterATableThatFails) {
  insert("/a");
  take_away("music");
  MediaInfoDBSetOnline("/a", 0, 0);
  ASSERT_EQ(log_lines().size(), 1U);
  EXPECT_THAT(log_lines()[0],
              testing::StartsWith(parens("Failed to exec [UPDATE music set fs_online = 'f' "
                                         "where path like '/a'] (ERROR:")));
  EXPECT_EQ(count("directory", "fs_online = false"), 1);
}

TEST_F(MarkingRows, GoesOnAfterAStatementThatCannotBeBuilt) {
  insert("/a");
  const Failing format("TLIBCStrGetEx", 2);
  MediaInfoDBSetOnline(nullptr, 0, 0);
  ASSERT_EQ(log_lines().size(), 1U);
  EXPECT_THAT(log_lines()[0], testing::StartsWith(parens("Failed to exec [(null)] (")));
  EXPECT_EQ(count("video", "fs_online"), 1);
  EXPECT_EQ(count("directory", "fs_online = false"), 1);
}

TEST_F(MarkingRows, StopsWhenThePathCannotBeEscaped) {
  insert("/a");
  for (const char* escape : {"TAVODBEscapeStringEX2", "TAVODBEscapeBackslashEX2"}) {
    clear_log();
    const Failing failing(escape);
    MediaInfoDBSetOnline("/a", 0, 0);
    EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to escape condition."))) << escape;
  }
  expect_offline({});
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_F(MarkingRows, StopsWithoutMemory) {
  const std::string path(1234, 'x');
  MediaDBConnGet();
  for (const std::size_t bytes : {2U * 1234U + 1U, 3U * 1234U + 1U}) {
    clear_log();
    const FailingAllocation allocation(Allocator::kMalloc, bytes);
    MediaInfoDBSetOnline(path.c_str(), 0, 0);
    EXPECT_THAT(log_lines(),
                ElementsAre(parens("Failed to malloc(" + std::to_string(bytes) + ")")));
  }
  EXPECT_THAT(sent_statements(), IsEmpty());
}
#endif

class PurgingOfflineRows : public OnlineState {};

TEST_F(PurgingOfflineRows, LeavesOnlineRowsAlone) {
  insert("/a", false);
  insert("/b", true);
  MediaInfoDBUUIDDropOffline(nullptr);
  for (const char* table : kTables) {
    EXPECT_THAT(paths_of(table, "true"), ElementsAre("/b")) << table;
  }
}

TEST_F(PurgingOfflineRows, TakesEveryShareWithAnEmptyName) {
  insert("/volume1/share/a", false);
  insert("/elsewhere", false);
  MediaInfoDBUUIDDropOffline("");
  for (const char* table : kTables) EXPECT_EQ(count(table), 0) << table;
}

TEST_F(PurgingOfflineRows, LeavesTranscodedCopiesAlone) {
  rows("INSERT INTO video_convert(video_path) VALUES('/v')");
  MediaInfoDBSetOnline(nullptr, 0, 0);
  MediaInfoDBUUIDDropOffline(nullptr);
  EXPECT_EQ(count("video_convert"), 1);
}

TEST_F(PurgingOfflineRows, TakesAShareOfAnyVolumeAndNoSibling) {
  insert("/volume1/share/a.mp3", false);
  insert("/volume2/share/b.mp3", false);
  insert("/volume1/share/online.mp3", true);
  insert("/volume1/shared/c.mp3", false);
  insert("/volume1/share", false);
  insert("/homes/share/d.mp3", false);
  MediaInfoDBUUIDDropOffline("share");
  for (const char* table : kTables) {
    EXPECT_THAT(paths_of(table, "true"),
                UnorderedElementsAre("/homes/share/d.mp3", "/volume1/share",
                                     "/volume1/share/online.mp3", "/volume1/shared/c.mp3"))
        << table;
  }
}

TEST_F(PurgingOfflineRows, TakesWildcardsQuotesAndBackslashesAsThemselves) {
  for (const char* name : {"%", "_", "'", "\\", "x"}) {
    insert("/volume1/" + std::string(name) + "/a", false);
  }
  for (const char* name : {"%", "_", "'", "\\"}) {
    MediaInfoDBUUIDDropOffline(name);
    EXPECT_EQ(count("photo", "path = " + quoted("/volume1/" + std::string(name) + "/a")), 0);
  }
  for (const char* table : kTables) {
    EXPECT_THAT(paths_of(table, "true"), ElementsAre("/volume1/x/a")) << table;
  }
}

TEST_F(PurgingOfflineRows, RunsOneStatementForEachTableThatHasAState) {
  MediaInfoDBUUIDDropOffline(nullptr);
  MediaInfoDBUUIDDropOffline("a_b");
  EXPECT_THAT(
      sent_statements(),
      ElementsAre(
          "DELETE FROM music WHERE fs_online = false ",
          "DELETE FROM video WHERE fs_online = false ",
          "DELETE FROM photo WHERE fs_online = false ",
          "DELETE FROM playlist WHERE fs_online = false ",
          "DELETE FROM directory WHERE fs_online = false ",
          R"(DELETE FROM music WHERE fs_online = false AND  path LIKE '/volume%/a\_b/%')",
          R"(DELETE FROM video WHERE fs_online = false AND  path LIKE '/volume%/a\_b/%')",
          R"(DELETE FROM photo WHERE fs_online = false AND  path LIKE '/volume%/a\_b/%')",
          R"(DELETE FROM playlist WHERE fs_online = false AND  path LIKE '/volume%/a\_b/%')",
          R"(DELETE FROM directory WHERE fs_online = false AND  path LIKE '/volume%/a\_b/%')"));
}

TEST_F(PurgingOfflineRows, LogsThatThereIsNoConnection) {
  const NoServer no_server;
  MediaInfoDBUUIDDropOffline("share");
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

TEST_F(PurgingOfflineRows, GoesOnAfterATableThatFails) {
  insert("/a", false);
  take_away("music");
  MediaInfoDBUUIDDropOffline(nullptr);
  ASSERT_EQ(log_lines().size(), 1U);
  EXPECT_THAT(log_lines()[0],
              testing::StartsWith(
                  parens("Failed to exec [DELETE FROM music WHERE fs_online = false ] (ERROR:")));
  EXPECT_EQ(count("directory"), 0);
}

TEST_F(PurgingOfflineRows, StopsWhenTheNameCannotBeEscaped) {
  insert("/volume1/share/a", false);
  for (const char* escape : {"TAVODBEscapeString", "TAVODBEscapeBackslash"}) {
    clear_log();
    const Failing failing(escape);
    MediaInfoDBUUIDDropOffline("share");
    EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to escape condition."))) << escape;
  }
  EXPECT_EQ(count("music"), 1);
}

}  // namespace
}  // namespace mediidx::test
