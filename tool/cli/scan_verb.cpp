// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <filesystem>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/scan_run.h"
#include "cli/verbs.h"
#include "mediidx/index_folder.h"
#include "scan/coverage.h"
#include "store/pid_file.h"
#include "store/query.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

bool holds_index_folder(const std::string& folder) {
  return IndexFolderIsCoveredByShare(folder.c_str()) > 0;
}

/// The folder that is meant, which may be away; a file is scanned with its folder.
std::string folder_of(const std::string& named) {
  std::error_code error;
  const auto real = fs::canonical(named, error);
  auto folder = stored_path(error ? named : real.string());
  if (!error && !fs::is_directory(real)) folder = folder.substr(0, folder.rfind('/'));
  const auto coverage = coverage_of(folder);
  if (!coverage.folder && !coverage.wants(Kind::kMusic) && !holds_index_folder(folder)) {
    throw std::runtime_error(escape_for_display(named) +
                             " is not chosen for indexing: see mediidx folder add");
  }
  return folder;
}

ScanSetting setting_of(const Arguments& arguments) {
  ScanSetting setting;
  setting.options.full = arguments.has("--full");
  setting.options.dry_run = arguments.has("--dry-run");
  setting.options.allow_mass_delete = arguments.has("--allow-mass-delete");
  setting.options.accept_volumes = arguments.has("--accept-volumes");
  setting.full_speed = arguments.has("--full-speed");
  if (const auto progress = arguments.value("--progress")) {
    if (*progress != "json") throw UsageError("--progress is json or left out");
    setting.json_progress = true;
  }
  return setting;
}

}  // namespace

int run_scan(const Arguments& arguments) {
  const Stopwatch watch;
  const auto setting = setting_of(arguments);
  const DataFolder data(arguments.value("--data-dir"));
  reload_on_hangup();
  const ScanLock lock(data, ScanLock::IfTaken::kThrow);
  const PidFile pid_file(data);
  IndexFolderUpdate();
  std::vector<std::string> folders;
  for (const auto& named : arguments.operands) folders.push_back(folder_of(named));
  Database database(data);
  const auto before = watch.seconds();
  auto report = run_scanner(data, database, folders, setting);
  report.timings[static_cast<std::size_t>(Phase::kStart)] = before;
  put(report_text(report, watch.seconds(), {arguments.has("--json"), arguments.has("--timings")}));
  return exit_status(report);
}

}  // namespace mediidx::tool
