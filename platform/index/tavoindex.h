/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// What the indexing programs share: file types by extension, the code page, records from JSON
/// (libtavoindex).
#ifndef TAVOINDEX_H_
#define TAVOINDEX_H_

#ifdef __cplusplus
#include <json/value.h>

extern "C" {
#endif

#define TAVOINDEX_EXPORT __attribute__((visibility("default")))

struct __tag_TAVO_MEDIA_INFO;

/// The extension of the path's last part, without its dot, within the path; null when there is none
/// (a name that only begins with a dot has none).
TAVOINDEX_EXPORT const char* TAVOIndexExtGet(const char* path);

/// 1 when an extension (without its dot, in any case) is of this kind, else 0; null is of none.
TAVOINDEX_EXPORT int BlTAVOIndexIsMusic(const char* extension);
TAVOINDEX_EXPORT int BlTAVOIndexIsPhoto(const char* extension);
TAVOINDEX_EXPORT int BlTAVOIndexIsVideo(const char* extension);
/// Cue sheets are playlists.
TAVOINDEX_EXPORT int BlTAVOIndexIsPlaylist(const char* extension);
/// 1 when the path has the extension of a music file, else 0.
TAVOINDEX_EXPORT int BlTAVOIndexIsMusicFile(const char* path);

/// The configured code page, key "codepage" of "/etc/tavoinfo.conf"; empty when there is none.
/// Valid until the next call.
TAVOINDEX_EXPORT const char* TAVOIndexCodePageGet(void);

#ifdef __cplusplus
}  // extern "C"

/// Fills a record from a JSON object; 0, or -1 when `json` is no object or has no "szPath" that
/// fits. The path stands under "szPath", every other field under its own name as in the record;
/// absent members leave 0 or empty. Texts are cut to their field at the border of a UTF-8
/// character; numbers may stand as numbers or decimal texts and are held within their field's
/// range.
TAVOINDEX_EXPORT int MediaInfoJson2Object(const Json::Value& json,
                                          struct __tag_TAVO_MEDIA_INFO* info);

/// The reverse: `json` becomes an object with every field of the record, from which
/// MediaInfoJson2Object makes the same record where its path is not empty and its duration finite.
/// Texts keep bytes that are no UTF-8. 0, or -1 when one of the two is null.
TAVOINDEX_EXPORT int MediaInfoObject2Json(const struct __tag_TAVO_MEDIA_INFO* info,
                                          Json::Value* json);
#endif

#endif
