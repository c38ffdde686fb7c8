// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// How the values of a record are written to a row.
#ifndef MEDIIDX_DATABASE_RECORD_H_
#define MEDIIDX_DATABASE_RECORD_H_

#include <cstdint>

#include "mediidx/record.h"

namespace mediidx {

/// Removes the white space around the texts of a record, dates and path apart.
void trim_texts(__tag_TAVO_MEDIA_INFO& info);
void trim_texts(VIDEO_CONVERT_REC& record);

/// A timestamp; an empty one is the beginning of the Unix epoch.
constexpr const char* date_or_epoch(const char* date) { return *date ? date : "epoch"; }

/// Truncated toward zero and held within the range of an int; 0 when it is no number.
int whole_seconds(float seconds);

/// The user whose personal library holds the path, or 0.
std::int64_t owner_of(const char* path);

}  // namespace mediidx

#endif
