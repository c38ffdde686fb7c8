// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The texts that reach the server, to the letter.
#include "media_test.h"

namespace mediidx::test {
namespace {

struct SaveCase {
  const char* name;
  MEDIA_TABLE_TYPE type;
  const char* statement;
};

class StatementOfASave : public MediaTest, public testing::WithParamInterface<SaveCase> {};

TEST_P(StatementOfASave, IsFilledToTheLetter) {
  auto info = record("/p");
  ASSERT_EQ(MediaInfoDBSave(GetParam().type, &info), 0);
  EXPECT_EQ(last_statement(), GetParam().statement);
}

INSTANTIATE_TEST_SUITE_P(
    Kinds, StatementOfASave,
    testing::Values(
        SaveCase{"Music", MEDIA_TABLE_MUSIC,
                 "INSERT INTO music(path, filesize, title, album, artist, album_artist, composer, "
                 "comment, year, genre, channel, frequency, bitrate, duration, track, disc, "
                 "covercount, date, mdate, fs_uuid) VALUES('/p', 0, '', '', '', '','', '', 0,'', "
                 "'0', 0, 0, 0, 0, 0, 0, 'epoch', 'epoch', '')"},
        SaveCase{"Video", MEDIA_TABLE_VIDEO,
                 "INSERT INTO video(path, filesize, title, album, frame_bitrate, duration, "
                 "resolutionX, resolutionY, audio_bitrate, frequency, channel, date, mdate, "
                 "fs_uuid, video_codec, audio_codec, video_profile, video_level, container_type, "
                 "frame_rate_num, frame_rate_den, video_bitrate)VALUES('/p', 0, '', '', '0', '0', "
                 "'0', '0', 0, 0, 0, 'epoch', 'epoch', '', '', '', '0', '0', '', '0', '0', '0')"},
        SaveCase{"Photo", MEDIA_TABLE_PHOTO,
                 "INSERT INTO photo(path, filesize, title, album, camera_make, camera_model, "
                 "exposure, aperture, resolutionx, resolutiony, iso, date, mdate, timetaken, "
                 "fs_uuid) VALUES('/p', 0, '', '', '', '', '', '', 0, 0, 0, 'epoch', 'epoch', "
                 "'epoch', '')"},
        SaveCase{"Playlist", MEDIA_TABLE_PLAYLIST,
                 "INSERT INTO playlist(path, filesize, title, album, song_count, date, mdate, "
                 "fs_uuid) VALUES('/p', 0, '', '', '0', 'epoch', 'epoch', '')"}),
    [](const auto& test) { return test.param.name; });

class Statement : public MediaTest {};

TEST_F(Statement, OfATranscodedCopyIsFilledToTheLetter) {
  VIDEO_CONVERT_REC copy{};
  ASSERT_EQ(MediaInfoVideoConvertDBSave(&copy), 0);
  EXPECT_THAT(
      sent_statements(),
      ElementsAre("INSERT INTO video_convert(video_path, convert_file_path, resolutionx, "
                  "resolutiony, video_bitrate, vcodec, video_profile, video_level, container_type, "
                  "acodec, audio_bitrate, audio_frequency, audio_channel, convert_type) VALUES('', "
                  "'', 0, 0, 0, '', 0, 0, '', '', 0, 0, 0, '')"));
}

TEST_F(Statement, OfANewFolderIsFilledToTheLetter) {
  const auto dir = folder("/p");
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  EXPECT_THAT(
      sent_statements(),
      ElementsAre("SELECT COUNT(*) as result_count FROM directory WHERE  path='/p'  ",
                  "INSERT INTO directory(path, title, date, mdate, fs_uuid) VALUES('/p', '', "
                  "'epoch', 'epoch', '')"));
}

TEST_F(Statement, OfAKnownFolderIsFilledToTheLetter) {
  rows("INSERT INTO directory(path) VALUES('/p')");
  const auto dir = folder("/p");
  ASSERT_EQ(DirInfoDBSave(&dir), 0);
  EXPECT_EQ(last_statement(),
            "UPDATE directory SET title = '', date = 'epoch', mdate = 'epoch', "
            "fs_uuid = '' WHERE path = '/p'");
}

class StatementOfAnUpdate : public MediaTest, public testing::WithParamInterface<SaveCase> {};

TEST_P(StatementOfAnUpdate, IsFilledToTheLetter) {
  rows("INSERT INTO track(id, path, is_virtual) VALUES(7, '/p', 'FALSE')");
  auto info = record("/p");
  info.id = 7;
  ASSERT_EQ(MediaInfoDBUpdate(GetParam().type, &info), 0);
  EXPECT_EQ(last_statement(), GetParam().statement);
}

INSTANTIATE_TEST_SUITE_P(
    Kinds, StatementOfAnUpdate,
    testing::Values(
        SaveCase{"Music", MEDIA_TABLE_MUSIC,
                 "UPDATE music set filesize = 0, title = '', album = '', artist = '', "
                 "album_artist = '', composer = '', comment = '', year = 0, genre = '', "
                 "channel = 0, frequency = 0, bitrate = 0, duration = 0, track = 0, disc = 0, "
                 "covercount = 0, date = 'epoch', mdate = 'epoch' where path = '/p'"},
        SaveCase{"Video", MEDIA_TABLE_VIDEO,
                 "UPDATE video set path = '/p', filesize = 0, title = '', album = '', "
                 "frame_bitrate = 0, duration = 0, resolutionX = 0, resolutionY = 0, "
                 "audio_bitrate = 0, frequency = 0, channel = 0, date = 'epoch', "
                 "mdate = 'epoch' where id = 7"},
        SaveCase{"Photo", MEDIA_TABLE_PHOTO,
                 "UPDATE photo set path = '/p', filesize = 0, title = '', album = '', "
                 "date = 'epoch', mdate = 'epoch', timetaken = 'epoch' where id = 7"},
        SaveCase{"Playlist", MEDIA_TABLE_PLAYLIST,
                 "UPDATE playlist set path = '/p', filesize = 0, title = '', album = '', "
                 "song_count = 0, date = 'epoch', mdate = 'epoch' where id = 7"}),
    [](const auto& test) { return test.param.name; });

struct DeleteCase {
  const char* table;
  MEDIA_TABLE_TYPE type;
  const char* statement;
};

class StatementOfADelete : public MediaTest, public testing::WithParamInterface<DeleteCase> {};

TEST_P(StatementOfADelete, IsFilledToTheLetter) {
  ASSERT_EQ(MediaInfoDBDelete(GetParam().type, "/100%"), 0);
  EXPECT_EQ(last_statement(), GetParam().statement);
}

INSTANTIATE_TEST_SUITE_P(
    Tables, StatementOfADelete,
    testing::Values(
        DeleteCase{
            "music", MEDIA_TABLE_MUSIC,
            "DELETE FROM track WHERE path like '/100\\%' AND is_virtual = 'FALSE'; DELETE FRO"
            "M music WHERE path like '/100\\%'; "},
        DeleteCase{"video", MEDIA_TABLE_VIDEO, "DELETE FROM video WHERE path like '/100\\%'"},
        DeleteCase{"photo", MEDIA_TABLE_PHOTO, "DELETE FROM photo WHERE path like '/100\\%'"},
        DeleteCase{
            "playlist", MEDIA_TABLE_PLAYLIST,
            "DELETE FROM personal_playlist WHERE path like '/100\\%'; DELETE FROM playlist WH"
            "ERE path like '/100\\%'; "},
        DeleteCase{"directory", MEDIA_TABLE_DIRECTORY,
                   "DELETE FROM directory WHERE path like '/100\\%'"},
        DeleteCase{"video_convert", MEDIA_TABLE_VIDEO_CONVERT,
                   "DELETE FROM video_convert WHERE video_path like '/100\\%'"}),
    [](const auto& test) { return test.param.table; });

}  // namespace
}  // namespace mediidx::test
