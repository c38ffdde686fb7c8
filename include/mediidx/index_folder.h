/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// The folders chosen for indexing: configuration file, in-memory copy and coverage queries.
///
/// The file "/usr/tavo/etc/index_folder.conf" is a JSON array of objects with "name", "path"
/// (relative to the volume: a slash, the share's name, further folders), "photo", "music", "video"
/// and "default". The in-memory copy holds absolute paths, longest first. Media kinds are 0 music,
/// 1 video and 2 photo; queries take 3 (playlists) as music.
#ifndef MEDIIDX_INDEX_FOLDER_H_
#define MEDIIDX_INDEX_FOLDER_H_

#include "mediidx/types.h"

#ifdef __cplusplus
#include <json/value.h>

#include <string>

extern "C" {

/// The in-memory copy: an empty array until IndexFolderInit or IndexFolderUpdate. A caller may
/// replace it, clear it and append to it at any time, and change what it holds between
/// IndexFolderConfLock and IndexFolderConfUnLock.
extern MEDIIDX_EXPORT Json::Value gIndexFolderConf;
#endif

/// 1 while a reload was asked for and waits for IndexFolderConfUnLock.
extern MEDIIDX_EXPORT char gIsDirty;
/// 1 while reloads wait.
extern MEDIIDX_EXPORT char gIsBlockUpdate;

/* In-memory copy */

/// Loads the file; 0.
MEDIIDX_EXPORT int IndexFolderInit(void);
/// Loads the file again, or, between lock and unlock, asks the unlock to do so.
MEDIIDX_EXPORT void IndexFolderUpdate(void);
/// Defers reloads. Not a mutex, and not counted.
MEDIIDX_EXPORT void IndexFolderConfLock(void);
MEDIIDX_EXPORT void IndexFolderConfUnLock(void);
/// Empties the in-memory copy.
MEDIIDX_EXPORT void IndexFolderFree(void);
MEDIIDX_EXPORT int IndexFolderSizeGet(void);
/// Writes the entry's absolute folder into `buffer`; 1, or -1 for a bad index or buffer.
MEDIIDX_EXPORT int IndexFolderPathAt(unsigned index, char* buffer, int size);
/// 1 when the entry is indexed for the media kind, else 0.
MEDIIDX_EXPORT int IndexFolderIsIndexTypeAt(unsigned index, int kind);
/// Writes the share name of a share-relative path into `buffer`; 1, or -1 for a null or empty path.
MEDIIDX_EXPORT int IndexFolderShareNameGet(const char* path, char* buffer, int size);

/* Coverage */

/// The media-kind flag of the deepest entry that holds the path, 0 when none does; -1 for a null
/// path, a folder or transcoding kind, or an empty configuration.
MEDIIDX_EXPORT int IndexFolderIsPathIndexed(const char* path, int kind);
/// 1 when an entry holds the folder, else -1.
MEDIIDX_EXPORT int IndexFolderIsFolderIndexed(const char* path);
/// 1 when an entry lies strictly above the folder, else -1.
MEDIIDX_EXPORT int IndexFolderIsFolderHasParent(const char* path);
/// 1 when an entry is the share's folder or lies below it, without regard to case; else -1.
MEDIIDX_EXPORT int IndexFolderIsCoveredByShare(const char* sharePath);
/// The position of the entry of exactly this folder, or -1.
MEDIIDX_EXPORT int IndexFolderPositionGet(const char* path);

#ifdef __cplusplus
}  // extern "C"

/* File. These, and what follows, carry type-qualified symbol names. */

/// The file's content as it stands; an empty array when there is none.
MEDIIDX_EXPORT Json::Value IndexFolderConfOpen();
/// Writes the file in place and tells the indexing daemons; 0, or -1.
MEDIIDX_EXPORT int IndexFolderConfSave(const Json::Value& conf);
MEDIIDX_EXPORT bool IsIndexFolderConfExist();
/// Writes the entries of the shares photo, music and video; the result of the save.
MEDIIDX_EXPORT int WriteDefaultConf();
/// What a settings editor shows: the rules of the default shares, then the stored entries.
MEDIIDX_EXPORT Json::Value IndexFolderConfLoad();
MEDIIDX_EXPORT Json::Value createRule(std::string name, std::string path, bool photo, bool music,
                                      bool video, bool isDefault);
/// The share-relative folder behind "/var/services/" and the kind, or an empty text.
MEDIIDX_EXPORT std::string getDefaultSharePath(const char* kind);
/// The entry of that folder (with `useFallback` of "/<kind>" when there is none), or null.
MEDIIDX_EXPORT Json::Value createDefaultShareRule(const char* kind, int useFallback);
/// Logs every entry of the in-memory copy.
MEDIIDX_EXPORT void printIndexFolderConf();
/// Signals the indexing daemons to read the file again.
MEDIIDX_EXPORT void IndexServiceReload();
/// Fills the in-memory copy from the file; 0.
MEDIIDX_EXPORT int loadConf();

/* Paths as text */

/// "/photo/2010" gives "photo". Throws std::out_of_range for an empty path.
MEDIIDX_EXPORT std::string getShareName(std::string path);
/// "/volume1/photo/a" gives "/volume1".
MEDIIDX_EXPORT std::string getVolumePath(std::string path);
/// "/photo/2010/a" gives "2010/a".
MEDIIDX_EXPORT std::string getFolderPath(std::string path);
/// Joins with one "/"; "/a/" and "/b" give "/a///b".
MEDIIDX_EXPORT std::string appendPath(std::string first, std::string second);
/// True when the path is the parent or lies below it.
MEDIIDX_EXPORT bool IsEqualOrSubPath(const std::string& path, const std::string& parent);
/// Finds the deepest entry of a share-relative configuration that holds the path of an existing
/// folder. 1 and a pointer into `conf`, 0 when there is none, -1 on bad input.
MEDIIDX_EXPORT int FindIndexFolderByPath(const Json::Value& conf, const char* path,
                                         const Json::Value** out);
#endif

#endif
