/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// Shares, users, home folders, per-file attributes and mounts (libtavosdk).
#ifndef TAVOSDK_H_
#define TAVOSDK_H_

#include <stddef.h>
#include <stdint.h>

#include "tavocore.h"

#ifdef __cplusplus
extern "C" {
#endif

#define TAVOSDK_EXPORT __attribute__((visibility("default")))

/* Shares: "/usr/tavo/etc/share.conf", a JSON object from name to {"path": folder, "status": flags}
 */

/// Looks a share up by name (without regard to case when no name matches exactly). 0 and a record
/// for TAVOShareFree; negative when there is none.
TAVOSDK_EXPORT int TAVOShareGet(const char* name, TAVOSHARE** share);
/// Frees a record; null is ignored.
TAVOSDK_EXPORT void TAVOShareFree(TAVOSHARE* share);
/// Writes the volume root of an absolute path into `buffer`: the folder above the share that holds
/// the path, otherwise its first part ("/volume1"). 0, or negative for a path that is not absolute,
/// a root of "/" alone, or a buffer that is too small.
TAVOSDK_EXPORT int TAVOShareBinPathGet(const char* path, char* buffer, int size);
/// Clears the indexed bit of a share; negative on failure.
TAVOSDK_EXPORT int ShareIndexStatusClear(const char* name);

/* Users: the system's, or those of etc/passwd below a root that has its own */

typedef struct TAVOUSER {
  char name[256];
  uint32_t uid;
  uint32_t gid;
  char home[4096];
} TAVOUSER;

/// Finds a user's ids; either pointer may be null. 0, or negative when there is no such user.
TAVOSDK_EXPORT int TAVOUserGetUGID(const char* name, uint32_t* uid, uint32_t* gid);
/// Finds a user by id. 0 and a record for TAVOUserFree; negative when there is none.
TAVOSDK_EXPORT int TAVOUserGetByUID(uint32_t uid, TAVOUSER** user);
/// Frees a record; null is ignored.
TAVOSDK_EXPORT void TAVOUserFree(TAVOUSER* user);

/* Home folders of real users: ids from 1000 on, 65534 excepted, with an absolute home but "/" */

typedef struct TAVOHOMECHECK {
  char user[256];
  char home[4096];  ///< The user's home folder, without a trailing slash.
} TAVOHOMECHECK;

/// 1 and a record for TAVOHomeCheckResultFree when the path is a user's home folder or lies below
/// it (the deepest home counts), 0 when it is in none, -1 on error. Homes are compared as the user
/// database names them and as they resolve. The two flags are reserved; callers pass 1.
TAVOSDK_EXPORT int TAVOServiceHomePathCheck(const char* path, int flagA, int flagB,
                                            TAVOHOMECHECK** result);
/// Frees a record; null is ignored.
TAVOSDK_EXPORT void TAVOHomeCheckResultFree(TAVOHOMECHECK* result);

/* Files */

/// Writes the folder of a file's attributes, "@eaDir/<name>" beside the file, into `buffer`. 0, or
/// negative when there is no such name or it does not fit. `flags` is reserved; callers pass 0.
TAVOSDK_EXPORT int TAVOEADirPath(int flags, const char* path, char* buffer, int size);
/// 1 when the path (or the nearest folder above it that exists) lies on a network mount, else 0.
TAVOSDK_EXPORT int IndexIsPathRemoteMount(const char* path);

#ifdef __cplusplus
}
#endif

#endif
