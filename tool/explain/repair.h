// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Mends what is half written.
#ifndef MEDIIDX_TOOL_EXPLAIN_REPAIR_H_
#define MEDIIDX_TOOL_EXPLAIN_REPAIR_H_

#include <functional>
#include <string>
#include <vector>

#include "explain/half_written.h"
#include "store/data_folder.h"
#include "store/database.h"

namespace mediidx::tool {

enum class Mending {
  kSavedAgain,       ///< By the tags of the file, or the text of the cue sheet, read anew.
  kDeleted,          ///< The file or cue sheet is gone, and now its rows are.
  kSideRowsDeleted,  ///< Of a track that is gone.
};
/// For programs: "saved_again", …
const char* name_of(Mending mending);

struct Mended {
  Mending mending;
  std::string path;  ///< The file or cue sheet; empty for side rows.
  unsigned id = 0;   ///< Of side rows: the track that is gone.
};

/// What could not be mended, and why.
struct Left {
  HalfWritten half;
  std::string reason;
};

struct RepairReport {
  std::vector<Mended> mended;
  std::vector<Left> left;
};

/// Mends file by file through the library's requests, audio files before cue sheets. A file on a
/// disk that is away is not taken for one that is gone. `stop` is asked before each; what it keeps
/// from being mended is left. The configuration has to be loaded. Throws std::runtime_error when
/// the database fails.
RepairReport repair(const DataFolder& data, Database& database, const std::function<bool()>& stop);

}  // namespace mediidx::tool

#endif
