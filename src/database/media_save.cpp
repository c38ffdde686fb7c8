// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Storing files, the transcoded copies of videos, and replay gain.
#include "database/media_save.h"

#include "database/playlist_count.h"
#include "database/record.h"
#include "database/session.h"
#include "mediidx/catalogue.h"
#include "support/no_throw.h"
#include "support/statement.h"

namespace mediidx {
namespace {

using Info = __tag_TAVO_MEDIA_INFO;
using Text = const char*;
using Int = int;
using Long = std::int64_t;

constexpr Template<Text, Long, Text, Text, Text, Text, Text, Text, Int, Text, Int, Int, Int, Int,
                   Int, Int, Int, Text, Text, Text>
    kInsertMusic{
        "INSERT INTO music(path, filesize, title, album, artist, album_artist, composer, "
        "comment, year, genre, channel, frequency, bitrate, duration, track, disc, covercount, "
        "date, mdate, fs_uuid) "
        "VALUES('@TAVO:VAR', @TAVO:LLINT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', "
        "'@TAVO:VAR','@TAVO:VAR', '@TAVO:VAR', @TAVO:INT,'@TAVO:VAR', '@TAVO:INT', @TAVO:INT, "
        "@TAVO:INT, @TAVO:INT, @TAVO:INT, @TAVO:INT, @TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', "
        "'@TAVO:VAR')"};
constexpr Template<Text, Long, Text, Text, Int, Int, Int, Int, Int, Int, Int, Text, Text, Text,
                   Text, Text, Int, Int, Text, Int, Int, Int>
    kInsertVideo{
        "INSERT INTO video(path, filesize, title, album, frame_bitrate, duration, resolutionX, "
        "resolutionY, audio_bitrate, frequency, channel, date, mdate, fs_uuid, video_codec, "
        "audio_codec, video_profile, video_level, container_type, frame_rate_num, "
        "frame_rate_den, video_bitrate)"
        "VALUES('@TAVO:VAR', @TAVO:LLINT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:INT', '@TAVO:INT', "
        "'@TAVO:INT', '@TAVO:INT', @TAVO:INT, @TAVO:INT, @TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', "
        "'@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:INT', '@TAVO:INT', '@TAVO:VAR', "
        "'@TAVO:INT', '@TAVO:INT', '@TAVO:INT')"};
constexpr Template<Text, Long, Text, Text, Text, Text, Text, Text, Int, Int, Int, Text, Text, Text,
                   Text>
    kInsertPhoto{
        "INSERT INTO photo(path, filesize, title, album, camera_make, camera_model, exposure, "
        "aperture, resolutionx, resolutiony, iso, date, mdate, timetaken, fs_uuid) "
        "VALUES('@TAVO:VAR', @TAVO:LLINT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', "
        "'@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, @TAVO:INT, @TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', "
        "'@TAVO:VAR', '@TAVO:VAR')"};
constexpr Template<Text, Long, Text, Text, Int, Text, Text, Text> kInsertPlaylist{
    "INSERT INTO playlist(path, filesize, title, album, song_count, date, mdate, fs_uuid) "
    "VALUES('@TAVO:VAR', @TAVO:LLINT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:INT', '@TAVO:VAR', "
    "'@TAVO:VAR', '@TAVO:VAR')"};
constexpr Template<Long, Text, Long, Text, Text, Int, Text, Text, Text> kInsertPersonalPlaylist{
    "INSERT INTO personal_playlist(userid, path, filesize, title, album, song_count, date, "
    "mdate, fs_uuid, updated) "
    "VALUES(@TAVO:LLINT, '@TAVO:VAR', @TAVO:LLINT, '@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, "
    "'@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '1')"};
constexpr Template<Text, Text, Int, Int, Int, Text, Int, Int, Text, Text, Int, Int, Int, Text>
    kInsertVideoConvert{
        "INSERT INTO video_convert(video_path, convert_file_path, resolutionx, resolutiony, "
        "video_bitrate, vcodec, video_profile, video_level, container_type, acodec, "
        "audio_bitrate, audio_frequency, audio_channel, convert_type) "
        "VALUES('@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, @TAVO:INT, @TAVO:INT, '@TAVO:VAR', "
        "@TAVO:INT, @TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, @TAVO:INT, @TAVO:INT, "
        "'@TAVO:VAR')"};

constexpr int kBadParameter = 400;
constexpr int kBadTableType = 401;
constexpr int kNotRelated = 402;
constexpr int kNotInserted = 403;
constexpr int kCopyNotInserted = 404;
constexpr int kNoConnection = 405;
constexpr int kGainNotInserted = 406;

int bad_parameter() {
  kDatabaseLog.parens(kBadParameter, "Bad parameter");
  return -1;
}

OwnedText insert_music(const Info& info) {
  return fill(kDatabaseType, kInsertMusic, info.path, info.filesize, info.title, info.album,
              info.artist, info.album_artist, info.composer, info.comment, info.year, info.genre,
              info.channel, info.frequency, info.bitrate, whole_seconds(info.duration), info.track,
              info.disc, info.covercount, date_or_epoch(info.date), date_or_epoch(info.mdate),
              info.fs_uuid);
}

OwnedText insert_video(const Info& info) {
  return fill(kDatabaseType, kInsertVideo, info.path, info.filesize, info.title, info.album,
              info.frame_bitrate, whole_seconds(info.duration), info.resolutionX, info.resolutionY,
              info.bitrate, info.frequency, info.channel, date_or_epoch(info.date),
              date_or_epoch(info.mdate), info.fs_uuid, info.video_codec, info.audio_codec,
              info.video_profile, info.video_level, info.container_type, info.frame_rate_num,
              info.frame_rate_den, info.video_bitrate);
}

OwnedText insert_photo(const Info& info) {
  return fill(kDatabaseType, kInsertPhoto, info.path, info.filesize, info.title, info.album,
              info.camera_make, info.camera_model, info.exposure, info.aperture, info.resolutionX,
              info.resolutionY, info.iso, date_or_epoch(info.date), date_or_epoch(info.mdate),
              date_or_epoch(info.timetaken), info.fs_uuid);
}

OwnedText insert_playlist(const Info& info, Long userid) {
  const int songs = playlist_song_count(info.path);
  const char* date = date_or_epoch(info.date);
  const char* mdate = date_or_epoch(info.mdate);
  if (userid != 0) {
    return fill(kDatabaseType, kInsertPersonalPlaylist, userid, info.path, info.filesize,
                info.title, info.album, songs, date, mdate, info.fs_uuid);
  }
  return fill(kDatabaseType, kInsertPlaylist, info.path, info.filesize, info.title, info.album,
              songs, date, mdate, info.fs_uuid);
}

OwnedText insert_statement(MEDIA_TABLE_TYPE type, const Info& info, Long userid) {
  switch (type) {
    case MEDIA_TABLE_MUSIC:
      return insert_music(info);
    case MEDIA_TABLE_VIDEO:
      return insert_video(info);
    case MEDIA_TABLE_PHOTO:
      return insert_photo(info);
    default:
      return insert_playlist(info, userid);
  }
}

int save(MEDIA_TABLE_TYPE type, Info& info) {
  const auto userid = owner_of(info.path);
  trim_texts(info);
  if (type > MEDIA_TABLE_PLAYLIST) {
    kDatabaseLog.parens(kBadTableType, "Bad table type.");
    return -1;
  }
  MediaInfoDBDelete(type, info.path);
  const auto handle = open_handle();
  if (!handle) return -1;
  if (type == MEDIA_TABLE_MUSIC) {
    if (MediaDBInsertIntoTrackRelatedTables(handle->conn, &info, nullptr, 0, userid) < 0) {
      log_song_not_related();
      return -1;
    }
    if (userid != 0) return 0;  // songs of a personal library live in the catalogue only
  }
  const auto sql = insert_statement(type, info, userid);
  if (!sql) return 0;  // kept: a row that cannot be written is left out
  if (!execute(handle->conn, sql.get(), {LogShape::kParens, kNotInserted})) return -1;
  if (type == MEDIA_TABLE_MUSIC) TAVOIndexMusicTableDirtySet(1);
  if (type == MEDIA_TABLE_VIDEO) TAVOIndexVideoTableDirtySet(1);
  return 0;
}

int save_copy(VIDEO_CONVERT_REC& record) {
  trim_texts(record);
  const auto handle = open_handle();
  if (!handle) return -1;
  const VIDEO_CONVERT_REC& copy = record;
  const auto sql =
      fill(kDatabaseType, kInsertVideoConvert, copy.video_path, copy.convert_file_path,
           copy.resolutionx, copy.resolutiony, copy.video_bitrate, copy.vcodec, copy.video_profile,
           copy.video_level, copy.container_type, copy.acodec, copy.audio_bitrate,
           copy.audio_frequency, copy.audio_channel, copy.convert_type);
  if (!sql) return 0;  // kept, as in a file's save
  return execute(handle->conn, sql.get(), {LogShape::kParens, kCopyNotInserted}) ? 0 : -1;
}

int save_replay_gain(const float* gains, std::uint32_t track_id) {
  auto* conn = connect({LogShape::kParens, kNoConnection});
  if (!conn) return -1;
  if (MediaDBInsertIntoReplayGainTrackTable(conn, gains, static_cast<int>(track_id)) >= 0) return 0;
  kDatabaseLog.colon(kGainNotInserted, "Failed to insert data into replaygain_track table");
  return -1;
}

}  // namespace

void log_song_not_related() {
  kDatabaseLog.colon(kNotRelated, "Failed to insert data into track related tables");
}

}  // namespace mediidx

using mediidx::kDatabaseLog;
using mediidx::no_throw;

extern "C" int MediaInfoDBSave(MEDIA_TABLE_TYPE type, __tag_TAVO_MEDIA_INFO* info) {
  return no_throw(kDatabaseLog, -1,
                  [&] { return info ? mediidx::save(type, *info) : mediidx::bad_parameter(); });
}

extern "C" int MediaInfoVideoConvertDBSave(VIDEO_CONVERT_REC* record) {
  return no_throw(kDatabaseLog, -1,
                  [&] { return record ? mediidx::save_copy(*record) : mediidx::bad_parameter(); });
}

extern "C" int MediaInfoAudioRGMetadataDBSave(const float* gains, uint32_t trackId) {
  return no_throw(kDatabaseLog, -1, [&] {
    return gains ? mediidx::save_replay_gain(gains, trackId) : mediidx::bad_parameter();
  });
}
