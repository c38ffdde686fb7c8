// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Whether everything is there and as it should be.
#include <algorithm>

#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "explain/health.h"
#include "mediidx/index_folder.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

/// What there is to say about a database that cannot be used ends with the reason.
void take_database(const DataFolder& data, std::vector<Check>& out) {
  try {
    Database database(data);
    check_database(database, out);
  } catch (const std::exception& error) {
    out.push_back({"database", Health::kProblem, error.what(),
                   has_configured_server()
                       ? "start the server that the environment names, or give "
                         "the role postgres access"
                       : "see server.log in the folder postgres of " + data.path().string()});
  }
}

void print_json(const std::vector<Check>& checks) {
  JsonList list;
  for (const auto& check : checks) {
    Json::Value object;
    object["check"] = check.name;
    object["status"] = name_of(check.health);
    object["found"] = json_text(check.found);
    object["advice"] = json_text(check.advice);
    list.add(object);
  }
  list.finish();
}

/// On a terminal nothing is cut: advice has to be read to its end.
void print(const std::vector<Check>& checks) {
  if (is_on_terminal()) {
    for (const auto& check : checks) {
      std::string status = name_of(check.health);
      status.resize(9, ' ');
      put(status + check.name + ": " + escape_for_display(check.found) + "\n");
      if (!check.advice.empty()) put("         " + escape_for_display(check.advice) + "\n");
    }
    return;
  }
  std::vector<TableRow> lines;
  for (const auto& check : checks) {
    lines.push_back({name_of(check.health), check.name, check.found, check.advice});
  }
  put(format_lines(lines));
}

}  // namespace

int run_doctor(const Arguments& arguments) {
  const DataFolder data(arguments.value("--data-dir"));
  IndexFolderInit();
  auto checks = check_system(data);
  take_database(data, checks);
  if (arguments.has("--json")) {
    print_json(checks);
  } else {
    print(checks);
  }
  const bool has_problem = std::ranges::any_of(
      checks, [](const Check& check) { return check.health == Health::kProblem; });
  return has_problem ? kExitFailed : kExitDone;
}

}  // namespace mediidx::tool
