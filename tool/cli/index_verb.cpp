// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <array>
#include <chrono>
#include <cstdio>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/progress.h"
#include "cli/verbs.h"
#include "mediidx/index_folder.h"
#include "scan/file_walk.h"
#include "scan/indexer.h"
#include "scan/known_folders.h"
#include "store/data_folder.h"
#include "store/database.h"
#include "store/pid_file.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr std::array<const char*, kKinds> kKindNames{"music", "photos", "videos", "playlists",
                                                     "cue sheets"};

Found walk(const DataFolder& data, const std::vector<std::string>& folders) {
  FileWalk walk([] { return noted_signal() != 0; });
  walk.exclude(data.path());
  for (const auto& folder : folders) walk.add(folder);
  return walk.finish();
}

std::string count_line(const char* name, std::size_t count) {
  std::array<char, 64> line;
  std::snprintf(line.data(), line.size(), "  %-12s%9zu\n", name, count);
  return line.data();
}

std::string seconds_text(double seconds) {
  std::array<char, 32> text;
  std::snprintf(text.data(), text.size(), "%.1f", seconds);
  return text.data();
}

void list_failures(const std::vector<Failure>& failures) {
  for (const auto& failure : failures) {
    complain("not indexed: " + escape_for_display(failure.path) + ": " +
             escape_for_display(failure.reason));
  }
}

void print_summary(const IndexReport& report, const std::vector<std::string>& folders,
                   double seconds) {
  std::string out = report.stopped || noted_signal() ? "Stopped indexing" : "Indexed";
  for (const auto& folder : folders) out += " " + escape_for_display(folder);
  out += " after " + seconds_text(seconds) + " seconds:\n";
  for (std::size_t kind = 0; kind < kKindNames.size(); ++kind) {
    out += count_line(kKindNames[kind], report.files[kind]);
  }
  out += count_line("folders", report.folders);
  if (report.switched_off > 0) out += count_line("switched off", report.switched_off);
  out += count_line("failed", report.failures.size());
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
  const auto start = std::chrono::steady_clock::now();
  std::vector<std::string> folders;
  for (const auto& named : arguments.operands) folders.push_back(real_folder(named));
  const DataFolder data(arguments.value("--data-dir"));
  reload_on_hangup();
  const PidFile pid_file(data);
  Database database(data);
  make_known(data, folders);
  const auto found = walk(data, folders);
  const auto report = [&] {
    Progress progress(found.folders.size() + found.files.size());
    Indexer indexer(database, [&progress](const std::string& path) {
      if (noted_signal()) return false;
      if (take_hangup()) IndexFolderUpdate();
      progress.step(path);
      return true;
    });
    return indexer.run(found);
  }();
  const std::chrono::duration<double> time = std::chrono::steady_clock::now() - start;
  list_failures(report.failures);
  print_summary(report, folders, time.count());
  print_next_steps(database, arguments);
  if (noted_signal()) return kExitSignal + noted_signal();
  return report.failures.empty() ? kExitDone : kExitSomeFailed;
}

}  // namespace mediidx::tool
