/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// The requests by which an indexing daemon keeps the index, and the helpers they lean on.
///
/// A path that does not belong in the index is no error: it is ignored with 0.
#ifndef MEDIIDX_REQUEST_H_
#define MEDIIDX_REQUEST_H_

#include "mediidx/record.h"

#ifdef __cplusplus
#include <json/value.h>

extern "C" {
#endif

/* Files */

/// Indexes a file, replacing what the index holds of its path. A cue sheet (type 3) brings its
/// virtual tracks. The texts of `info` are trimmed; a music add sets its id.
MEDIIDX_EXPORT int TAVOMediaIndexAdd(struct __tag_TAVO_MEDIA_INFO* info, MEDIA_TABLE_TYPE type);
/// The same request under its second name.
MEDIIDX_EXPORT int TAVOMediaIndexReindexUpdate(struct __tag_TAVO_MEDIA_INFO* info,
                                               MEDIA_TABLE_TYPE type);
/// Adds `count` files of one type, as if each were added in turn, but together: in one transaction,
/// and in as many round trips to the database for a thousand records as for one. 0, or -1 when any
/// failed. `results` (null when of no interest) receives one result a record, as TAVOMediaIndexAdd
/// gives it. The texts of the records are trimmed; a music add sets their ids. Where the database
/// refuses the files together, they are added one by one, so that only the bad ones fail. Within a
/// transaction that the caller has begun on the shared connection they become part of that, which
/// the first bad one ends.
MEDIIDX_EXPORT int TAVOMediaIndexAddMany(struct __tag_TAVO_MEDIA_INFO* records, unsigned count,
                                         MEDIA_TABLE_TYPE type, int* results);
/// Removes a file that is gone; -1 while it still exists.
MEDIIDX_EXPORT int TAVOMediaIndexDelete(const char* path);
/// Moves a file. A move into the index gives -1 even when it succeeded.
MEDIIDX_EXPORT int TAVOMediaIndexRename(struct __tag_TAVO_MEDIA_INFO* info, MEDIA_TABLE_TYPE type,
                                        const char* oldPath);
#ifdef __cplusplus
/// Indexes a file from a JSON object: its path under "szPath", its other fields as
/// MediaInfoJson2Object reads them, and optionally "rg_track_gain", "rg_track_peak",
/// "rg_album_gain" and "rg_album_peak".
MEDIIDX_EXPORT int TAVOMediaIndexAdd_Json(const Json::Value& json, MEDIA_TABLE_TYPE type);
/// TAVOMediaIndexAddMany for an array of such objects; `results` has room for one result each. A
/// value that is no array gives -1, and no results.
MEDIIDX_EXPORT int TAVOMediaIndexAddMany_Json(const Json::Value& array, MEDIA_TABLE_TYPE type,
                                              int* results);
MEDIIDX_EXPORT int TAVOMediaIndexReindexUpdate_Json(const Json::Value& json, MEDIA_TABLE_TYPE type);
MEDIIDX_EXPORT int TAVOMediaIndexRename_Json(const Json::Value& json, MEDIA_TABLE_TYPE type,
                                             const char* oldPath);
#endif

/* Folders */

MEDIIDX_EXPORT int TAVOMediaIndexDirAdd(const DIR_INFO_REC* dirInfo);
/// Adds `count` folders together; otherwise like TAVOMediaIndexAddMany.
MEDIIDX_EXPORT int TAVOMediaIndexDirAddMany(const DIR_INFO_REC* records, unsigned count,
                                            int* results);
MEDIIDX_EXPORT int TAVOMediaIndexReindexDirUpdate(const DIR_INFO_REC* dirInfo);
/// Removes a folder and everything below it. An empty path is refused with -1.
MEDIIDX_EXPORT int TAVOMediaIndexDirDelete(const char* path);
/// Moves a folder. A move into the index gives -1 even when it succeeded.
MEDIIDX_EXPORT int TAVOMediaIndexDirRename(const DIR_INFO_REC* dirInfo, const char* oldPath);
/// Clears a folder tree before it is indexed again. An empty path is refused with -1.
MEDIIDX_EXPORT int TAVOMediaIndexPreReindex(const char* path);
/// Clears the whole database before it is indexed again.
MEDIIDX_EXPORT int TAVOMediaIndexPreReindexAll(void);

/* Database */

/// MediaInfoDBGetOne under its second name.
MEDIIDX_EXPORT int TAVOMediaIndexDBGetOne(MEDIA_TABLE_TYPE tableType, const char* path,
                                          struct __tag_TAVO_MEDIA_INFO* info, int suffixMatch);
/// MediaDBVacuum under its second name.
MEDIIDX_EXPORT int TAVOMediaIndexDBVacuum(void);
/// Closes the shared connection; always 0.
MEDIIDX_EXPORT int TAVOMediaIndexDBClose(void);

/* Helpers */

/// 1 when the path belongs in the index for that media type (4: a folder), 0 when not, -1 on error.
MEDIIDX_EXPORT int TAVOMediaIndexIsIndexPath(const char* path, MEDIA_TABLE_TYPE type);
/// 1 when the share is indexed, 0 when not, -1 for a null or empty name. A name that begins with
/// "/" is taken as the share's folder, any other is looked up.
MEDIIDX_EXPORT int TAVOMediaintIndexIsShareIndexed(const char* share);
/// Writes the upper-cased name into `search` and, without one leading article, into `sort`; returns
/// `sort`. Lengths are those of the buffers, terminators included.
MEDIIDX_EXPORT char* TAVOMediaIndexGetSortAndSearchProperty(const char* name, char* search,
                                                            int searchLength, char* sort,
                                                            int sortLength);
/// The user's id, or 0.
MEDIIDX_EXPORT uint32_t TAVOMediaIndexGetUserIdFromName(const char* name);
/// The id of the user whose home folder holds the path, or 0.
MEDIIDX_EXPORT uint32_t TAVOMediaIndexGetUserIdFromPath(const char* path);
/// 1 when the path is the music folder of this home (which ends with "/"), or lies below it.
MEDIIDX_EXPORT int TAVOMediaIndexIsUnderPersonalLibPath(const char* home, const char* path);
/// Fills the hash with the song's star ratings by user id, both decimal; 1, or 0 on failure.
MEDIIDX_EXPORT int TAVOMediaIndexGetAllUserDefinedSongRating(const char* path,
                                                             struct tlib_szhash* ratings);

#ifdef __cplusplus
}
#endif

#endif
