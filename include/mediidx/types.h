/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// Media types and the platform's opaque handles, as every other header uses them.
///
/// Conventions of the whole interface:
/// 1. Results are signed 32-bit numbers, 0 for success and -1 for failure, unless a comment says
///    otherwise; counts are never negative, handles and lists are null on failure.
/// 2. Every failure is one line in the system log.
/// 3. Texts are NUL-terminated UTF-8. A text argument is borrowed for the call, never kept.
/// 4. Nothing here is guarded against a second thread: use the library from one thread at a time.
#ifndef MEDIIDX_TYPES_H_
#define MEDIIDX_TYPES_H_

#include <stdint.h>

/// Marks what the shared library exports.
#define MEDIIDX_EXPORT __attribute__((visibility("default")))

/// What a file or row is; also the position of its table in the table of table names.
typedef uint32_t MEDIA_TABLE_TYPE;

enum {
  MEDIA_TABLE_MUSIC = 0,
  MEDIA_TABLE_VIDEO = 1,
  MEDIA_TABLE_PHOTO = 2,
  MEDIA_TABLE_PLAYLIST = 3,  ///< Cue sheets are playlists too.
  MEDIA_TABLE_DIRECTORY = 4,
  MEDIA_TABLE_VIDEO_CONVERT = 5,  ///< Transcoded copies of videos.
  MEDIA_TABLE_FOLDER = 6          ///< A whole folder tree; accepted by deletes only.
};

/// Handles of the platform libraries; their functions are in the platform's own headers.
struct tavodb_connection;  ///< A database connection.
struct tavodb_result;      ///< The rows of one SELECT.
struct tlib_szlist;        ///< A list of texts.
struct tlib_szhash;        ///< A map from text to text.

#endif
