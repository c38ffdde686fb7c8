// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What becomes of a file's fields on their way into the index.
#ifndef MEDIIDX_TOOL_EXPLAIN_STORED_RECORD_H_
#define MEDIIDX_TOOL_EXPLAIN_STORED_RECORD_H_

#include <json/value.h>

#include <string>
#include <vector>

#include "tags/media_file.h"

namespace mediidx::tool {

/// A field of the record.
struct StoredField {
  std::string name;
  Json::Value read;    ///< A text or a number, as the reader found it.
  Json::Value stored;  ///< As the row will hold it.
  std::string note;    ///< What was done to it; empty for nothing.
};

/// The fields that the file fills, in the record's order, then its replay gain. Throws
/// std::runtime_error for a path that a record cannot hold.
std::vector<StoredField> stored_fields(const MediaFile& file);

}  // namespace mediidx::tool

#endif
