/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// Playlist files (M3U, PLS, WPL) as lists of media records.
#ifndef MEDIIDX_PLAYLIST_H_
#define MEDIIDX_PLAYLIST_H_

#include "mediidx/record.h"

#ifdef __cplusplus
extern "C" {
#endif

/// Which entries of a playlist are kept.
enum {
  MEDIIDX_KEEP_KNOWN = 1,    ///< Entries that the index knows.
  MEDIIDX_KEEP_UNKNOWN = 2,  ///< Local entries that it does not know.
  MEDIIDX_KEEP_STREAMS = 4   ///< Entries beginning with "http" that it does not know.
};

/// Reads a playlist given by the decimal id of its row, known entries only, with id and path.
MEDIIDX_EXPORT struct _PLAYLIST_REC* ParsePlayList(const char* playlistId, int* count, int offset,
                                                   int limit);
/// Reads a playlist given by the decimal id of its row. `fields` are the columns read of known
/// entries. `*count` receives the number of kept entries; the list holds those from `offset` on, at
/// most `limit` (0: all, negative: none). Freed with TAVOPlaylistRecFree; null when empty or
/// failed.
MEDIIDX_EXPORT struct _PLAYLIST_REC* ParsePlayListByField(const char* playlistId, int* count,
                                                          int offset, int limit, const char* fields,
                                                          int flags);
/// The same for the playlist's path. With all flags and a negative limit the entries are only
/// counted, in little memory and without the database.
MEDIIDX_EXPORT struct _PLAYLIST_REC* ParsePlayListByFieldGivenPath(const char* playlistPath,
                                                                   int* count, int offset,
                                                                   int limit, const char* fields,
                                                                   int flags);
/// Resolves one entry against its playlist's folder into `out` (4,096 bytes). Backslashes of
/// `entry` become slashes in place. 0, or 1 when the music link cannot be read.
MEDIIDX_EXPORT int ABSPlayListPath(const char* playlistPath, char* entry, char* out);
/// Reads one M3U tag line into the record; 1 for a tag or comment line, 0 for an entry.
MEDIIDX_EXPORT int GetExtInfoM3U(const char* line, struct __tag_TAVO_MEDIA_INFO* info);
/// Frees a list; null is accepted.
MEDIIDX_EXPORT void TAVOPlaylistRecFree(struct _PLAYLIST_REC* list);

#ifdef __cplusplus
}
#endif

#endif
