// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <array>
#include <cstdio>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/scan_run.h"
#include "cli/verbs.h"
#include "scan/known_folders.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "store/pid_file.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr std::array<const char*, kKinds> kKindNames{"music", "photos", "videos", "playlists",
                                                     "cue sheets"};

std::string count_line(const char* name, std::size_t count) {
  std::array<char, 64> line;
  std::snprintf(line.data(), line.size(), "  %-12s%9zu\n", name, count);
  return line.data();
}

/// What the index holds of these folders now.
void print_summary(Database& database, const ScanReport& report,
                   const std::vector<std::string>& folders) {
  std::string out = report.is_stopped ? "Stopped indexing" : "Indexed";
  ScanState::Holding all;
  for (const auto& folder : folders) {
    out += " " + escape_for_display(folder);
    const auto holding = ScanState(database).holding(folder);
    for (std::size_t kind = 0; kind < all.files.size(); ++kind) {
      all.files[kind] += holding.files[kind];
    }
    all.folders += holding.folders;
    all.left_alone += holding.left_alone;
  }
  out += ":\n";
  for (std::size_t kind = 0; kind < kKindNames.size(); ++kind) {
    out += count_line(kKindNames[kind], static_cast<std::size_t>(all.files[kind]));
  }
  out += count_line("folders", static_cast<std::size_t>(all.folders));
  if (report.switched_off > 0) out += count_line("switched off", report.switched_off);
  out += count_line("failed", report.failed + report.unstorable);
  const auto left_alone = static_cast<std::size_t>(all.left_alone);
  if (left_alone > report.failed) out += count_line("left alone", left_alone);
  put(out);
}

void print_next_steps(const Database& database, const Arguments& arguments) {
  const auto data_dir = arguments.value("--data-dir");
  const auto option = data_dir ? " --data-dir " + escape_for_display(*data_dir) : std::string();
  put("The index is the database " + database.where() + ".\nNext: mediidx list albums" + option +
      ", or mediidx help\n");
}

}  // namespace

int run_index(const Arguments& arguments) {
  const Stopwatch watch;
  std::vector<std::string> folders;
  for (const auto& named : arguments.operands) folders.push_back(real_folder(named));
  const DataFolder data(arguments.value("--data-dir"));
  reload_on_hangup();
  const ScanLock lock(data, ScanLock::IfTaken::kThrow);
  const PidFile pid_file(data);
  Database database(data);
  make_known(data, folders);
  ScanSetting setting;
  setting.full_speed = arguments.has("--full-speed");
  const auto before = watch.seconds();
  auto report = run_scanner(data, database, folders, setting);
  report.timings[static_cast<std::size_t>(Phase::kStart)] = before;
  print_summary(database, report, folders);
  print_next_steps(database, arguments);
  put(report_text(report, watch.seconds(), {.timings = arguments.has("--timings")}));
  return exit_status(report);
}

}  // namespace mediidx::tool
