// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the command can do: one table, from which it is run and the help is made.
#ifndef MEDIIDX_TOOL_CLI_VERBS_H_
#define MEDIIDX_TOOL_CLI_VERBS_H_

#include <functional>
#include <span>
#include <string>
#include <vector>

#include "cli/arguments.h"

namespace mediidx::tool {

/// Exit statuses; a signal ends with 128 and its number.
enum ExitStatus {
  kExitDone = 0,
  kExitFailed = 1,
  kExitUsage = 2,
  kExitSomeFailed = 3,  ///< Done, but for some files.
  kExitVolumeAway = 4,  ///< Done, but for what is on a volume that is not there.
  kExitNoDatabase = 5,
  kExitAlreadyRunning = 6,  ///< Another scan of the same index runs.
  kExitSignal = 128,
};

std::span<const Verb> verbs();

/// Runs the command line behind the program's name; its exit status. Complains on standard error.
int run_command(const std::vector<std::string>& words);

/// Runs `what`; its exit status, or that of the error that it ends with, complained of likewise.
int run_guarded(const std::function<int()>& what);

/* The verbs. Each returns its exit status, and throws std::exception for what ends it. */

int run_index(const Arguments& arguments);
int run_scan(const Arguments& arguments);
int run_status(const Arguments& arguments);
int run_watch(const Arguments& arguments);
int run_list(const Arguments& arguments);
int run_show(const Arguments& arguments);
int run_search(const Arguments& arguments);
int run_stats(const Arguments& arguments);
int run_report(const Arguments& arguments);
int run_playlist_show(const Arguments& arguments);
int run_cue_show(const Arguments& arguments);
int run_volume_offline(const Arguments& arguments);
int run_volume_online(const Arguments& arguments);
int run_volume_purge(const Arguments& arguments);
int run_db_init(const Arguments& arguments);
int run_db_vacuum(const Arguments& arguments);
int run_db_reset(const Arguments& arguments);
int run_db_shell(const Arguments& arguments);
int run_folder_list(const Arguments& arguments);
int run_folder_add(const Arguments& arguments);
int run_folder_set(const Arguments& arguments);
int run_folder_remove(const Arguments& arguments);
int run_share_list(const Arguments& arguments);
int run_share_add(const Arguments& arguments);
int run_share_remove(const Arguments& arguments);
int run_why(const Arguments& arguments);
int run_inspect(const Arguments& arguments);
int run_explain(const Arguments& arguments);
int run_doctor(const Arguments& arguments);
int run_verify(const Arguments& arguments);
int run_repair(const Arguments& arguments);
int run_rating_set(const Arguments& arguments);
int run_rating_show(const Arguments& arguments);
int run_rating_import(const Arguments& arguments);
int run_rating_export(const Arguments& arguments);

/// The things that "list" knows.
std::span<const char* const> list_choices();

}  // namespace mediidx::tool

#endif
