// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "catalogue_fixture.h"

#include <gmock/gmock.h>
#include <syslog.h>

#include <algorithm>

#include "mediidx/database.h"

namespace mediidx::test {

Record record(std::string_view path, std::string_view artist, std::string_view album,
              std::string_view album_artist) {
  Record info{};
  set(info.path, path);
  set(info.artist, artist);
  set(info.album, album);
  set(info.album_artist, album_artist);
  return info;
}

Record virtual_record(std::string_view path, int track, std::string_view artist,
                      std::string_view album, std::string_view album_artist) {
  Record info = record(path, artist, album, album_artist);
  info.track = track;
  set(info.comment, "00:00:00");
  return info;
}

CatalogueTest::CatalogueTest() : conn(MediaDBConnGet()) {
  platform_fakes() = {};
  clear_log();
  clear_sent_statements();
}

CatalogueTest::~CatalogueTest() { platform_fakes() = {}; }

int CatalogueTest::insert(Record info) {
  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 0), 0);
  return static_cast<int>(info.id);
}

int CatalogueTest::insert(Record info, const Record& cue_sheet) {
  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, &cue_sheet, 1, 0), 0);
  return static_cast<int>(info.id);
}

std::string CatalogueTest::only(const std::string& column, const std::string& table) {
  return value("SELECT " + column + " FROM " + table);
}

std::vector<std::string> CatalogueTest::album_artists(const std::string& album) {
  std::vector<std::string> all;
  for (const auto& row : rows("SELECT album_artist || '/' || from_album_artist FROM album_track "
                              "WHERE album = " +
                              quoted(album) + " ORDER BY track")) {
    all.push_back(row[0]);
  }
  return all;
}

void CatalogueTest::expect_failed_statement(const std::vector<std::string>& messages) {
  ASSERT_FALSE(logged().empty());
  ASSERT_FALSE(sent_statements().empty());
  const auto& line = logged().front();
  EXPECT_EQ(line.priority, LOG_ERR);
  EXPECT_THAT(line.text, testing::MatchesRegex("mediidx_database \\([0-9]+\\) Failed to exec "
                                               "\\[(.|\n)*\\] \\((.|\n)+\\)"));
  EXPECT_THAT(line.text,
              testing::HasSubstr(" Failed to exec [" + sent_statements().back() + "] ("));
  expect_messages(messages, 1);
}

void CatalogueTest::expect_messages(const std::vector<std::string>& messages, std::size_t first) {
  ASSERT_EQ(logged().size(), first + messages.size());
  for (std::size_t i = 0; i < messages.size(); ++i) {
    const auto& line = logged()[first + i];
    EXPECT_EQ(line.priority, LOG_ERR);
    EXPECT_THAT(line.text, testing::StartsWith("mediidx_database:"));
    EXPECT_EQ(logged_messages()[first + i], messages[i]);
  }
}

}  // namespace mediidx::test
