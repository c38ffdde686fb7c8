// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Whether everything that mediidx needs is there and as it should be.
#ifndef MEDIIDX_TOOL_EXPLAIN_HEALTH_H_
#define MEDIIDX_TOOL_EXPLAIN_HEALTH_H_

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "store/data_folder.h"
#include "store/database.h"

namespace mediidx::tool {

enum class Health { kOk, kWarning, kProblem };
/// "ok", "warning" or "problem".
const char* name_of(Health health);

/// One thing that was looked at.
struct Check {
  std::string name;  ///< For programs: "server_version", "inotify", …
  Health health;
  std::string found;   ///< What was found.
  std::string advice;  ///< What to do; empty where nothing is to be done.
};

/// What is checked without the database: programs, the code page, the folders chosen for indexing.
/// The configuration has to be loaded.
std::vector<Check> check_system(const DataFolder& data);
/// Server, database, schema, and whether the kernel lets every folder of the index be watched.
/// Throws std::runtime_error when the database fails, with what was found until then in `out`.
void check_database(Database& database, std::vector<Check>& out);

/* The single judgements */

/// `number` as PostgreSQL counts: 150004 for 15.4.
Check check_server_version(int number, const std::string& text);
/// Versions of the collation, as recorded when the indexes were made and as the system has it now;
/// empty where it has none.
Check check_collation_version(const std::string& recorded, const std::string& actual);
/// Encoding, and the locale of order and of character types.
Check check_locale(const std::string& encoding, const std::string& order, const std::string& type);
/// An empty code page is none.
Check check_code_page(const std::string& code_page);

/// The kernel's limits, empty where they cannot be read.
struct InotifyLimits {
  std::optional<long> watches;
  std::optional<long> instances;
  std::optional<long> queued_events;
};
InotifyLimits read_inotify_limits(const std::string& folder = "/proc/sys/fs/inotify");
/// Each folder that is watched takes one watch.
Check check_inotify(const InotifyLimits& limits, long folders);

/// A table or index that the schema makes.
struct SchemaObject {
  std::string name;
  std::string statement;  ///< Makes it.
};
/// The objects whose statements begin so ("CREATE INDEX IF NOT EXISTS "), in the schema's order.
std::vector<SchemaObject> schema_objects(std::string_view schema, std::string_view beginning);

}  // namespace mediidx::tool

#endif
