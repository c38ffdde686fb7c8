// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Storing files, transcoded copies and replay gain.
#include <cmath>
#include <limits>

#include "media_test.h"

namespace mediidx::test {
namespace {

using testing::EndsWith;
using testing::StartsWith;

int save(MEDIA_TABLE_TYPE type, Info info) { return MediaInfoDBSave(type, &info); }

class SavingAFile : public MediaTest {};

TEST_F(SavingAFile, RefusesNull) {
  EXPECT_EQ(MediaInfoDBSave(MEDIA_TABLE_PHOTO, nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter")));
}

TEST_F(SavingAFile, RefusesATypeThatIsNoFileBeforeAnythingIsDeleted) {
  rows("INSERT INTO directory(path) VALUES('/d')");
  for (const MEDIA_TABLE_TYPE type : {4U, 5U, 6U, 0xFFFFFFFFU}) {
    clear_log();
    EXPECT_EQ(save(type, record("/d")), -1);
    EXPECT_THAT(log_lines(), ElementsAre(parens("Bad table type.")));
  }
  EXPECT_EQ(count("directory"), 1);
  EXPECT_THAT(sent_statements(), IsEmpty());
}

struct KindCase {
  MEDIA_TABLE_TYPE type;
  const char* table;
};

class SavingAKind : public MediaTest, public testing::WithParamInterface<KindCase> {
 protected:
  std::string table() const { return GetParam().table; }
};

TEST_P(SavingAKind, TakesARecordThatCarriesOnlyAPath) {
  ASSERT_EQ(save(GetParam().type, record(shared("x"))), 0);
  EXPECT_EQ(
      rows("SELECT title, album, filesize, fs_uuid, fs_online, date, mdate FROM " + table()),
      (std::vector<Row>{{"", "", "0", "", "t", "1970-01-01 00:00:00", "1970-01-01 00:00:00"}}));
  EXPECT_EQ(value("SELECT path FROM " + table()), shared("x"));
}

TEST_P(SavingAKind, LeavesOneRowOfTwoSaves) {
  auto info = record(shared("x"));
  ASSERT_EQ(save(GetParam().type, info), 0);
  set(info.title, "second");
  ASSERT_EQ(save(GetParam().type, info), 0);
  EXPECT_EQ(value("SELECT title FROM " + table()), "second");
}

TEST_P(SavingAKind, LeavesOtherPathsAlone) {
  ASSERT_EQ(save(GetParam().type, record(shared("x_"))), 0);
  ASSERT_EQ(save(GetParam().type, record(shared("xy"))), 0);
  ASSERT_EQ(save(GetParam().type, record(shared("x_"))), 0);
  EXPECT_EQ(count(table()), 2);
}

TEST_P(SavingAKind, TrimsItsTexts) {
  auto info = record(shared("x"));
  set(info.title, " \t a title \r\n");
  set(info.album, "  an album  ");
  ASSERT_EQ(MediaInfoDBSave(GetParam().type, &info), 0);
  EXPECT_STREQ(info.title, "a title");
  EXPECT_EQ(rows("SELECT title, album FROM " + table()),
            (std::vector<Row>{{"a title", "an album"}}));
}

TEST_P(SavingAKind, FailsWithoutAConnection) {
  const auto path = shared("x");
  const NoServer no_server;
  EXPECT_EQ(save(GetParam().type, record(path)), -1);
  EXPECT_EQ(last_log_line(), parens("Failed to connect to database"));
}

TEST_P(SavingAKind, LogsAFailedStatement) {
  const auto path = shared("x");
  take_away(table());
  EXPECT_EQ(save(GetParam().type, record(path)), -1);
  EXPECT_THAT(last_log_line(),
              StartsWith(parens("Failed to exec [INSERT INTO " + table() + "(path, ")));
  EXPECT_THAT(last_log_line(), EndsWith(std::string("] (") + TAVODBErrorGet(gpDBConnect) + ")"));
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_P(SavingAKind, FailsWithoutMemory) {
  const auto path = shared("x");
  const FailingAllocation second(Allocator::kCalloc, sizeof(MEDIA_DB_HANDLE), 2);
  EXPECT_EQ(save(GetParam().type, record(path)), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to malloc")));
  EXPECT_EQ(count(table()), 0);
}

TEST_P(SavingAKind, GoesOnWithoutMemoryForTheDeleteBeforeIt) {
  const auto path = shared("x");
  const FailingAllocation allocation(Allocator::kCalloc, sizeof(MEDIA_DB_HANDLE));
  EXPECT_EQ(save(GetParam().type, record(path)), 0);
  EXPECT_THAT(log_lines(), testing::Contains(parens("Failed to malloc")));
}
#endif

INSTANTIATE_TEST_SUITE_P(Kinds, SavingAKind,
                         testing::Values(KindCase{MEDIA_TABLE_MUSIC, "music"},
                                         KindCase{MEDIA_TABLE_VIDEO, "video"},
                                         KindCase{MEDIA_TABLE_PHOTO, "photo"},
                                         KindCase{MEDIA_TABLE_PLAYLIST, "playlist"}),
                         [](const auto& test) { return std::string(test.param.table); });

TEST_F(SavingAFile, TrimsEveryTextButPathAndDates) {
  auto info = record("/ p ");
  for (char* text :
       {info.title, info.album, info.artist, info.album_artist, info.genre, info.composer,
        info.comment, info.camera_make, info.camera_model, info.exposure, info.aperture}) {
    std::snprintf(text, 20, " x ");
  }
  set(info.fs_uuid, " u ");
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_PHOTO, &info), 0);
  for (const char* text :
       {info.title, info.album, info.artist, info.album_artist, info.genre, info.composer,
        info.comment, info.camera_make, info.camera_model, info.exposure, info.aperture}) {
    EXPECT_STREQ(text, "x");
  }
  EXPECT_EQ(rows("SELECT path, fs_uuid FROM photo"), (std::vector<Row>{{"/ p ", " u "}}));
}

TEST_F(SavingAFile, TrimsATypeThatItRefusesToo) {
  auto info = record("/p");
  set(info.title, " x ");
  MediaInfoDBSave(MEDIA_TABLE_DIRECTORY, &info);
  EXPECT_STREQ(info.title, "x");
}

TEST_F(SavingAFile, StoresEveryColumnOfAPhoto) {
  auto info = record("/p.jpg");
  info.filesize = 5'000'000'000;
  set(info.title, "ti");
  set(info.album, "al");
  set(info.camera_make, "ma");
  set(info.camera_model, "mo");
  set(info.exposure, "1/60");
  set(info.aperture, "f/2.8");
  info.resolutionX = 4000;
  info.resolutionY = 3000;
  info.iso = 400;
  set(info.date, "2020-01-02 03:04:05");
  set(info.mdate, "2021-01-02 03:04:05");
  set(info.timetaken, "2019-01-02 03:04:05");
  set(info.fs_uuid, "uuid");
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_PHOTO, &info), 0);
  EXPECT_EQ(
      rows("SELECT path, filesize, title, album, camera_make, camera_model, exposure, aperture, "
           "resolutionx, resolutiony, iso, date, mdate, timetaken, fs_uuid FROM photo"),
      (std::vector<Row>{{"/p.jpg", "5000000000", "ti", "al", "ma", "mo", "1/60", "f/2.8", "4000",
                         "3000", "400", "2020-01-02 03:04:05", "2021-01-02 03:04:05",
                         "2019-01-02 03:04:05", "uuid"}}));
}

TEST_F(SavingAFile, StoresAnEmptyTimeTakenAsTheEpoch) {
  ASSERT_EQ(save(MEDIA_TABLE_PHOTO, record("/p.jpg")), 0);
  EXPECT_EQ(value("SELECT timetaken FROM photo"), "1970-01-01 00:00:00");
}

TEST_F(SavingAFile, StoresEveryColumnOfAVideo) {
  auto info = record("/v.mkv");
  info.filesize = 1;
  set(info.title, "ti");
  set(info.album, "al");
  info.frame_bitrate = 2;
  info.duration = 3.9F;
  info.resolutionX = 4;
  info.resolutionY = 5;
  info.bitrate = 6;
  info.frequency = 7;
  info.channel = 8;
  set(info.fs_uuid, "uuid");
  set(info.video_codec, "vc");
  set(info.audio_codec, "ac");
  info.video_profile = 9;
  info.video_level = 10;
  set(info.container_type, "ct");
  info.frame_rate_num = 11;
  info.frame_rate_den = 12;
  info.video_bitrate = 13;
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_VIDEO, &info), 0);
  EXPECT_EQ(
      rows("SELECT path, filesize, title, album, frame_bitrate, duration, resolutionx, "
           "resolutiony, audio_bitrate, frequency, channel, fs_uuid, video_codec, audio_codec, "
           "video_profile, video_level, container_type, frame_rate_num, frame_rate_den, "
           "video_bitrate FROM video"),
      (std::vector<Row>{{"/v.mkv", "1",    "ti", "al", "2", "3",  "4",  "5",  "6",  "7",
                         "8",      "uuid", "vc", "ac", "9", "10", "ct", "11", "12", "13"}}));
}

TEST_F(SavingAFile, StoresEveryColumnOfMusic) {
  auto info = record(shared("m.mp3"));
  info.filesize = 1;
  set(info.title, "ti");
  set(info.album, "al");
  set(info.artist, "ar");
  set(info.album_artist, "aa");
  set(info.composer, "co");
  set(info.comment, "cm");
  info.year = 2;
  set(info.genre, "ge");
  info.channel = 3;
  info.frequency = 4;
  info.bitrate = 5;
  info.duration = 59.9F;
  info.track = 6;
  info.disc = 7;
  info.covercount = 8;
  set(info.fs_uuid, "uuid");
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_MUSIC, &info), 0);
  EXPECT_EQ(rows("SELECT filesize, title, album, artist, album_artist, composer, comment, year, "
                 "genre, channel, frequency, bitrate, duration, track, disc, covercount, fs_uuid "
                 "FROM music"),
            (std::vector<Row>{{"1", "ti", "al", "ar", "aa", "co", "cm", "2", "ge", "3", "4", "5",
                               "59", "6", "7", "8", "uuid"}}));
}

struct DurationCase {
  const char* name;
  float duration;
  const char* stored;
};

class SavingADuration : public MediaTest, public testing::WithParamInterface<DurationCase> {};

TEST_P(SavingADuration, StoresWholeSeconds) {
  auto info = record("/v.mkv");
  info.duration = GetParam().duration;
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_VIDEO, &info), 0);
  EXPECT_EQ(value("SELECT duration FROM video"), GetParam().stored);
}

INSTANTIATE_TEST_SUITE_P(
    Durations, SavingADuration,
    testing::Values(DurationCase{"Fraction", 59.9F, "59"},
                    DurationCase{"NegativeFraction", -59.9F, "-59"},
                    DurationCase{"TooLong", 1e20F, "2147483647"},
                    DurationCase{"TooShort", -1e20F, "-2147483648"},
                    DurationCase{"Infinite", std::numeric_limits<float>::infinity(), "2147483647"},
                    DurationCase{"NoNumber", std::nanf(""), "0"}),
    [](const auto& test) { return test.param.name; });

TEST_F(SavingAFile, StoresMusicInTheCatalogueToo) {
  auto info = record(shared("m.mp3"));
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_MUSIC, &info), 0);
  EXPECT_EQ(rows("SELECT path, userid, is_virtual FROM track"),
            (std::vector<Row>{{info.path, "0", "FALSE"}}));
  EXPECT_EQ(std::to_string(info.id), value("SELECT id FROM track"));
}

TEST_F(SavingAFile, LeavesOneTrackOfTwoSaves) {
  save(MEDIA_TABLE_MUSIC, record(shared("m.mp3")));
  save(MEDIA_TABLE_MUSIC, record(shared("m.mp3")));
  EXPECT_EQ(count("track"), 1);
  EXPECT_EQ(count("genre_track"), 1);
}

TEST_F(SavingAFile, StoresPersonalMusicInTheCatalogueOnly) {
  ASSERT_EQ(save(MEDIA_TABLE_MUSIC, record(personal("m.mp3"))), 0);
  EXPECT_EQ(value("SELECT userid FROM track"), "1026");
  EXPECT_EQ(count("music"), 0);
}

TEST_F(SavingAFile, FailsWhenTheCatalogueDoes) {
  const auto path = shared("m.mp3");
  take_away("composer_track");
  EXPECT_EQ(save(MEDIA_TABLE_MUSIC, record(path)), -1);
  EXPECT_EQ(last_log_line(), colon("Failed to insert data into track related tables"));
  EXPECT_EQ(count("music"), 0);
}

TEST_F(SavingAFile, WritesNothingAndSucceedsWhenItsStatementCannotBeBuilt) {
  const Failing fill("TAVODBEscapeStringEX3", 2);  // after that of the delete
  EXPECT_EQ(save(MEDIA_TABLE_PHOTO, record("/p")), 0);
  EXPECT_EQ(count("photo"), 0);
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_F(SavingAFile, GoesOnWhenTheDeleteBeforeItFails) {
  const Failing fill("TAVODBEscapeStringEX3", 1);
  EXPECT_EQ(save(MEDIA_TABLE_PHOTO, record("/p")), 0);
  EXPECT_EQ(count("photo"), 1);
  EXPECT_THAT(log_lines(),
              ElementsAre(parens("Bad parameters."), parens("Failed to exec [(null)].")));
}

TEST_F(SavingAFile, MarksMusicAndVideoOnly) {
  const auto music = record(shared("m.mp3"));
  save(MEDIA_TABLE_PHOTO, record("/p"));
  save(MEDIA_TABLE_PLAYLIST, record("/l.m3u"));
  EXPECT_FALSE(marked());
  save(MEDIA_TABLE_VIDEO, record("/v"));
  EXPECT_TRUE(marked());
  unmark();
  save(MEDIA_TABLE_MUSIC, music);
  EXPECT_TRUE(marked());
}

TEST_F(SavingAFile, CountsTheSongsOfAPlaylist) {
  root.write("volume1/media/a.mp3", "");
  root.write("volume1/media/b.mp3", "");
  const auto path = shared("list.m3u");
  root.write("volume1/media/list.m3u", "#EXTM3U\na.mp3\n\nb.mp3\n");
  ASSERT_EQ(save(MEDIA_TABLE_PLAYLIST, record(path)), 0);
  EXPECT_EQ(value("SELECT song_count FROM playlist"), "2");
}

TEST_F(SavingAFile, CountsNoSongsOfAPlaylistThatCannotBeRead) {
  ASSERT_EQ(save(MEDIA_TABLE_PLAYLIST, record("/none.m3u")), 0);
  EXPECT_EQ(value("SELECT song_count FROM playlist"), "0");
}

TEST_F(SavingAFile, StoresAPersonalPlaylistInItsOwnTable) {
  auto info = record(personal("list.m3u"));
  info.filesize = 7;
  set(info.title, "ti");
  set(info.album, "al");
  set(info.fs_uuid, "uuid");
  root.write("homes/ann/music/list.m3u", "a.mp3\n");
  ASSERT_EQ(MediaInfoDBSave(MEDIA_TABLE_PLAYLIST, &info), 0);
  EXPECT_EQ(rows("SELECT userid, path, filesize, title, album, song_count, date, fs_uuid, updated "
                 "FROM personal_playlist"),
            (std::vector<Row>{
                {"1026", info.path, "7", "ti", "al", "1", "1970-01-01 00:00:00", "uuid", "1"}}));
  EXPECT_EQ(count("playlist"), 0);
}

TEST_F(SavingAFile, LeavesOnePersonalPlaylistOfTwoSaves) {
  save(MEDIA_TABLE_PLAYLIST, record(personal("list.m3u")));
  save(MEDIA_TABLE_PLAYLIST, record(personal("list.m3u")));
  EXPECT_EQ(count("personal_playlist"), 1);
}

VIDEO_CONVERT_REC copy_of(std::string_view video) {
  VIDEO_CONVERT_REC copy{};
  set(copy.video_path, video);
  set(copy.convert_file_path, "/copy.mp4");
  return copy;
}

class SavingATranscodedCopy : public MediaTest {};

TEST_F(SavingATranscodedCopy, StoresEveryColumn) {
  auto copy = copy_of("/v.mkv");
  copy.resolutionx = 1;
  copy.resolutiony = 2;
  copy.video_bitrate = 3;
  set(copy.vcodec, " vc ");
  copy.video_profile = 4;
  copy.video_level = 5;
  set(copy.container_type, "ct\t");
  set(copy.acodec, "\nac");
  copy.audio_bitrate = 6;
  copy.audio_frequency = 7;
  copy.audio_channel = 8;
  set(copy.convert_type, "cv ");
  ASSERT_EQ(MediaInfoVideoConvertDBSave(&copy), 0);
  EXPECT_EQ(rows("SELECT video_path, convert_file_path, resolutionx, resolutiony, video_bitrate, "
                 "vcodec, video_profile, video_level, container_type, acodec, audio_bitrate, "
                 "audio_frequency, audio_channel, convert_type FROM video_convert"),
            (std::vector<Row>{{"/v.mkv", "/copy.mp4", "1", "2", "3", "vc", "4", "5", "ct", "ac",
                               "6", "7", "8", "cv"}}));
}

TEST_F(SavingATranscodedCopy, RefusesNull) {
  EXPECT_EQ(MediaInfoVideoConvertDBSave(nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter")));
}

TEST_F(SavingATranscodedCopy, FailsWithoutAConnection) {
  const NoServer no_server;
  auto copy = copy_of("/v.mkv");
  EXPECT_EQ(MediaInfoVideoConvertDBSave(&copy), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

TEST_F(SavingATranscodedCopy, LogsAFailedStatement) {
  take_away("video_convert");
  auto copy = copy_of("/v.mkv");
  EXPECT_EQ(MediaInfoVideoConvertDBSave(&copy), -1);
  ASSERT_EQ(sent_statements().size(), 1U);
  EXPECT_THAT(log_lines(), ElementsAre(failed_statement(sent_statements()[0])));
}

TEST_F(SavingATranscodedCopy, WritesNothingAndSucceedsWhenItsStatementCannotBeBuilt) {
  const Failing fill("TAVODBEscapeStringEX3");
  auto copy = copy_of("/v.mkv");
  EXPECT_EQ(MediaInfoVideoConvertDBSave(&copy), 0);
  EXPECT_EQ(count("video_convert"), 0);
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_F(SavingATranscodedCopy, FailsWithoutMemory) {
  const FailingAllocation allocation(Allocator::kCalloc, sizeof(MEDIA_DB_HANDLE));
  auto copy = copy_of("/v.mkv");
  EXPECT_EQ(MediaInfoVideoConvertDBSave(&copy), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to malloc")));
}
#endif

class SavingReplayGain : public MediaTest {
 protected:
  const float gains[4] = {-6.5F, 0.988F, -7.25F, 1.0F};
};

TEST_F(SavingReplayGain, StoresTheFourValuesOfATrack) {
  rows("INSERT INTO track(id, path) VALUES(42, '/m.mp3')");
  ASSERT_EQ(MediaInfoAudioRGMetadataDBSave(gains, 42), 0);
  EXPECT_EQ(rows("SELECT * FROM replaygain_track"),
            (std::vector<Row>{{"42", "-6.500000", "0.988000", "-7.250000", "1.000000"}}));
}

TEST_F(SavingReplayGain, RefusesNull) {
  EXPECT_EQ(MediaInfoAudioRGMetadataDBSave(nullptr, 42), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter")));
}

TEST_F(SavingReplayGain, FailsWithoutAConnection) {
  const NoServer no_server;
  EXPECT_EQ(MediaInfoAudioRGMetadataDBSave(gains, 42), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to connect to database")));
}

TEST_F(SavingReplayGain, FailsForATrackThatIsNotThere) {
  EXPECT_EQ(MediaInfoAudioRGMetadataDBSave(gains, 42), -1);
  EXPECT_EQ(last_log_line(), colon("Failed to insert data into replaygain_track table"));
}

}  // namespace
}  // namespace mediidx::test
