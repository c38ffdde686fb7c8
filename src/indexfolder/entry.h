// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// One entry of the index-folder configuration, as the file or the in-memory copy holds it.
///
/// Entries come from a file that anyone may have written: nothing here throws for what one holds.
#ifndef MEDIIDX_INDEXFOLDER_ENTRY_H_
#define MEDIIDX_INDEXFOLDER_ENTRY_H_

#include <json/value.h>

#include <optional>
#include <string>
#include <string_view>

namespace mediidx {

/// True for an object with a text as path that is not empty and holds no NUL, and flags that read as
/// true or false. Other entries are passed over wherever a configuration is read.
bool is_usable_entry(const Json::Value& entry);

/// The entry's path within the entry; empty when it has none, nothing when the entry is no object
/// or its path no text.
std::optional<std::string_view> find_entry_path(const Json::Value& entry);

/// A flag of the entry; false when it is absent or neither true, false nor a number.
bool entry_flag(const Json::Value& entry, std::string_view member);

/// The member that says whether an entry is indexed for a media kind; empty for no such kind.
std::string_view flag_of_kind(int kind);

/// The absolute folder of a share-relative path; nothing when its share is not known. Throws
/// std::out_of_range for an empty path.
std::optional<std::string> absolute_folder(const std::string& path);

}  // namespace mediidx

#endif
