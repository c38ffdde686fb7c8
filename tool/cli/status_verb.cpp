// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Where the index stands: its roots, and the files that are left alone.
#include <json/value.h>

#include <filesystem>

#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "mediidx/index_folder.h"
#include "scan/coverage.h"
#include "store/database.h"
#include "store/pid_file.h"
#include "store/query.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

Json::Value root_json(Database& database, const std::string& folder) {
  std::error_code ignored;
  Json::Value out;
  out["path"] = json_text(folder);
  out["exists"] = std::filesystem::is_directory(folder, ignored);
  auto files = database.query(
      "SELECT count(*) FILTER (WHERE x.size <> -1 AND x.failure IS NULL) AS files, "
      "count(x.failure) AS failed FROM scan.file x JOIN scan.folder f ON x.folder = f.id "
      "WHERE f.path = " +
      literal(folder) + " OR f.path ^@ " + literal(folder + "/"));
  if (files.next()) {
    out["files"] = Json::Int64{files.number("files")};
    out["left_alone"] = Json::Int64{files.number("failed")};
  }
  auto scanned = database.query(
      "SELECT away, volume, to_char(scanned AT TIME ZONE 'UTC', 'YYYY-MM-DD HH24:MI:SS') AS scanned "
      "FROM scan.root WHERE path = " +
      literal(folder) + " ORDER BY id LIMIT 1");
  const bool is_known = scanned.next();
  out["online"] = out["exists"].asBool() && !(is_known && scanned.flag("away"));
  out["scanned"] = is_known && !scanned.is_null("scanned") ? Json::Value(scanned.text("scanned"))
                                                           : Json::Value();
  return out;
}

Json::Value failures_json(Database& database) {
  Json::Value out(Json::arrayValue);
  auto rows = database.query(
      "SELECT f.path || '/' || x.name AS path, x.failure FROM scan.file x "
      "JOIN scan.folder f ON x.folder = f.id WHERE x.failure IS NOT NULL ORDER BY 1");
  while (rows.next()) {
    Json::Value failure;
    failure["path"] = json_text(rows.text("path"));
    failure["reason"] = json_text(rows.text("failure"));
    out.append(failure);
  }
  return out;
}

void print(const Json::Value& status) {
  std::string text;
  for (const auto& root : status["roots"]) {
    const auto scanned = root["scanned"].isNull() ? "never" : root["scanned"].asString() + " UTC";
    text += escape_for_display(root["path"].asString()) + ": " +
            (root["online"].asBool() ? "online" : "away") + ", " + root["files"].asString() +
            " files, last scan " + scanned + "\n";
  }
  if (status["roots"].empty()) text += "No folder is chosen for indexing.\n";
  if (!status["running"].isNull()) {
    text += "A scan is running: process " + status["running"].asString() + "\n";
  }
  if (!status["left_alone"].empty()) text += "Left alone until they change:\n";
  for (const auto& failure : status["left_alone"]) {
    text += "  " + escape_for_display(failure["path"].asString()) + ": " +
            escape_for_display(failure["reason"].asString()) + "\n";
  }
  put(text);
}

}  // namespace

int run_status(const Arguments& arguments) {
  const DataFolder data(arguments.value("--data-dir"));
  IndexFolderUpdate();
  Json::Value status;
  status["roots"] = Json::Value(Json::arrayValue);
  status["running"] = Json::Value();
  try {
    const ScanLock lock(data, ScanLock::IfTaken::kThrow);
  } catch (const AlreadyRunning& error) {
    const std::string what = error.what();
    status["running"] = what.substr(what.rfind(' ') + 1);
  }
  Database database(data);
  for (const auto& root : outermost_index_folders()) {
    status["roots"].append(root_json(database, root));
  }
  status["left_alone"] = failures_json(database);
  if (arguments.has("--json")) {
    put_json(status);
  } else {
    print(status);
  }
  return kExitDone;
}

}  // namespace mediidx::tool
