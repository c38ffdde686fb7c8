/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// The music catalogue: the `track` table, its side tables and the album-artist rules.
///
/// All take an open connection. Results are 0, or the stated count or id, and -1 on failure; what
/// was written before a failure stays. `isVirtual` not 0 means a track cut from a cue sheet, whose
/// own record is `cueInfo` (ignored otherwise); `isCue` not 0 means that `path` is a cue sheet's.
#ifndef MEDIIDX_CATALOGUE_H_
#define MEDIIDX_CATALOGUE_H_

#include "mediidx/record.h"

#ifdef __cplusplus
extern "C" {
#endif

/* Whole tracks */

/// Inserts a track row with all its side rows; sets `info->id`.
MEDIIDX_EXPORT int MediaDBInsertIntoTrackRelatedTables(struct tavodb_connection* conn,
                                                       struct __tag_TAVO_MEDIA_INFO* info,
                                                       const struct __tag_TAVO_MEDIA_INFO* cueInfo,
                                                       int isVirtual, int64_t userid);
/// Rewrites the track row `info->id` and its genre, composer, artist and album rows.
MEDIIDX_EXPORT int MediaDBUpdateTrackRelatedTables(struct tavodb_connection* conn,
                                                   const struct __tag_TAVO_MEDIA_INFO* info);
/// Removes the genre, composer, artist and album rows of `info->id`, album artists recovered first.
MEDIIDX_EXPORT int MediaDBDeleteRecordsInRelatedTables(struct tavodb_connection* conn,
                                                       const struct __tag_TAVO_MEDIA_INFO* info);
/// Gives albums that the leaving file or cue sheet leaves to one artist that artist.
MEDIIDX_EXPORT int MediaDBUpdateAlbumTrackTable(struct tavodb_connection* conn, const char* path,
                                                int isCue);

/* The track row */

MEDIIDX_EXPORT int MediaDBInsertIntoTrackTable(struct tavodb_connection* conn,
                                               const struct __tag_TAVO_MEDIA_INFO* info,
                                               const struct __tag_TAVO_MEDIA_INFO* cueInfo,
                                               int isVirtual, int64_t userid);
MEDIIDX_EXPORT int MediaDBUpdateTrackTable(struct tavodb_connection* conn,
                                           const struct __tag_TAVO_MEDIA_INFO* info);
/// Finds the row of the path, kind and track number, stores its id into `info->id` and returns it.
MEDIIDX_EXPORT int MediaDBFindInsertedTrackID(struct tavodb_connection* conn,
                                              struct __tag_TAVO_MEDIA_INFO* info, int isVirtual);
/// Counts the virtual rows of an actual record's path, or the actual ones of a virtual record's.
MEDIIDX_EXPORT int MediaDBFindRecordsWithSamePath(struct tavodb_connection* conn,
                                                  const struct __tag_TAVO_MEDIA_INFO* info,
                                                  int isVirtual);
MEDIIDX_EXPORT int MediaDBUpdateHasVirtualColumn(struct tavodb_connection* conn,
                                                 const struct __tag_TAVO_MEDIA_INFO* info);
/// Copies audio properties from the actual record to the virtual ones (0) or into this one (not 0).
MEDIIDX_EXPORT int MediaDBUpdateVirtualMusicProperties(struct tavodb_connection* conn,
                                                       const struct __tag_TAVO_MEDIA_INFO* info,
                                                       int isVirtual);

/* Side rows, one statement each */

MEDIIDX_EXPORT int MediaDBInsertIntoGenreTrackTable(struct tavodb_connection* conn,
                                                    const struct __tag_TAVO_MEDIA_INFO* info,
                                                    int trackId);
MEDIIDX_EXPORT int MediaDBInsertOneGenreRecord(struct tavodb_connection* conn, const char* genre,
                                               int trackId);
MEDIIDX_EXPORT int MediaDBInsertIntoComposerTrackTable(struct tavodb_connection* conn,
                                                       const struct __tag_TAVO_MEDIA_INFO* info,
                                                       int trackId);
MEDIIDX_EXPORT int MediaDBInsertIntoArtistTrackTable(struct tavodb_connection* conn,
                                                     const struct __tag_TAVO_MEDIA_INFO* info,
                                                     int trackId);
/// `fromAlbumArtist` not 0: the album artist comes from a tag, or the album has several artists.
MEDIIDX_EXPORT int MediaDBInsertIntoAlbumTrackTable(struct tavodb_connection* conn,
                                                    const struct __tag_TAVO_MEDIA_INFO* info,
                                                    const char* albumArtist, int trackId,
                                                    int fromAlbumArtist);
MEDIIDX_EXPORT int MediaDBInsertIntoVirtualInfoTrackTable(
    struct tavodb_connection* conn, const struct __tag_TAVO_MEDIA_INFO* info,
    const struct __tag_TAVO_MEDIA_INFO* cueInfo, int trackId);
/// Stores every user's star rating of the song, read from its rating file.
MEDIIDX_EXPORT int MediaDBInsertIntoRatingTrackTable(struct tavodb_connection* conn,
                                                     const struct __tag_TAVO_MEDIA_INFO* info,
                                                     int trackId, int isVirtual);
/// `gains`: track gain, track peak, album gain, album peak.
MEDIIDX_EXPORT int MediaDBInsertIntoReplayGainTrackTable(struct tavodb_connection* conn,
                                                         const float* gains, int trackId);

/* Album artists */

/// Counts rows that speak against the track's artist being the album's only one.
MEDIIDX_EXPORT int MediaDBFindAlbumCollapseSingleAlbumArtist(
    struct tavodb_connection* conn, const struct __tag_TAVO_MEDIA_INFO* info);
/// Blanks the album artist of the album's rows that took it from their artist.
MEDIIDX_EXPORT int MediaDBUpdateAlbumWithMultipleAlbumArtist(
    struct tavodb_connection* conn, const struct __tag_TAVO_MEDIA_INFO* info);
/// Counts the rows of the file or cue sheet whose album has several artists.
MEDIIDX_EXPORT int MediaDBCheckRecordInMultipleAlbumArtist(struct tavodb_connection* conn,
                                                           const char* path, int isCue);
/// Counts the artists that such albums have without the file or cue sheet.
MEDIIDX_EXPORT int MediaDBCheckRecordsWithMultipleAlbumArtist(struct tavodb_connection* conn,
                                                              const char* path, int isCue);
/// Gives such albums their one remaining artist.
MEDIIDX_EXPORT int MediaDBRecoverToSingleAlbumArtist(struct tavodb_connection* conn,
                                                     const char* path, int isCue);

/* Personal folders */

/// Counts the personal_directory rows of a path.
MEDIIDX_EXPORT int MediaDBFindPersonalDirWithSamePath(struct tavodb_connection* conn,
                                                      const char* path);

#ifdef __cplusplus
}
#endif

#endif
