// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Which entry of the in-memory copy holds a path, answered without a walk over all of them.
///
/// gIndexFolderConf is open to callers, and a Json::Value does not tell of a change deep inside.
/// So:
/// - few entries are walked over each time;
/// - over many an index is kept. It is built anew when the copy was replaced, cleared or appended
///   to, while a caller puts reloads off, and after IndexFolderConfUnLock: between lock and unlock
///   a caller changes entries in place;
/// - what the index finds is read from the copy itself, and its path compared, before it counts.
#ifndef MEDIIDX_INDEXFOLDER_FOLDER_INDEX_H_
#define MEDIIDX_INDEXFOLDER_FOLDER_INDEX_H_

#include <json/value.h>

#include <string_view>

namespace mediidx {

/// Whether an entry of the path itself counts, or only those strictly above.
enum class Reach { kItselfOrAbove, kAbove };

/// The first entry, in the order of the copy, that the path lies in; null when there is none.
/// Throws std::out_of_range when an entry with an empty path comes before it.
const Json::Value* find_holder(std::string_view path, Reach reach);

/// The position of the first entry of exactly this path; -1 when there is none.
int find_position(std::string_view path);

/// Has the index built anew by the next question.
void forget_folder_index();

}  // namespace mediidx

#endif
