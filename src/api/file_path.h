// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the requests on files ask of a path first.
#ifndef MEDIIDX_API_FILE_PATH_H_
#define MEDIIDX_API_FILE_PATH_H_

#include <json/value.h>

namespace mediidx {

/// False, and logged, when the path is a folder.
bool is_no_folder(const char* path);

/// The path of a media file as JSON, within it; null when `json` is no object or has no text as
/// "szPath".
const char* find_path(const Json::Value& json);

}  // namespace mediidx

#endif
