// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/verbs.h"
#include "report/page.h"
#include "report/report_file.h"
#include "store/data_folder.h"

namespace mediidx::tool {

int run_report(const Arguments& arguments) {
  // Before a database server is started for nothing.
  const ReportFile file(arguments.operands[0]);
  const DataFolder folder(arguments.value("--data-dir"));
  Database database(folder);
  file.write(report_page(read_report(database), random_nonce()));
  return kExitDone;
}

}  // namespace mediidx::tool
