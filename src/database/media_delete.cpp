// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Removing rows by path. Paths stand in LIKE patterns that match themselves only.
#include "database/session.h"
#include "database/table_types.h"
#include "mediidx/catalogue.h"
#include "support/no_throw.h"
#include "support/statement.h"

namespace mediidx {
namespace {

using Text = const char*;

constexpr Template<Text, Text, Text> kDeleteMusic{
    "DELETE FROM track "
    "WHERE path like '@TAVO:LVAR' "
    "AND is_virtual = 'FALSE'; "
    "DELETE FROM @TAVO:NEVAR "
    "WHERE path like '@TAVO:LVAR'; "};
constexpr Template<Text, Text> kDeleteRow{
    "DELETE FROM @TAVO:NEVAR "
    "WHERE path like '@TAVO:LVAR'"};
constexpr Template<Text, Text, Text> kDeletePlaylist{
    "DELETE FROM personal_playlist "
    "WHERE path like '@TAVO:LVAR'; "
    "DELETE FROM @TAVO:NEVAR "
    "WHERE path like '@TAVO:LVAR'; "};
constexpr Template<Text> kDeleteDirectory{
    "DELETE FROM directory "
    "WHERE path like '@TAVO:LVAR'"};
constexpr Template<Text> kDeleteVideoConvert{
    "DELETE FROM video_convert "
    "WHERE video_path like '@TAVO:LVAR'"};
constexpr Template<Text, Text, Text, Text, Text, Text, Text, Text, Text, Text, Text, Text>
    kDeleteTree{
        "DELETE FROM track WHERE path like '@TAVO:LVAR/%'; "
        "DELETE FROM music WHERE path like '@TAVO:LVAR/%'; "
        "DELETE FROM virtual_music WHERE comment like '%@TAVO:LVAR/%'; "
        "DELETE FROM video WHERE path like '@TAVO:LVAR/%'; "
        "DELETE FROM video_convert WHERE video_path like '@TAVO:LVAR/%'; "
        "DELETE FROM playlist WHERE path like '@TAVO:LVAR/%'; "
        "DELETE FROM personal_playlist WHERE path like '@TAVO:LVAR/%'; "
        "DELETE FROM photo WHERE path like '@TAVO:LVAR/%'; "
        "DELETE FROM directory WHERE path like '@TAVO:LVAR/%'; "
        "DELETE FROM directory WHERE path = '@TAVO:VAR';"
        "DELETE FROM personal_directory WHERE path like '@TAVO:LVAR/%'; "
        "DELETE FROM personal_directory WHERE path = '@TAVO:VAR';"};

constexpr int kBadParameter = 440;
constexpr int kAlbumsNotUpdated = 441;
constexpr int kVirtualNotDeleted = 442;
constexpr int kNotExecuted = 443;

int bad_parameter() {
  kDatabaseLog.parens(kBadParameter, "Bad parameter");
  return -1;
}

/// Null for a type that has nothing to delete.
OwnedText delete_statement(MEDIA_TABLE_TYPE type, Text path) {
  switch (type) {
    case MEDIA_TABLE_MUSIC:
      return fill(kDatabaseType, kDeleteMusic, path, table_name(type), path);
    case MEDIA_TABLE_VIDEO:
    case MEDIA_TABLE_PHOTO:
      return fill(kDatabaseType, kDeleteRow, table_name(type), path);
    case MEDIA_TABLE_PLAYLIST:
      return fill(kDatabaseType, kDeletePlaylist, path, table_name(type), path);
    case MEDIA_TABLE_DIRECTORY:
      return fill(kDatabaseType, kDeleteDirectory, path);
    case MEDIA_TABLE_VIDEO_CONVERT:
      return fill(kDatabaseType, kDeleteVideoConvert, path);
    case MEDIA_TABLE_FOLDER:
      return fill(kDatabaseType, kDeleteTree, path, path, path, path, path, path, path, path, path,
                  path, path, path);
    default:
      return nullptr;
  }
}

/// What has to be done while the rows are still there.
bool prepare(tavodb_connection* conn, MEDIA_TABLE_TYPE type, Text path) {
  if (type == MEDIA_TABLE_MUSIC && MediaDBUpdateAlbumTrackTable(conn, path, 0) < 0) {
    kDatabaseLog.colon(kAlbumsNotUpdated, "Failed to update album_track table");
    return false;
  }
  if (type == MEDIA_TABLE_PLAYLIST && MediaInfoVirtualDBDelete(path) < 0) {
    kDatabaseLog.colon(kVirtualNotDeleted, "Failed to delete virtual files");
    return false;
  }
  return true;
}

void mark_changed(MEDIA_TABLE_TYPE type) {
  if (type == MEDIA_TABLE_MUSIC) TAVOIndexMusicTableDirtySet(1);
  if (type == MEDIA_TABLE_VIDEO) TAVOIndexVideoTableDirtySet(1);
}

int delete_rows(MEDIA_TABLE_TYPE type, Text path) {
  // Every row lies below an empty folder.
  if (!path || (type == MEDIA_TABLE_FOLDER && !*path)) return bad_parameter();
  const auto handle = open_handle();
  if (!handle || !prepare(handle->conn, type, path)) return -1;
  const auto sql = delete_statement(type, path);
  if (MediaDBExec(sql.get()) == -1) {
    kDatabaseLog.parens(kNotExecuted, "Failed to exec [%s].", shown(sql.get()));
    return -1;
  }
  mark_changed(type);
  return 0;
}

}  // namespace
}  // namespace mediidx

extern "C" int MediaInfoDBDelete(MEDIA_TABLE_TYPE type, const char* path) {
  return mediidx::no_throw(mediidx::kDatabaseLog, -1,
                           [&] { return mediidx::delete_rows(type, path); });
}
