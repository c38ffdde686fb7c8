/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// The media database: its one shared connection, and the rows of the per-type tables.
#ifndef MEDIIDX_DATABASE_H_
#define MEDIIDX_DATABASE_H_

#include "mediidx/record.h"

#ifdef __cplusplus
extern "C" {
#endif

/// The shared connection: null until the first use that connects, and after MediaDBConnClose.
extern MEDIIDX_EXPORT struct tavodb_connection* gpDBConnect;

/// A SELECT over one table, walked row by row.
typedef struct MEDIA_DB_HANDLE {
  struct tavodb_connection* conn;  ///< The shared connection; not owned.
  struct tavodb_result* result;    ///< Owned.
  uint32_t row;                    ///< Row cursor; 0 until the first fetch.
  uint32_t rowCount;               ///< Rows of the result.
  MEDIA_TABLE_TYPE tableType;      ///< The table that was selected from.
} MEDIA_DB_HANDLE;

/* Session */

/// The shared connection, opened when there is none; null when that fails (the next call retries).
MEDIIDX_EXPORT struct tavodb_connection* MediaDBConnGet(void);
/// Closes the shared connection; harmless when there is none.
MEDIIDX_EXPORT void MediaDBConnClose(void);
/// Runs a text of one or more statements. Returns the affected rows of the last, or -1.
MEDIIDX_EXPORT int MediaDBExec(const char* sql);

/// Selects rows of a table (types 0 to 4). Null or empty `columns` means all; null or empty other
/// texts leave their clauses out. `escapeWhere` 1 escapes the values within `where`; any other
/// value takes it as it stands. `rangeA` is the number of rows to skip, `rangeB` the most rows to
/// return; 0 and 0 return all. Returns a handle for MediaInfoDBClose, or null.
MEDIIDX_EXPORT MEDIA_DB_HANDLE* MediaInfoDBOpenEx(MEDIA_TABLE_TYPE tableType, const char* columns,
                                                  const char* where, const char* groupBy,
                                                  const char* orderBy, uint32_t rangeA,
                                                  uint32_t rangeB, int escapeWhere);
MEDIIDX_EXPORT MEDIA_DB_HANDLE* MediaInfoDBOpen(MEDIA_TABLE_TYPE tableType, const char* columns,
                                                const char* where, const char* groupBy,
                                                const char* orderBy, uint32_t rangeA,
                                                uint32_t rangeB, int escapeWhere);
/// Frees a handle and its rows; null is ignored. The connection stays open.
MEDIIDX_EXPORT void MediaInfoDBClose(MEDIA_DB_HANDLE* handle);

/* Queries */

/// Counts rows (per group, the first group only, with `groupBy`); -1 on failure.
MEDIIDX_EXPORT int MediaInfoDBGetCount(MEDIA_TABLE_TYPE tableType, const char* column,
                                       const char* where, const char* groupBy, int escapeWhere);
/// Fetches the next row into `info`, which is zero-filled first; -1 at the end.
MEDIIDX_EXPORT int MediaInfoDBGet(MEDIA_DB_HANDLE* handle, struct __tag_TAVO_MEDIA_INFO* info);
/// Reads the current row into `info`.
MEDIIDX_EXPORT int MediaInfoDBGetRecored(MEDIA_DB_HANDLE* handle,
                                         struct __tag_TAVO_MEDIA_INFO* info);
/// Reads a row of any result by column name. Columns that are null or absent read as empty or 0.
MEDIIDX_EXPORT int MediaInfoDBGetRecoredData(struct tavodb_result* result, uint32_t row,
                                             struct __tag_TAVO_MEDIA_INFO* info);
/// Fetches the row of one path, or, with `suffixMatch`, the first row whose path ends with it.
MEDIIDX_EXPORT int MediaInfoDBGetOneEx2(MEDIA_TABLE_TYPE tableType, const char* path,
                                        struct __tag_TAVO_MEDIA_INFO* info, int suffixMatch);
MEDIIDX_EXPORT int MediaInfoDBGetOneEx(MEDIA_TABLE_TYPE tableType, const char* path,
                                       struct __tag_TAVO_MEDIA_INFO* info, int suffixMatch);
MEDIIDX_EXPORT int MediaInfoDBGetOne(MEDIA_TABLE_TYPE tableType, const char* path,
                                     struct __tag_TAVO_MEDIA_INFO* info, int suffixMatch);
/// Fetches the given columns of the row of one path.
MEDIIDX_EXPORT int MediaInfoDBGetOneByField(MEDIA_TABLE_TYPE tableType, const char* path,
                                            const char* columns,
                                            struct __tag_TAVO_MEDIA_INFO* info);
/// Adds a value to a candidate list for MediaInfoDBBatchOpen.
MEDIIDX_EXPORT int MediaInfoDBBatchPara(struct tlib_szlist* candidates, const char* candidate);
/// Selects the rows whose `field` is one of the candidates. Returns a handle for
/// MediaInfoDBBatchClose, or null.
MEDIIDX_EXPORT MEDIA_DB_HANDLE* MediaInfoDBBatchOpen(MEDIA_TABLE_TYPE tableType,
                                                     const char* columns, const char* field,
                                                     struct tlib_szlist* candidates,
                                                     const char* groupBy, const char* orderBy,
                                                     uint32_t rangeA, uint32_t rangeB);
/// Fetches the first row whose `field` equals `value` without regard to case.
MEDIIDX_EXPORT int MediaInfoDBBatchFind(MEDIA_DB_HANDLE* handle, const char* field,
                                        const char* value, struct __tag_TAVO_MEDIA_INFO* info);
/// Fills a hash from the value of `field` to the row's number, for MediaInfoDBHashFind.
MEDIIDX_EXPORT int MediaInfoDBGenHash(MEDIA_DB_HANDLE* handle, const char* field,
                                      struct tlib_szhash* hash);
/// Fetches the row that the hash holds under `key`; `field` is not read.
MEDIIDX_EXPORT int MediaInfoDBHashFind(MEDIA_DB_HANDLE* handle, const char* field, const char* key,
                                       struct __tag_TAVO_MEDIA_INFO* info,
                                       struct tlib_szhash* hash);
MEDIIDX_EXPORT void MediaInfoDBBatchClose(MEDIA_DB_HANDLE* handle);
/// The "path" of the next row, valid until the handle closes; null at the end.
MEDIIDX_EXPORT const char* PlaylistDBGet(MEDIA_DB_HANDLE* handle);

/* Writes. Texts of the given records are trimmed in place. */

/// Stores a file (types 0 to 3), replacing the rows of its path. A music save sets `info->id`.
MEDIIDX_EXPORT int MediaInfoDBSave(MEDIA_TABLE_TYPE type, struct __tag_TAVO_MEDIA_INFO* info);
/// Rewrites a row (types 0 to 3): music by path, the others by id.
MEDIIDX_EXPORT int MediaInfoDBUpdate(MEDIA_TABLE_TYPE type, struct __tag_TAVO_MEDIA_INFO* info);
/// Removes the rows of a path (types 0 to 5), or of everything below it (6).
MEDIIDX_EXPORT int MediaInfoDBDelete(MEDIA_TABLE_TYPE type, const char* path);
/// Stores a folder, as a new row or over the one that is there.
MEDIIDX_EXPORT int DirInfoDBSave(const DIR_INFO_REC* dirInfo);
/// Stores the virtual tracks that a cue sheet cuts out of its audio files.
MEDIIDX_EXPORT int MediaInfoVirtualDBSave(struct _PLAYLIST_REC* list,
                                          struct __tag_TAVO_MEDIA_INFO* cueInfo);
/// Removes the virtual tracks of a cue sheet.
MEDIIDX_EXPORT int MediaInfoVirtualDBDelete(const char* cuePath);
/// Stores one transcoded copy of a video.
MEDIIDX_EXPORT int MediaInfoVideoConvertDBSave(VIDEO_CONVERT_REC* record);
/// Stores track gain, track peak, album gain and album peak (dB, linear) of a track row.
MEDIIDX_EXPORT int MediaInfoAudioRGMetadataDBSave(const float* gains, uint32_t trackId);

/* Online state and maintenance */

/// Marks rows online (`online` not 0) or offline: all rows with a null or empty path, otherwise
/// those of this path, or, with `prefixMatch`, whose path begins with it (no slash is added).
MEDIIDX_EXPORT void MediaInfoDBSetOnline(const char* path, int prefixMatch, int online);
/// Deletes offline rows: all, or only those below "/volumeN/", the share's name and a slash.
MEDIIDX_EXPORT void MediaInfoDBUUIDDropOffline(const char* shareName);
/// Empties the database, personal libraries and transcoded copies apart.
MEDIIDX_EXPORT int MediaInfoDBDeleteAll(void);
MEDIIDX_EXPORT int MediaDBVacuum(void);

/// Creates the empty marker file when it does not exist. Not 0 when it was there already, 0 when it
/// could not be opened, else the result of closing it.
MEDIIDX_EXPORT int TAVOIndexTableDirtySet(const char* markerPath);
/// Both create the marker by which other programs learn that music or video rows changed; `flag` is
/// not read.
MEDIIDX_EXPORT int TAVOIndexMusicTableDirtySet(int flag);
MEDIIDX_EXPORT int TAVOIndexVideoTableDirtySet(int flag);

#ifdef __cplusplus
}
#endif

#endif
