// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <systemd/sd-daemon.h>

#include <charconv>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/scan_run.h"
#include "cli/verbs.h"
#include "mediidx/index_folder.h"
#include "store/pid_file.h"
#include "watch/watcher.h"

namespace mediidx::tool {
namespace {

/// A number of an option, at least 1.
std::optional<long> number_of(const Arguments& arguments, const std::string& option) {
  const auto text = arguments.value(option);
  if (!text) return std::nullopt;
  long number = 0;
  const auto* end = text->data() + text->size();
  if (std::from_chars(text->data(), end, number).ptr != end || number < 1) {
    throw UsageError(option + " needs a number from 1 on");
  }
  return number;
}

}  // namespace

int run_watch(const Arguments& arguments) {
  WatchOptions options;
  options.scan.full_speed = arguments.has("--full-speed");
  if (const auto seconds = number_of(arguments, "--interval")) {
    options.interval = std::chrono::seconds(*seconds);
  }
  if (const auto milliseconds = number_of(arguments, "--settle")) {
    options.settle = std::chrono::milliseconds(*milliseconds);
  }
  options.most_folders =
      static_cast<std::size_t>(number_of(arguments, "--most-folders").value_or(0));
  const DataFolder data(arguments.value("--data-dir"));
  reload_on_hangup();
  answer_user_signal();
  const PidFile pid_file(data);
  IndexFolderUpdate();
  Database database(data);
  Watcher watcher(
      data, database, options,
      [](const std::string& message) {
        complain(message);
        sd_notifyf(0, "STATUS=%s", message.c_str());
      },
      [] {
        put("Watching.\n");
        flush_output();
        sd_notify(0, "READY=1\nSTATUS=Watching.");
      });
  watcher.run();
  sd_notify(0, "STOPPING=1");
  return noted_signal() ? kExitSignal + noted_signal() : kExitDone;
}

}  // namespace mediidx::tool
