// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The virtual tracks of cue sheets.
#include <deque>

#include "media_test.h"

namespace mediidx::test {
namespace {

class VirtualTracks : public MediaTest {
 protected:
  VirtualTracks() : cue(record(shared("disc.cue"))) {}

  /// Appends a track of an audio file, which begins at `start` in it.
  Info& add(const std::string& path, const char* start, int number) {
    list_.push_back({record(path), nullptr});
    if (list_.size() > 1) list_[list_.size() - 2].next = &list_.back();
    auto& info = list_.back().info;
    set(info.comment, start);
    info.track = number;
    return info;
  }
  int save() { return MediaInfoVirtualDBSave(list_.empty() ? nullptr : &list_.front(), &cue); }

  Info cue;

 private:
  std::deque<_PLAYLIST_REC> list_;
};

class SavingVirtualTracks : public VirtualTracks {};

TEST_F(SavingVirtualTracks, SucceedsWithoutAList) {
  EXPECT_EQ(MediaInfoVirtualDBSave(nullptr, &cue), 0);
  EXPECT_THAT(log_lines(), ElementsAre(colon("Input list is NULL.")));
}

TEST_F(SavingVirtualTracks, RefusesAMissingCueSheet) {
  _PLAYLIST_REC list{record(shared("m.flac")), nullptr};
  EXPECT_EQ(MediaInfoVirtualDBSave(&list, nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(colon("Bad parameter.")));
}

TEST_F(SavingVirtualTracks, StoresThemInOrder) {
  auto& first = add(shared("m.flac"), "00:00:00", 1);
  set(first.title, " ti ");
  set(first.album, "al");
  set(first.artist, "ar");
  set(first.album_artist, "aa");
  set(first.composer, "co");
  first.year = 1999;
  set(first.genre, "ge");
  first.duration = 59.9F;
  add(shared("m.flac"), "03:10:37", 2);
  ASSERT_EQ(save(), 0);
  EXPECT_EQ(rows("SELECT path, title, album, artist, album_artist, composer, year, genre, comment, "
                 "duration, track FROM virtual_music ORDER BY id"),
            (std::vector<Row>{{shared("m.flac"), "ti", "al", "ar", "aa", "co", "1999", "ge",
                               "00:00:00" + shared("disc.cue"), "59", "1"},
                              {shared("m.flac"), "", "", "", "", "", "0", "",
                               "03:10:37" + shared("disc.cue"), "0", "2"}}));
  EXPECT_EQ(rows("SELECT path, is_virtual, track.track, audio_offset, cue_sheet_path FROM track "
                 "JOIN virtual_info_track ON track.id = virtual_info_track.track ORDER BY id"),
            (std::vector<Row>{{shared("m.flac"), "TRUE", "1", "00:00:00", shared("disc.cue")},
                              {shared("m.flac"), "TRUE", "2", "03:10:37", shared("disc.cue")}}));
}

TEST_F(SavingVirtualTracks, TrimsTheCueSheetsTexts) {
  add(shared("m.flac"), "00:00:00", 1);
  set(cue.title, " ti ");
  ASSERT_EQ(save(), 0);
  EXPECT_STREQ(cue.title, "ti");
}

TEST_F(SavingVirtualTracks, PutsTheWholeCommentBeforeThePath) {
  auto& info = add(shared("m.flac"), " 00:00:00 ", 1);
  ASSERT_EQ(save(), 0);
  EXPECT_EQ(value("SELECT comment FROM virtual_music"), " 00:00:00 " + shared("disc.cue"));
  EXPECT_STREQ(info.comment, "00:00:00");
}

TEST_F(SavingVirtualTracks, CutsALongCommentAtACharacter) {
  const auto start = shared("");
  const std::string two_bytes = "é";
  std::string name;
  while (start.size() + name.size() < 300) name += two_bytes;
  cue = record(start + name);
  add(shared("a.flac"), "00:00:00", 1);
  add(shared("b.flac"), "00:00:0", 2);
  ASSERT_EQ(save(), 0);
  // One of the two comments would be cut in the middle of a character.
  EXPECT_EQ(count("virtual_music", "octet_length(comment) = 254"), 1);
  EXPECT_EQ(count("virtual_music", "octet_length(comment) = 253"), 1);
}

TEST_F(SavingVirtualTracks, SkipsTracksOutsideTheIndex) {
  add("/elsewhere/m.flac", "00:00:00", 1);
  add(shared("m.flac"), "00:00:00", 2);
  ASSERT_EQ(save(), 0);
  EXPECT_EQ(value("SELECT track FROM virtual_music"), "2");
  EXPECT_EQ(value("SELECT track FROM track"), "2");
}

TEST_F(SavingVirtualTracks, StoresPersonalOnesInTheCatalogueOnly) {
  add(personal("m.flac"), "00:00:00", 1);
  ASSERT_EQ(save(), 0);
  EXPECT_EQ(count("virtual_music"), 0);
  EXPECT_EQ(value("SELECT userid FROM track"), "1026");
}

TEST_F(SavingVirtualTracks, FailsWithoutAConnection) {
  add(shared("m.flac"), "00:00:00", 1);
  const NoServer no_server;
  EXPECT_EQ(save(), -1);
  EXPECT_THAT(log_lines(), ElementsAre(colon("Failed to connect to database.")));
}

TEST_F(SavingVirtualTracks, FailsWhenItsStatementCannotBeBuilt) {
  add(shared("m.flac"), "00:00:00", 1);
  const Failing fill("TAVODBEscapeStringEX3");
  EXPECT_EQ(save(), -1);
  EXPECT_THAT(log_lines(), ElementsAre(colon("Failed to TAVODBEscapeStringEX3()")));
}

TEST_F(SavingVirtualTracks, LogsAFailedStatement) {
  add(shared("m.flac"), "00:00:00", 1);
  take_away("virtual_music");
  EXPECT_EQ(save(), -1);
  ASSERT_EQ(sent_statements().size(), 1U);
  EXPECT_THAT(log_lines(), ElementsAre(colon("Failed to exec [" + sent_statements()[0] + "] (" +
                                             TAVODBErrorGet(gpDBConnect) + ").")));
}

TEST_F(SavingVirtualTracks, KeepsWhatWentBeforeAFailure) {
  add(shared("m.flac"), "00:00:00", 1);
  add(shared("m.flac"), "00:01:00\xFF", 2);
  EXPECT_EQ(save(), -1);
  EXPECT_EQ(value("SELECT track FROM virtual_music"), "1");
}

TEST_F(SavingVirtualTracks, FailsWhenTheCatalogueDoes) {
  add(shared("m.flac"), "00:00:00", 1);
  take_away("virtual_info_track");
  EXPECT_EQ(save(), -1);
  EXPECT_EQ(last_log_line(), colon("Failed to insert data into track related tables"));
}

class DeletingVirtualTracks : public VirtualTracks {};

TEST_F(DeletingVirtualTracks, RemovesThoseOfTheCueSheetOnly) {
  add(shared("m.flac"), "00:00:00", 1);
  add(shared("m.flac"), "03:10:37", 2);
  ASSERT_EQ(save(), 0);
  auto other_cue = record(shared("other.cue"));
  _PLAYLIST_REC other{record(shared("other.flac")), nullptr};
  ASSERT_EQ(MediaInfoVirtualDBSave(&other, &other_cue), 0);
  EXPECT_EQ(MediaInfoVirtualDBDelete(shared("disc.cue").c_str()), 0);
  EXPECT_EQ(value("SELECT path FROM virtual_music"), shared("other.flac"));
  EXPECT_EQ(value("SELECT path FROM track"), shared("other.flac"));
  EXPECT_EQ(value("SELECT cue_sheet_path FROM virtual_info_track"), shared("other.cue"));
}

TEST_F(DeletingVirtualTracks, LeavesTheAudioFileItself) {
  auto info = record(shared("m.flac"));
  MediaInfoDBSave(MEDIA_TABLE_MUSIC, &info);
  add(shared("m.flac"), "00:00:00", 1);
  ASSERT_EQ(save(), 0);
  EXPECT_EQ(MediaInfoVirtualDBDelete(shared("disc.cue").c_str()), 0);
  EXPECT_EQ(count("music"), 1);
  EXPECT_EQ(value("SELECT is_virtual FROM track"), "FALSE");
}

TEST_F(DeletingVirtualTracks, TakesWildcardsQuotesAndBackslashesAsThemselves) {
  for (const char* path : {"/%", "/_", "/'", "/\\", "/x"}) {
    rows("INSERT INTO virtual_music(comment) VALUES('00:00:00' || " + quoted(path) + ")");
  }
  for (const char* path : {"/%", "/_", "/'", "/\\"}) {
    EXPECT_EQ(MediaInfoVirtualDBDelete(path), 0) << path;
    EXPECT_EQ(count("virtual_music", "comment = '00:00:00' || " + quoted(path)), 0) << path;
  }
  EXPECT_EQ(count("virtual_music"), 1);
}

TEST_F(DeletingVirtualTracks, RefusesNull) {
  EXPECT_EQ(MediaInfoVirtualDBDelete(nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(colon("Bad parameter.")));
}

TEST_F(DeletingVirtualTracks, FailsWithoutAConnection) {
  const NoServer no_server;
  EXPECT_EQ(MediaInfoVirtualDBDelete("/a.cue"), -1);
  EXPECT_THAT(log_lines(), ElementsAre(colon("Failed to connect to database.")));
}

TEST_F(DeletingVirtualTracks, FailsWhenAlbumsCannotBeUpdated) {
  take_away("album_track");
  EXPECT_EQ(MediaInfoVirtualDBDelete("/a.cue"), -1);
  EXPECT_EQ(last_log_line(), colon("Failed to update album_track table"));
}

TEST_F(DeletingVirtualTracks, LogsAFailedStatement) {
  take_away("virtual_music");
  EXPECT_EQ(MediaInfoVirtualDBDelete("/a.cue"), -1);
  EXPECT_EQ(last_log_line(), colon("Failed to exec [" + last_statement() + "] (" +
                                   TAVODBErrorGet(gpDBConnect) + ")"));
}

}  // namespace
}  // namespace mediidx::test
