/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// Strings, lists, hashes, key/value files, programs and signals (libtavocore).
#ifndef TAVOCORE_H_
#define TAVOCORE_H_

#include <stddef.h>
#include <stdint.h>
#include <stdio.h>

#ifdef __cplusplus
extern "C" {
#endif

#define TAVOCORE_EXPORT __attribute__((visibility("default")))

/* Root */

/// Makes the platform libraries look up the system files that they name themselves (shares, users,
/// settings) below this directory. Null or empty, the default, means the real paths. -1 when the
/// text does not fit 4,095 bytes.
TAVOCORE_EXPORT int TAVOPlatformRootSet(const char* root);
/// The root that was set, never null; empty by default.
TAVOCORE_EXPORT const char* TAVOPlatformRootGet(void);

/* Errors of the platform */

/// The last error code, and the source file (never null) and line that set it.
TAVOCORE_EXPORT int TLIBCErrGet(void);
TAVOCORE_EXPORT const char* TLIBCErrorGetFile(void);
TAVOCORE_EXPORT int TLIBCErrorGetLine(void);
/// Sets them; `file` must outlive the next call.
TAVOCORE_EXPORT void TLIBCErrSetEx(int code, const char* file, int line);

/// Codes that the platform itself sets.
enum {
  TAVO_ERR_OUT_OF_MEMORY = 0x0200,
  TAVO_ERR_BAD_PARAMETERS = 0x0D00,
  TAVO_ERR_OPEN_FAILED = 0x0900,
  TAVO_ERR_SHARE_NOT_FOUND = 0x1400,
  TAVO_ERR_USER_NOT_FOUND = 0x1D00
};

/* Formatted texts */

/// Formats into a new text for TLIBCStrPut, printf-style; null on failure.
TAVOCORE_EXPORT char* TLIBCStrGet(const char* format, ...) __attribute__((format(printf, 1, 2)));
/// The same call under its second name.
TAVOCORE_EXPORT char* TLIBCStrGetEx(const char* format, ...) __attribute__((format(printf, 1, 2)));
/// Frees such a text; null is ignored.
TAVOCORE_EXPORT void TLIBCStrPut(char* text);

/* Text */

/// Removes leading and trailing white space in place; returns the text.
TAVOCORE_EXPORT char* StringTrim(char* text);
/// Removes leading and trailing blanks (spaces and tabs) in place; returns the text.
TAVOCORE_EXPORT char* TLIBCStrTrimSpace(char* text);
/// 1 when the text is valid UTF-8, else 0.
TAVOCORE_EXPORT int IsUnicodeString(const char* text);
/// Converts a text from a code page ("enu", "jpn", "rus", or an iconv name such as "CP1252") to
/// UTF-8 in `out` of `size` bytes, terminated. Returns the bytes written, terminator included;
/// below 1 when the code page is unknown, the text is not valid in it, or it does not fit.
TAVOCORE_EXPORT int TLIBCUnicodeStrCPToUTF8(const char* codepage, const char* text, char* out,
                                            int size);
/// Compares two UTF-8 texts without regard to case; 0 when equal.
TAVOCORE_EXPORT int TLIBCUnicodeUTF8StrCaseCmp(const char* a, const char* b);

/* List of texts */

typedef struct tlib_szlist TLIBSZLIST;

/// `size` is a hint of how many bytes of text will come. Null on failure.
TAVOCORE_EXPORT TLIBSZLIST* TLIBCSzListAlloc(int size);
TAVOCORE_EXPORT void TLIBCSzListFree(TLIBSZLIST* list);
/// Appends a copy; -1 on failure.
TAVOCORE_EXPORT int TLIBCSzListPush(TLIBSZLIST* list, const char* text);
TAVOCORE_EXPORT int TLIBCSzListCount(const TLIBSZLIST* list);
/// The text at a position from 0, owned by the list; null past the end.
TAVOCORE_EXPORT const char* TLIBCSzListGet(const TLIBSZLIST* list, int index);

/* Map from text to text */

typedef struct tlib_szhash TLIBSZHASH;

/// `size` is a hint of how many entries will come. Null on failure.
TAVOCORE_EXPORT TLIBSZHASH* TLIBCSzHashAlloc(int size);
TAVOCORE_EXPORT void TLIBCSzHashFree(TLIBSZHASH* hash);
/// Stores a copy of the value under a copy of the key, over an earlier one; -1 on failure.
TAVOCORE_EXPORT int TLIBCSzHashSetValue(TLIBSZHASH* hash, const char* key, const char* value);
/// The value, owned by the hash; null when the key is absent.
TAVOCORE_EXPORT const char* TLIBCSzHashGetValue(const TLIBSZHASH* hash, const char* key);
TAVOCORE_EXPORT int TLIBCSzHashCount(const TLIBSZHASH* hash);
/// Visits every entry in the order of first insertion: `*cursor` starts at 0. 1 with key and value,
/// 0 at the end.
TAVOCORE_EXPORT int TLIBCSzHashNext(const TLIBSZHASH* hash, int* cursor, const char** key,
                                    const char** value);

/* Files */

/// 1 when the path exists and is no folder, else 0. `flags` is not read.
TAVOCORE_EXPORT int IsFileExist(const char* path, int flags);
/// 1 when the path is a folder, else 0.
TAVOCORE_EXPORT int IsDirExist(const char* path);
/// 1 when the path exists, whatever it is, else 0.
TAVOCORE_EXPORT int TLIBCFileExist(const char* path);
/// Reads one key of a file of key=value lines ("#" begins a comment line; the value may stand in
/// double quotes) into `buffer`, cut to `size` with its terminator. 1 when found, 0 when not (the
/// buffer is then left alone), -1 when the file cannot be read. `flags` is not read.
TAVOCORE_EXPORT int TLIBCFileGetKeyValue(const char* file, const char* key, char* buffer, int size,
                                         int flags);
/// Reads all keys (`keys` null) or one key of such a file into the hash; `separator` stands between
/// key and value. The number of keys read, or -1.
TAVOCORE_EXPORT int TLIBCFileGetKeys(const char* file, const char* keys, TLIBSZHASH* hash,
                                     const char* separator);

/* Programs and signals */

/// Runs a program, without a shell, with up to four arguments (null for an absent one) and waits.
/// Its exit status; 128 + signal when one ended it; -1 when it cannot be started. It reads from
/// /dev/null and has default signal handling.
TAVOCORE_EXPORT int TLIBCExec(const char* program, const char* arg1, const char* arg2,
                              const char* arg3, const char* arg4);
/// Starts a program, without a shell, with the arguments up to a null, and returns its standard
/// output (mode "r") or input ("w"). The program's own name is not among the arguments. A program
/// that cannot be started gives a stream that is at its end (or takes what is written to nowhere);
/// null only for bad arguments or when no pipe or process can be made. Not for use from several
/// threads at once.
TAVOCORE_EXPORT FILE* TLIBCPopen(const char* program, const char* mode, const char* arg1, ...)
    __attribute__((sentinel));
/// Closes such a stream and waits for the program; its status as TLIBCExec gives it. -1 too for a
/// stream that is not open from TLIBCPopen, which is left alone.
TAVOCORE_EXPORT int TLIBCPclose(FILE* stream);
/// Sends a signal to the process whose decimal id the file holds; -1 when the file or the id is
/// bad. Ids below 2 are never signalled.
TAVOCORE_EXPORT int TLIBCProcSignalByPidFile(const char* pidFile, int signal);

/* Shares */

/// Bit of a share's status: something in the share is indexed.
enum { TAVOSHARE_STATUS_INDEXED = 0x20 };

/// A shared folder, as the share file "/usr/tavo/etc/share.conf" holds it.
typedef struct TAVOSHARE {
  char name[256];
  char path[4096];  ///< Absolute folder.
  uint32_t status;  ///< Flags.
} TAVOSHARE;

/// Writes a share's record back to the share file; negative on failure, also when the file holds no
/// share of that name. Everything else in the file is kept.
TAVOCORE_EXPORT int TLIBShareUpdate(const TAVOSHARE* share);

#ifdef __cplusplus
}
#endif

#endif
