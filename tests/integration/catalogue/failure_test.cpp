// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// What each operation answers and logs when a statement fails, and what stays written.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "catalogue_fixture.h"

namespace mediidx::test {
namespace {

using Call = int (*)(tavodb_connection* conn, const Record& info, const Record& cue_sheet);
constexpr float kGains[] = {1, 2, 3, 4};

struct OperationCase {
  const char* name;
  const char* table;  ///< Renamed before the call.
  Call call;
};

class AFailedStatement : public CatalogueTest, public testing::WithParamInterface<OperationCase> {
 protected:
  AFailedStatement() {
    info.id = 1;
    set(info.genre, "");
  }
  int call() { return GetParam().call(conn, info, cue_sheet); }

  Record info = virtual_record("/music/it's 100%.mp3", 1, "X", "Hits");
  const Record cue_sheet = record("/music/a.cue");
};

TEST_P(AFailedStatement, IsLoggedWithItsTextAndReason) {
  rows(std::string("ALTER TABLE ") + GetParam().table + " RENAME TO gone");

  EXPECT_EQ(call(), -1);

  expect_failed_statement();
  EXPECT_THAT(logged().front().text, testing::HasSubstr(std::string("relation \"") +
                                                        GetParam().table + "\" does not exist"));
}

TEST_P(AFailedStatement, IsLoggedWithoutATextWhenItCannotBeMade) {
  platform_fakes().database_type = [] { return 99; };

  EXPECT_EQ(call(), -1);

  ASSERT_EQ(logged_messages().size(), 1U);
  EXPECT_THAT(logged_messages().front(), testing::StartsWith("Failed to exec [(null)] ("));
  EXPECT_TRUE(sent_statements().empty());
}

INSTANTIATE_TEST_SUITE_P(
    Operations, AFailedStatement,
    testing::Values(
        OperationCase{"OfAnActualInsert", "track",
                      [](auto* c, auto& i, auto&) {
                        return MediaDBInsertIntoTrackTable(c, &i, nullptr, 0, 0);
                      }},
        OperationCase{
            "OfAVirtualInsert", "track",
            [](auto* c, auto& i, auto& q) { return MediaDBInsertIntoTrackTable(c, &i, &q, 1, 0); }},
        OperationCase{"OfATrackUpdate", "track",
                      [](auto* c, auto& i, auto&) { return MediaDBUpdateTrackTable(c, &i); }},
        OperationCase{"OfAnIdLookUp", "track",
                      [](auto* c, auto& i, auto&) {
                        Record found = i;
                        return MediaDBFindInsertedTrackID(c, &found, 0);
                      }},
        OperationCase{
            "OfACounterpartCount", "track",
            [](auto* c, auto& i, auto&) { return MediaDBFindRecordsWithSamePath(c, &i, 0); }},
        OperationCase{"OfAMark", "track",
                      [](auto* c, auto& i, auto&) { return MediaDBUpdateHasVirtualColumn(c, &i); }},
        OperationCase{
            "OfPropertiesToVirtualRows", "track",
            [](auto* c, auto& i, auto&) { return MediaDBUpdateVirtualMusicProperties(c, &i, 0); }},
        OperationCase{
            "OfPropertiesFromAnActualRow", "track",
            [](auto* c, auto& i, auto&) { return MediaDBUpdateVirtualMusicProperties(c, &i, 1); }},
        OperationCase{
            "OfAGenreText", "genre_track",
            [](auto* c, auto& i, auto&) { return MediaDBInsertIntoGenreTrackTable(c, &i, 1); }},
        OperationCase{
            "OfOneGenre", "genre_track",
            [](auto* c, auto&, auto&) { return MediaDBInsertOneGenreRecord(c, "Rock", 1); }},
        OperationCase{
            "OfAComposer", "composer_track",
            [](auto* c, auto& i, auto&) { return MediaDBInsertIntoComposerTrackTable(c, &i, 1); }},
        OperationCase{
            "OfAnArtist", "artist_track",
            [](auto* c, auto& i, auto&) { return MediaDBInsertIntoArtistTrackTable(c, &i, 1); }},
        OperationCase{"OfAnAlbum", "album_track",
                      [](auto* c, auto& i, auto&) {
                        return MediaDBInsertIntoAlbumTrackTable(c, &i, "X", 1, 0);
                      }},
        OperationCase{"OfAVirtualInfo", "virtual_info_track",
                      [](auto* c, auto& i, auto& q) {
                        return MediaDBInsertIntoVirtualInfoTrackTable(c, &i, &q, 1);
                      }},
        OperationCase{"OfReplayGains", "replaygain_track",
                      [](auto* c, auto&, auto&) {
                        return MediaDBInsertIntoReplayGainTrackTable(c, kGains, 1);
                      }},
        OperationCase{"OfACollapseTest", "album_track",
                      [](auto* c, auto& i, auto&) {
                        return MediaDBFindAlbumCollapseSingleAlbumArtist(c, &i);
                      }},
        OperationCase{"OfACollapse", "album_track",
                      [](auto* c, auto& i, auto&) {
                        return MediaDBUpdateAlbumWithMultipleAlbumArtist(c, &i);
                      }},
        OperationCase{"OfAMemberTest", "album_track",
                      [](auto* c, auto& i, auto&) {
                        return MediaDBCheckRecordInMultipleAlbumArtist(c, i.path, 0);
                      }},
        OperationCase{"OfACueSheetsMemberTest", "virtual_info_track",
                      [](auto* c, auto&, auto& q) {
                        return MediaDBCheckRecordInMultipleAlbumArtist(c, q.path, 1);
                      }},
        OperationCase{"OfTheRemainingArtists", "artist_track",
                      [](auto* c, auto& i, auto&) {
                        return MediaDBCheckRecordsWithMultipleAlbumArtist(c, i.path, 0);
                      }},
        OperationCase{"OfTheArtistsBesideACueSheet", "artist_track",
                      [](auto* c, auto&, auto& q) {
                        return MediaDBCheckRecordsWithMultipleAlbumArtist(c, q.path, 1);
                      }},
        OperationCase{"OfARecovery", "artist_track",
                      [](auto* c, auto& i, auto&) {
                        return MediaDBRecoverToSingleAlbumArtist(c, i.path, 0);
                      }},
        OperationCase{"OfACueSheetsRecovery", "artist_track",
                      [](auto* c, auto&, auto& q) {
                        return MediaDBRecoverToSingleAlbumArtist(c, q.path, 1);
                      }},
        OperationCase{
            "OfPersonalFolders", "personal_directory",
            [](auto* c, auto& i, auto&) { return MediaDBFindPersonalDirWithSamePath(c, i.path); }}),
    [](const auto& test) { return std::string(test.param.name); });

/// What makes one step of a whole track fail, and the message of that step.
struct StepCase {
  const char* name;
  const char* breakage;
  const char* message;
};

class AFailedInsertion : public CatalogueTest, public testing::WithParamInterface<StepCase> {};

TEST_P(AFailedInsertion, NamesItsStep) {
  rows(GetParam().breakage);
  Record info = record("/music/a.mp3", "X", "Hits");

  EXPECT_EQ(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 0), -1);

  expect_failed_statement({GetParam().message});
}

INSTANTIATE_TEST_SUITE_P(
    Steps, AFailedInsertion,
    testing::Values(StepCase{"Track", "ALTER TABLE track RENAME TO gone",
                             "Failed to insert data into track table"},
                    StepCase{"Composer", "ALTER TABLE composer_track RENAME TO gone",
                             "Failed to insert data into composer_track table"},
                    StepCase{"Artist", "ALTER TABLE artist_track RENAME TO gone",
                             "Failed to insert data into artist_track table"},
                    StepCase{"CollapseTest", "ALTER TABLE album_track RENAME TO gone",
                             "Failed to find alubm collapsing single album artist"},
                    StepCase{"Album", "ALTER TABLE album_track ADD CHECK (album_artist <> 'X')",
                             "Failed to insert data into album_track table"}),
    [](const auto& test) { return std::string(test.param.name); });

class AFailedStep : public CatalogueTest {
 protected:
  int insert_failing(Record info) {
    clear_log();
    return MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 0, 0);
  }
  int insert_failing_part(Record info) {
    clear_log();
    return MediaDBInsertIntoTrackRelatedTables(conn, &info, &cue_sheet, 1, 0);
  }

  const Record cue_sheet = record("/music/a.cue");
};

TEST_F(AFailedStep, LeavesWhatWasWritten) {
  rows("ALTER TABLE artist_track RENAME TO gone");

  EXPECT_EQ(insert_failing(record("/music/a.mp3")), -1);

  EXPECT_EQ(count("track"), 1);
  EXPECT_EQ(count("genre_track"), 1);
  EXPECT_EQ(count("composer_track"), 1);
  EXPECT_EQ(count("album_track"), 0);
}

TEST_F(AFailedStep, IsARowThatIsNotFound) {
  rows("CREATE RULE vanish AS ON INSERT TO track DO INSTEAD NOTHING");

  EXPECT_EQ(insert_failing(record("/music/a.mp3")), -1);

  expect_messages({"Failed to find inserted track id"});
}

TEST_F(AFailedStep, IsACountOfCounterparts) {
  platform_fakes().field = [this](const char*, const char* real) {
    rows("ALTER TABLE track RENAME TO gone");
    return real;
  };

  EXPECT_EQ(insert_failing(record("/music/a.mp3")), -1);

  expect_failed_statement({"Failed to find records with the same path"});
}

TEST_F(AFailedStep, IsAMarkOfTheActualRow) {
  insert(record("/music/a.flac"));
  rows("ALTER TABLE track ADD CHECK (has_virtual = 'FALSE')");

  EXPECT_EQ(insert_failing_part(virtual_record("/music/a.flac", 1)), -1);

  expect_failed_statement({"Failed to update has_virtual column of corresponding actual record"});
}

TEST_F(AFailedStep, IsACopyToVirtualRows) {
  insert(virtual_record("/music/a.flac", 1), cue_sheet);
  rows("ALTER TABLE track ADD CHECK (is_virtual = 'FALSE' OR channel IS NULL)");

  EXPECT_EQ(insert_failing(record("/music/a.flac")), -1);

  expect_failed_statement({"Failed to update music properties of corresponding virtual records"});
}

TEST_F(AFailedStep, IsACopyIntoAVirtualRow) {
  insert(record("/music/a.flac"));
  rows("ALTER TABLE track ADD CHECK (is_virtual = 'FALSE' OR channel IS NULL)");

  EXPECT_EQ(insert_failing_part(virtual_record("/music/a.flac", 1)), -1);

  expect_failed_statement({"Failed to update music properties of corresponding virtual records"});
}

TEST_F(AFailedStep, IsAnEmptyGenre) {
  rows("ALTER TABLE genre_track RENAME TO gone");

  EXPECT_EQ(insert_failing(record("/music/a.mp3")), -1);

  expect_failed_statement({"Failed to insert data into genre_track table"});
}

TEST_F(AFailedStep, IsOneOfItsGenres) {
  rows("ALTER TABLE genre_track RENAME TO gone");
  Record info = record("/music/a.mp3");
  set(info.genre, "Rock");

  EXPECT_EQ(insert_failing(info), -1);

  expect_failed_statement({"Failed to insert one genre record into genre_track table",
                           "Failed to insert data into genre_track table"});
}

TEST_F(AFailedStep, IsATaggedAlbum) {
  rows("ALTER TABLE album_track RENAME TO gone");

  EXPECT_EQ(insert_failing(record("/music/a.mp3", "X", "Hits", "Band")), -1);

  expect_failed_statement({"Failed to insert data into album_track table"});
}

TEST_F(AFailedStep, IsACollapse) {
  insert(record("/music/a.mp3", "X", "Hits"));
  rows("ALTER TABLE album_track ADD CHECK (from_album_artist = 'FALSE')");

  EXPECT_EQ(insert_failing(record("/music/b.mp3", "Y", "Hits")), -1);

  expect_failed_statement({"Failed to update album with multiple album artist"});
}

TEST_F(AFailedStep, IsAnAlbumThatIsCollapsed) {
  insert(record("/music/a.mp3", "X", "Hits"));
  insert(record("/music/b.mp3", "Y", "Hits"));
  rows("ALTER TABLE album_track ADD CHECK (album_artist <> '') NOT VALID");

  EXPECT_EQ(insert_failing(record("/music/c.mp3", "X", "Hits")), -1);

  expect_failed_statement({"Failed to insert data into album_track table"});
}

TEST_F(AFailedStep, IsAVirtualInfo) {
  rows("ALTER TABLE virtual_info_track RENAME TO gone");

  EXPECT_EQ(insert_failing_part(virtual_record("/music/a.flac", 1)), -1);

  expect_failed_statement({"Failed to insert data into virtual_info_track table"});
}

TEST_F(AFailedStep, IsARatingThatCannotBeRead) {
  EXPECT_EQ(insert_failing(record("")), -1);

  ASSERT_GE(logged_messages().size(), 2U);
  const auto messages = logged_messages();
  EXPECT_EQ(messages[messages.size() - 2], "Failed to get song rating from path []");
  EXPECT_EQ(messages.back(), "Failed to insert rating data into rating_track table");
  EXPECT_EQ(count("album_track"), 1);
}

class AFailedRecovery : public CatalogueTest {
 protected:
  AFailedRecovery() {
    insert(record("/1", "X", "Hits"));
    info.id = static_cast<std::uint32_t>(insert(info));
  }

  Record info = record("/2", "Y", "Hits");
};

TEST_F(AFailedRecovery, IsAMemberTest) {
  rows("ALTER TABLE album_track RENAME TO gone");

  EXPECT_EQ(MediaDBUpdateAlbumTrackTable(conn, "/2", 0), -1);

  expect_failed_statement({"Failed to check data in multiple album artist"});
}

TEST_F(AFailedRecovery, IsACueSheetsMemberTest) {
  rows("ALTER TABLE virtual_info_track RENAME TO gone");

  EXPECT_EQ(MediaDBUpdateAlbumTrackTable(conn, "/2", 1), -1);

  expect_failed_statement({"Failed to check data in multiple album artist"});
}

TEST_F(AFailedRecovery, IsACountOfArtists) {
  rows("ALTER TABLE artist_track RENAME TO gone");

  EXPECT_EQ(MediaDBUpdateAlbumTrackTable(conn, "/2", 0), -1);

  expect_failed_statement({"Failed to check if other records has multiple album artist"});
}

TEST_F(AFailedRecovery, IsAnUpdate) {
  rows("ALTER TABLE album_track ADD CHECK (from_album_artist = 'TRUE')");

  EXPECT_EQ(MediaDBUpdateAlbumTrackTable(conn, "/2", 0), -1);

  expect_failed_statement({"Failed to recover to single album artist"});
}

TEST_F(AFailedRecovery, KeepsTheSideRows) {
  rows("ALTER TABLE album_track ADD CHECK (from_album_artist = 'TRUE')");

  EXPECT_EQ(MediaDBDeleteRecordsInRelatedTables(conn, &info), -1);

  expect_failed_statement(
      {"Failed to recover to single album artist", "Failed to update album_track table"});
  EXPECT_EQ(count("genre_track"), 2);
}

TEST_F(AFailedRecovery, EndsAnUpdate) {
  rows("ALTER TABLE album_track ADD CHECK (from_album_artist = 'TRUE')");

  EXPECT_EQ(MediaDBUpdateTrackRelatedTables(conn, &info), -1);

  expect_failed_statement({"Failed to recover to single album artist",
                           "Failed to update album_track table",
                           "Failed to delete records in track related tables"});
}

TEST_F(AFailedRecovery, IsNotReachedByAFailedTrackUpdate) {
  rows("ALTER TABLE track RENAME TO gone");

  EXPECT_EQ(MediaDBUpdateTrackRelatedTables(conn, &info), -1);

  expect_failed_statement({"Failed to update data in track table"});
}

TEST_F(AFailedRecovery, IsNotAFailedDelete) {
  rows("ALTER TABLE genre_track RENAME TO gone");

  EXPECT_EQ(MediaDBDeleteRecordsInRelatedTables(conn, &info), -1);

  expect_failed_statement();
  // The statements before it were run, the one behind it was not.
  EXPECT_EQ(count("album_track"), 1);
  EXPECT_EQ(count("artist_track"), 1);
  EXPECT_EQ(count("composer_track"), 2);
}

TEST_F(AFailedRecovery, EndsAnUpdateWithAFailedDeleteToo) {
  rows("ALTER TABLE genre_track RENAME TO gone");

  EXPECT_EQ(MediaDBUpdateTrackRelatedTables(conn, &info), -1);

  expect_failed_statement({"Failed to delete records in track related tables"});
}

TEST_F(AFailedRecovery, IsNotAFailedGenreOfAnUpdate) {
  rows("ALTER TABLE genre_track ADD CHECK (genre <> 'Pop')");
  set(info.genre, "Pop");

  EXPECT_EQ(MediaDBUpdateTrackRelatedTables(conn, &info), -1);

  expect_failed_statement({"Failed to insert one genre record into genre_track table",
                           "Failed to insert data into genre_track table"});
}

class MissingArguments : public CatalogueTest {
 protected:
  void expect_refused(int answer) {
    EXPECT_EQ(answer, -1);
    EXPECT_EQ(logged_messages(), std::vector<std::string>{"Bad parameters."});
    EXPECT_TRUE(sent_statements().empty());
    clear_log();
  }
};

TEST_F(MissingArguments, AreRefused) {
  Record info{};
  expect_refused(MediaDBInsertIntoTrackRelatedTables(conn, nullptr, nullptr, 0, 0));
  expect_refused(MediaDBInsertIntoTrackRelatedTables(conn, &info, nullptr, 1, 0));
  expect_refused(MediaDBUpdateTrackRelatedTables(conn, nullptr));
  expect_refused(MediaDBDeleteRecordsInRelatedTables(conn, nullptr));
  expect_refused(MediaDBUpdateAlbumTrackTable(conn, nullptr, 0));
  expect_refused(MediaDBInsertIntoTrackTable(conn, nullptr, nullptr, 0, 0));
  expect_refused(MediaDBInsertIntoTrackTable(conn, &info, nullptr, 1, 0));
  expect_refused(MediaDBUpdateTrackTable(conn, nullptr));
  expect_refused(MediaDBFindInsertedTrackID(conn, nullptr, 0));
  expect_refused(MediaDBFindRecordsWithSamePath(conn, nullptr, 0));
  expect_refused(MediaDBUpdateHasVirtualColumn(conn, nullptr));
  expect_refused(MediaDBUpdateVirtualMusicProperties(conn, nullptr, 0));
  expect_refused(MediaDBInsertIntoGenreTrackTable(conn, nullptr, 1));
  expect_refused(MediaDBInsertOneGenreRecord(conn, nullptr, 1));
  expect_refused(MediaDBInsertIntoComposerTrackTable(conn, nullptr, 1));
  expect_refused(MediaDBInsertIntoArtistTrackTable(conn, nullptr, 1));
  expect_refused(MediaDBInsertIntoAlbumTrackTable(conn, nullptr, "", 1, 0));
  expect_refused(MediaDBInsertIntoAlbumTrackTable(conn, &info, nullptr, 1, 0));
  expect_refused(MediaDBInsertIntoVirtualInfoTrackTable(conn, nullptr, &info, 1));
  expect_refused(MediaDBInsertIntoVirtualInfoTrackTable(conn, &info, nullptr, 1));
  expect_refused(MediaDBInsertIntoRatingTrackTable(conn, nullptr, 1, 0));
  expect_refused(MediaDBInsertIntoReplayGainTrackTable(conn, nullptr, 1));
  expect_refused(MediaDBFindAlbumCollapseSingleAlbumArtist(conn, nullptr));
  expect_refused(MediaDBUpdateAlbumWithMultipleAlbumArtist(conn, nullptr));
  expect_refused(MediaDBCheckRecordInMultipleAlbumArtist(conn, nullptr, 0));
  expect_refused(MediaDBCheckRecordsWithMultipleAlbumArtist(conn, nullptr, 0));
  expect_refused(MediaDBRecoverToSingleAlbumArtist(conn, nullptr, 0));
  expect_refused(MediaDBFindPersonalDirWithSamePath(conn, nullptr));
}

TEST_F(MissingArguments, MayBeTheConnection) {
  Record info{};
  expect_refused(MediaDBInsertIntoTrackRelatedTables(nullptr, &info, nullptr, 0, 0));
  expect_refused(MediaDBUpdateTrackRelatedTables(nullptr, &info));
  expect_refused(MediaDBDeleteRecordsInRelatedTables(nullptr, &info));
  expect_refused(MediaDBUpdateAlbumTrackTable(nullptr, "", 0));
  expect_refused(MediaDBInsertIntoTrackTable(nullptr, &info, nullptr, 0, 0));
  expect_refused(MediaDBUpdateTrackTable(nullptr, &info));
  expect_refused(MediaDBFindInsertedTrackID(nullptr, &info, 0));
  expect_refused(MediaDBFindRecordsWithSamePath(nullptr, &info, 0));
  expect_refused(MediaDBUpdateHasVirtualColumn(nullptr, &info));
  expect_refused(MediaDBUpdateVirtualMusicProperties(nullptr, &info, 0));
  expect_refused(MediaDBInsertIntoGenreTrackTable(nullptr, &info, 1));
  expect_refused(MediaDBInsertOneGenreRecord(nullptr, "", 1));
  expect_refused(MediaDBInsertIntoComposerTrackTable(nullptr, &info, 1));
  expect_refused(MediaDBInsertIntoArtistTrackTable(nullptr, &info, 1));
  expect_refused(MediaDBInsertIntoAlbumTrackTable(nullptr, &info, "", 1, 0));
  expect_refused(MediaDBInsertIntoVirtualInfoTrackTable(nullptr, &info, &info, 1));
  expect_refused(MediaDBInsertIntoRatingTrackTable(nullptr, &info, 1, 0));
  expect_refused(MediaDBInsertIntoReplayGainTrackTable(nullptr, kGains, 1));
  expect_refused(MediaDBFindAlbumCollapseSingleAlbumArtist(nullptr, &info));
  expect_refused(MediaDBUpdateAlbumWithMultipleAlbumArtist(nullptr, &info));
  expect_refused(MediaDBCheckRecordInMultipleAlbumArtist(nullptr, "", 0));
  expect_refused(MediaDBCheckRecordsWithMultipleAlbumArtist(nullptr, "", 0));
  expect_refused(MediaDBRecoverToSingleAlbumArtist(nullptr, "", 0));
  expect_refused(MediaDBFindPersonalDirWithSamePath(nullptr, ""));
}

}  // namespace
}  // namespace mediidx::test
