// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/scan_run.h"

#include <json/writer.h>

#include <array>
#include <cstdio>
#include <thread>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/progress.h"
#include "cli/verbs.h"
#include "mediidx/index_folder.h"
#include "scan/priority.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

struct Count {
  const char* name;
  std::size_t ScanReport::* value;
};
constexpr Count kCounts[] = {
    {"added", &ScanReport::added},     {"changed", &ScanReport::changed},
    {"moved", &ScanReport::moved},     {"removed", &ScanReport::removed},
    {"offline", &ScanReport::offline}, {"skipped", &ScanReport::skipped},
    {"failed", &ScanReport::failed},
};

std::string seconds_text(double seconds) {
  std::array<char, 32> text;
  std::snprintf(text.data(), text.size(), "%.1f", seconds);
  return text.data();
}

}  // namespace

ScanReport run_scanner(const DataFolder& data, Database& database,
                       const std::vector<std::string>& folders, const ScanSetting& setting) {
  if (!setting.full_speed) become_idle();
  TagWorkers workers(std::max(1U, std::thread::hardware_concurrency()));
  Progress progress(setting.json_progress ? Progress::Style::kJson : Progress::Style::kForPeople);
  ScanHooks hooks;
  hooks.must_stop = [] { return noted_signal() != 0; };
  hooks.reload = [&progress] {
    if (take_user_signal()) progress.answer();
    if (!take_hangup()) return false;
    IndexFolderUpdate();
    return true;
  };
  hooks.fail = [&progress](const Failure& failure) {
    progress.clear();
    complain("not indexed: " + escape_for_display(failure.path) + ": " +
             escape_for_display(failure.reason));
  };
  hooks.say = [&progress](const std::string& message) {
    progress.clear();
    complain(message);
  };
  hooks.look = [&progress](std::size_t files, std::size_t found) { progress.look(files, found); };
  hooks.start = [&progress](std::size_t total) { progress.start(total); };
  hooks.step = [&progress](const std::string& path) { progress.step(path); };
  return Scanner(database, data, workers, setting.options, hooks).run(folders);
}

std::string scan_line(const ScanReport& report, double seconds) {
  std::string line;
  for (const auto& count : kCounts) {
    line += std::string(count.name) + " " + std::to_string(report.*count.value) + ", ";
  }
  return line + "seconds " + seconds_text(seconds) + "\n";
}

std::string scan_json(const ScanReport& report, double seconds) {
  Json::Value object;
  for (const auto& count : kCounts) object[count.name] = Json::UInt64{report.*count.value};
  object["folders"] = Json::UInt64{report.folders};
  object["away"] = report.is_away;
  object["mass_delete_refused"] = report.is_refused;
  object["stopped"] = report.is_stopped;
  object["seconds"] = seconds;
  Json::StreamWriterBuilder builder;
  builder["indentation"] = "";
  return Json::writeString(builder, object) + "\n";
}

int exit_status(const ScanReport& report) {
  if (noted_signal()) return kExitSignal + noted_signal();
  if (report.is_refused) return kExitFailed;
  if (report.is_away) return kExitVolumeAway;
  return report.failed + report.unstorable > 0 ? kExitSomeFailed : kExitDone;
}

}  // namespace mediidx::tool
