// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/verbs.h"

#include <signal.h>

#include <exception>
#include <limits>

#include "cli/completion.h"
#include "cli/interrupt.h"
#include "cli/output.h"
#include "store/database.h"
#include "store/pid_file.h"

namespace mediidx::tool {
namespace {

constexpr std::size_t kAnyNumber = std::numeric_limits<std::size_t>::max();
constexpr std::size_t kWordsOfAVerb = 2;

constexpr Option kListOptions[] = {
    {"--json", nullptr, "print a JSON array with every column"},
};

constexpr Option kJsonOption[] = {
    {"--json", nullptr, "print JSON"},
};
constexpr Option kPurgeOptions[] = {
    {"--dry-run", nullptr, "only count the rows"},
    {"--json", nullptr, "print JSON"},
};
constexpr Option kResetOptions[] = {
    {"--yes", nullptr, "do not ask"},
};

constexpr Option kDropMissing{"--drop-missing", nullptr,
                              "give up configured folders that are not there"};
constexpr Option kFolderAddOptions[] = {
    {"--music", nullptr, "index its music; without a kind, all three are indexed"},
    {"--photo", nullptr, "index its photos"},
    {"--video", nullptr, "index its videos"},
    {"--name", "NAME", "how the folder is called in lists"},
    kDropMissing,
};
constexpr Option kFolderSetOptions[] = {
    {"--music", nullptr, "index its music"},
    {"--no-music", nullptr, "leave its music out"},
    {"--photo", nullptr, "index its photos"},
    {"--no-photo", nullptr, "leave its photos out"},
    {"--video", nullptr, "index its videos"},
    {"--no-video", nullptr, "leave its videos out"},
    kDropMissing,
};
constexpr Option kFolderRemoveOptions[] = {kDropMissing};

constexpr Option kUser{"--user", "NAME|ID", "whose ratings"};
constexpr Option kTrack{"--track", "N", "of the track N that a cue sheet cuts out of the file"};
constexpr Option kRatingOptions[] = {
    kUser,
    kTrack,
    {"--json", nullptr, "print JSON"},
};
constexpr Option kRatingImportOptions[] = {
    kUser,
    {"--replace", nullptr, "let tags overrule ratings that are there"},
    {"--json", nullptr, "print JSON"},
};
constexpr Option kRatingExportOptions[] = {
    kUser,
    {"--write-tags", nullptr, "write the ratings into the files' tags too"},
    {"--json", nullptr, "print JSON"},
};

constexpr const char* kScanStatuses =
    "0 done, 1 failed or a mass removal refused, 2 usage, 3 done but for some files, 4 a volume was "
    "away, 5 no database, 6 a scan is running, 130 and 143 stopped by a signal";
constexpr Option kFullSpeed{"--full-speed", nullptr,
                            "do not leave the processor and the disks to others"};
constexpr Option kTimings{"--timings", nullptr, "tell where the time went"};
constexpr Option kIndexOptions[] = {kFullSpeed, kTimings};
constexpr Option kScanOptions[] = {
    {"--full", nullptr, "read the tags of unchanged files too"},
    {"--dry-run", nullptr, "only say what there is to do"},
    {"--allow-mass-delete", nullptr, "forget files that are gone, however many they are"},
    {"--accept-volumes", nullptr, "take the file systems that are mounted now as the right ones"},
    kFullSpeed,
    kTimings,
    {"--progress", "json", "tell the progress as lines of JSON"},
    {"--json", nullptr, "print the last line as JSON"},
};

constexpr Option kWatchOptions[] = {
    {"--interval", "SECONDS", "scan everything so often, whatever the kernel tells"},
    {"--settle", "MILLISECONDS", "so long has a folder to be quiet before it is looked at (2000)"},
    {"--most-folders", "N", "do not watch more folders than this"},
    kFullSpeed,
};

int run_help(const Arguments& arguments) {
  std::string name;
  for (const auto& word : arguments.operands) name += (name.empty() ? "" : " ") + word;
  if (name.empty()) {
    put(general_help(verbs()));
    return kExitDone;
  }
  for (const auto& verb : verbs()) {
    if (name != verb.name) continue;
    put(verb_help(verb));
    return kExitDone;
  }
  throw UsageError("unknown verb \"" + name + "\"");
}

int run_version(const Arguments&) {
  put("mediidx " MEDIIDX_VERSION "\n");
  return kExitDone;
}

constexpr const char* kShells[] = {"bash", "zsh"};

int run_completion(const Arguments& arguments) {
  put(arguments.operands[0] == "bash" ? bash_completion(verbs()) : zsh_completion(verbs()));
  return kExitDone;
}

const Verb kVerbs[] = {
    {"index",
     "FOLDER...",
     "index the media in these folders, from now on too",
     1,
     kAnyNumber,
     kIndexOptions,
     {},
     run_index,
     kScanStatuses},
    {"scan",
     "[PATH...]",
     "bring the index up to date, of all chosen folders or these",
     0,
     kAnyNumber,
     kScanOptions,
     {},
     run_scan,
     kScanStatuses},
    {"watch",
     "",
     "scan, then follow what changes in the folders chosen for indexing",
     0,
     0,
     kWatchOptions,
     {},
     run_watch},
    {"status",
     "",
     "show when the folders were scanned, and files left alone",
     0,
     0,
     kJsonOption,
     {},
     run_status},
    {"list", "music|albums|artists|genres|photos|videos|playlists|folders",
     "show what is in the index", 1, 1, kListOptions, list_choices(), run_list},
    {"show", "PATH", "show all that the index holds of one path", 1, 1, kJsonOption, {}, run_show},
    {"search",
     "TEXT",
     "find music by title, album, artist, composer or genre",
     1,
     1,
     kListOptions,
     {},
     run_search},
    {"stats", "", "count what is in the index", 0, 0, kJsonOption, {}, run_stats},
    {"report", "FILE", "write a page of charts about the index", 1, 1, {}, {}, run_report},
    {"playlist show",
     "FILE",
     "show a playlist's entries and which of them the index knows",
     1,
     1,
     kListOptions,
     {},
     run_playlist_show},
    {"cue show",
     "FILE",
     "show the tracks of a cue sheet and its character set",
     1,
     1,
     kJsonOption,
     {},
     run_cue_show},
    {"volume offline",
     "PATH",
     "mark what is below a path as away",
     1,
     1,
     kJsonOption,
     {},
     run_volume_offline},
    {"volume online",
     "PATH",
     "mark what is below a path as there again",
     1,
     1,
     kJsonOption,
     {},
     run_volume_online},
    {"volume purge",
     "[SHARE]",
     "forget what is away, of everything or of /volumeN/SHARE",
     0,
     1,
     kPurgeOptions,
     {},
     run_volume_purge},
    {"db init",
     "",
     "make the database and its tables, where they are missing",
     0,
     0,
     {},
     {},
     run_db_init},
    {"db vacuum",
     "",
     "tidy the database up and refresh its statistics",
     0,
     0,
     {},
     {},
     run_db_vacuum},
    {"db reset",
     "",
     "empty the index, personal libraries apart",
     0,
     0,
     kResetOptions,
     {},
     run_db_reset},
    {"db shell", "", "open psql on the database", 0, 0, {}, {}, run_db_shell},
    {"folder list",
     "",
     "show the folders chosen for indexing",
     0,
     0,
     kJsonOption,
     {},
     run_folder_list},
    {"folder add",
     "FOLDER",
     "choose a folder for indexing, and index it",
     1,
     1,
     kFolderAddOptions,
     {},
     run_folder_add},
    {"folder set",
     "FOLDER",
     "choose the kinds of media of a folder, and index it again",
     1,
     1,
     kFolderSetOptions,
     {},
     run_folder_set},
    {"folder remove",
     "FOLDER",
     "no longer index a folder, and forget what it held",
     1,
     1,
     kFolderRemoveOptions,
     {},
     run_folder_remove},
    {"share list", "", "show the shares", 0, 0, kJsonOption, {}, run_share_list},
    {"share add", "NAME FOLDER", "make a folder a share", 2, 2, {}, {}, run_share_add},
    {"share remove", "NAME", "forget a share, not its folder", 1, 1, {}, {}, run_share_remove},
    {"why",
     "PATH",
     "tell whether a path would be indexed, and why or why not",
     1,
     1,
     kJsonOption,
     {},
     run_why,
     "0 it would be indexed, 1 failed, 2 wrong usage, 3 it would not"},
    {"inspect",
     "FILE",
     "show what would be stored of a file, and its tags",
     1,
     1,
     kJsonOption,
     {},
     run_inspect,
     "0 done, 1 the file cannot be read, 2 wrong usage"},
    {"explain",
     "ALBUM",
     "show an album's tracks and why its album artist is what it is",
     1,
     1,
     kJsonOption,
     {},
     run_explain,
     "0 done, 1 there is no such album, 2 wrong usage"},
    {"doctor",
     "",
     "check that everything mediidx needs is there",
     0,
     0,
     kJsonOption,
     {},
     run_doctor,
     "0 no problem (warnings are none), 1 a problem was found, 2 wrong usage"},
    {"verify",
     "",
     "list rows of the index that were left half written",
     0,
     0,
     kJsonOption,
     {},
     run_verify,
     "0 nothing found, 1 failed, 2 wrong usage, 3 something was found"},
    {"repair",
     "",
     "mend rows of the index that were left half written",
     0,
     0,
     kJsonOption,
     {},
     run_repair,
     "0 nothing is left, 1 failed, 2 wrong usage, 3 something could not be mended"},
    {"rating set",
     "PATH STARS",
     "give a song 0 to 5 stars; 0 removes the rating",
     2,
     2,
     kRatingOptions,
     {},
     run_rating_set,
     "0 done, 1 failed, 2 wrong usage"},
    {"rating show",
     "PATH",
     "show the stars of a song, of one user or all",
     1,
     1,
     kRatingOptions,
     {},
     run_rating_show,
     "0 done, also without a rating, 1 failed, 2 wrong usage"},
    {"rating import",
     "[PATH]",
     "take ratings from the tags of indexed songs",
     0,
     1,
     kRatingImportOptions,
     {},
     run_rating_import,
     "0 done, 1 failed, 2 wrong usage, 3 done except for some files"},
    {"rating export",
     "[PATH]",
     "list the ratings of indexed songs",
     0,
     1,
     kRatingExportOptions,
     {},
     run_rating_export,
     "0 done, 1 failed, 2 wrong usage, 3 done except for some files"},
    {"completion",
     "bash|zsh",
     "print what this shell needs to complete command lines",
     1,
     1,
     {},
     kShells,
     run_completion},
    {"help", "[VERB]", "show this help, or that of a verb", 0, kWordsOfAVerb, {}, {}, run_help},
    {"version", "", "show the version", 0, 0, {}, {}, run_version},
};

int run(const std::vector<std::string>& words) {
  if (words.size() == 1 && words[0] == "--version") return run_version({});
  const auto arguments = parse_arguments(verbs(), words);
  if (arguments.has("--help")) {
    put(arguments.verb ? verb_help(*arguments.verb) : general_help(verbs()));
    return kExitDone;
  }
  if (!arguments.verb) throw UsageError("what shall be done?");
  return arguments.verb->run(arguments);
}

}  // namespace

std::span<const Verb> verbs() { return kVerbs; }

int run_command(const std::vector<std::string>& words) {
  return run_guarded([&words] { return run(words); });
}

int run_guarded(const std::function<int()>& what) {
  try {
    const int status = what();
    flush_output();
    return status;
  } catch (const UsageError& error) {
    complain(std::string(error.what()) + "\nTry \"mediidx help\".");
    return kExitUsage;
  } catch (const AlreadyRunning& error) {
    complain(error.what());
    return kExitAlreadyRunning;
  } catch (const NoDatabase& error) {
    complain(error.what());
    return noted_signal() ? kExitSignal + noted_signal() : kExitNoDatabase;
  } catch (const OutputClosed&) {
    return kExitSignal + SIGPIPE;
  } catch (const std::exception& error) {
    complain(error.what());
  }
  return noted_signal() ? kExitSignal + noted_signal() : kExitFailed;
}

}  // namespace mediidx::tool
