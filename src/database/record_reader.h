// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Rows of any result as media records.
#ifndef MEDIIDX_DATABASE_RECORD_READER_H_
#define MEDIIDX_DATABASE_RECORD_READER_H_

#include "support/owned.h"

struct __tag_TAVO_MEDIA_INFO;

namespace mediidx {

/// Reads a fetched row by column name. Where two columns feed one field, the one with a value
/// counts; a field none of whose columns has one becomes empty or 0. Fields without a column are
/// left alone.
void read_record(tavodb_result* result, std::uint32_t row, __tag_TAVO_MEDIA_INFO& info);

}  // namespace mediidx

#endif
