// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/output.h"
#include "cli/verbs.h"
#include "store/data_folder.h"
#include "store/database.h"

namespace mediidx::tool {

int run_db_init(const Arguments& arguments) {
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  put("The database " + database.where() + (database.was_changed() ? " is ready" : " was ready") +
      ", with version " + std::to_string(database.version()) + " of its tables.\n");
  return kExitDone;
}

}  // namespace mediidx::tool
