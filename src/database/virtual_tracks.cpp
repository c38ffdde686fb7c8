// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Rows of the virtual tracks that a cue sheet cuts out of its audio files.
#include "database/virtual_tracks.h"

#include <string>

#include "database/record.h"
#include "database/session.h"
#include "mediidx/catalogue.h"
#include "mediidx/request.h"
#include "support/no_throw.h"
#include "support/statement.h"
#include "support/text.h"

namespace mediidx {
namespace {

using Info = __tag_TAVO_MEDIA_INFO;
using Text = const char*;
using Int = int;

constexpr Template<Text, Text, Text, Text, Text, Text, Int, Text, Text, Int, Int> kInsert{
    "INSERT INTO virtual_music(path, title, album, artist, album_artist, composer, year, "
    "genre, comment, duration, track) "
    "VALUES('@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', "
    "@TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, @TAVO:INT)"};
constexpr Template<Text, Text> kDelete{
    "DELETE FROM track "
    "USING virtual_info_track "
    "WHERE track.id = virtual_info_track.track "
    "AND cue_sheet_path = '@TAVO:VAR' "
    "AND is_virtual = 'TRUE';"
    "DELETE FROM virtual_music "
    "WHERE comment LIKE '%@TAVO:LVAR';"};

constexpr int kNoList = 460;
constexpr int kNoConnectionToSave = 461;
constexpr int kNoStatement = 462;
constexpr int kNotInserted = 463;
constexpr int kNotRelated = 464;
constexpr int kBadParameter = 465;
constexpr int kNoConnectionToDelete = 466;
constexpr int kAlbumsNotUpdated = 467;
constexpr int kNotDeleted = 468;

int bad_parameter() {
  kDatabaseLog.colon(kBadParameter, "Bad parameter.");
  return -1;
}

bool insert_row(tavodb_connection* conn, const Info& info, Text comment) {
  const auto sql = fill(kDatabaseType, kInsert, info.path, info.title, info.album, info.artist,
                        info.album_artist, info.composer, info.year, info.genre, comment,
                        whole_seconds(info.duration), info.track);
  if (!sql) {
    kDatabaseLog.colon(kNoStatement, "Failed to TAVODBEscapeStringEX3()");
    return false;
  }
  return execute(conn, sql.get(), {LogShape::kColon, kNotInserted, "."});
}

bool save_track(tavodb_connection* conn, Info& info, const Info& cue) {
  const auto comment = virtual_comment(info, cue);
  const auto userid = owner_of(info.path);
  trim_texts(info);
  if (TAVOMediaIndexIsIndexPath(info.path, MEDIA_TABLE_MUSIC) <= 0) return true;
  if (userid == 0 && !insert_row(conn, info, comment.c_str())) return false;
  if (MediaDBInsertIntoTrackRelatedTables(conn, &info, &cue, 1, userid) >= 0) return true;
  log_virtual_track_not_related();
  return false;
}

int save(_PLAYLIST_REC* list, Info* cue) {
  if (!list) {
    log_no_virtual_tracks();
    return 0;  // kept: a cue sheet without tracks is no failure
  }
  if (!cue) return bad_parameter();
  auto* conn = connect({LogShape::kColon, kNoConnectionToSave, "."});
  if (!conn) return -1;
  trim_texts(*cue);
  for (auto* entry = list; entry; entry = entry->next) {
    if (!save_track(conn, entry->info, *cue)) return -1;
  }
  return 0;
}

int delete_tracks(Text cue_path) {
  if (!cue_path) return bad_parameter();
  auto* conn = connect({LogShape::kColon, kNoConnectionToDelete, "."});
  if (!conn) return -1;
  if (MediaDBUpdateAlbumTrackTable(conn, cue_path, 1) < 0) {
    kDatabaseLog.colon(kAlbumsNotUpdated, "Failed to update album_track table");
    return -1;
  }
  const auto sql = fill(TAVODBDatabaseTypeGet(conn), kDelete, cue_path, cue_path);
  return execute(conn, sql.get(), {LogShape::kColon, kNotDeleted}) ? 0 : -1;
}

}  // namespace

std::string virtual_comment(const Info& info, const Info& cue) {
  constexpr std::size_t kWidth = 254;
  const auto whole = std::string(info.comment) + cue.path;
  return std::string(cut_at_character(whole, kWidth));
}

void log_no_virtual_tracks() { kDatabaseLog.colon(kNoList, "Input list is NULL."); }

void log_virtual_track_not_related() {
  kDatabaseLog.colon(kNotRelated, "Failed to insert data into track related tables");
}

}  // namespace mediidx

extern "C" int MediaInfoVirtualDBSave(_PLAYLIST_REC* list, __tag_TAVO_MEDIA_INFO* cueInfo) {
  return mediidx::no_throw(mediidx::kDatabaseLog, -1, [&] { return mediidx::save(list, cueInfo); });
}

extern "C" int MediaInfoVirtualDBDelete(const char* cuePath) {
  return mediidx::no_throw(mediidx::kDatabaseLog, -1,
                           [&] { return mediidx::delete_tracks(cuePath); });
}
