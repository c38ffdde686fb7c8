// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/scan_run.h"

#include <json/writer.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <thread>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/progress.h"
#include "cli/verbs.h"
#include "mediidx/index_folder.h"
#include "scan/priority.h"
#include "text/table.h"
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

constexpr int kTableWidth = 80;

std::string seconds_text(double seconds, int decimals) {
  std::array<char, 32> text;
  std::snprintf(text.data(), text.size(), "%.*f", decimals, seconds);
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

namespace {

std::string scan_line(const ScanReport& report, double seconds) {
  std::string line;
  for (const auto& count : kCounts) {
    line += std::string(count.name) + " " + std::to_string(report.*count.value) + ", ";
  }
  return line + "seconds " + seconds_text(seconds, 1) + "\n";
}

std::string timings_table(const ScanReport& report, double seconds) {
  std::vector<TableRow> rows;
  for (std::size_t i = 0; i < kPhases; ++i) {
    const auto spent = report.timings[i];
    rows.push_back({name_of(static_cast<Phase>(i)), seconds_text(spent, 3),
                    std::to_string(std::lround(100 * spent / seconds))});
  }
  return format_table({{"PHASE"}, {"SECONDS", true}, {"PERCENT", true}}, rows, kTableWidth);
}

std::string scan_json(const ScanReport& report, double seconds, bool with_timings) {
  Json::Value object;
  for (const auto& count : kCounts) object[count.name] = Json::UInt64{report.*count.value};
  object["folders"] = Json::UInt64{report.folders};
  object["away"] = report.is_away;
  object["mass_delete_refused"] = report.is_refused;
  object["stopped"] = report.is_stopped;
  object["seconds"] = seconds;
  for (std::size_t i = 0; with_timings && i < kPhases; ++i) {
    object["timings"][name_of(static_cast<Phase>(i))] = report.timings[i];
  }
  Json::StreamWriterBuilder builder;
  builder["indentation"] = "";
  return Json::writeString(builder, object) + "\n";
}

}  // namespace

std::string report_text(const ScanReport& report, double seconds, ReportStyle style) {
  if (style.json) return scan_json(report, seconds, style.timings);
  return (style.timings ? timings_table(report, seconds) : "") + scan_line(report, seconds);
}

int exit_status(const ScanReport& report) {
  if (noted_signal()) return kExitSignal + noted_signal();
  if (report.is_refused) return kExitFailed;
  if (report.is_away) return kExitVolumeAway;
  return report.failed + report.unstorable > 0 ? kExitSomeFailed : kExitDone;
}

}  // namespace mediidx::tool
