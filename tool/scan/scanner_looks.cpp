// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The first half of a scan: what there is, and what has to be done.
#include <sys/stat.h>

#include <algorithm>

#include "mediidx/database.h"
#include "scan/scanner.h"
#include "store/query.h"
#include "tags/volume_id.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

// So much is looked up, and held in memory, at a time.
constexpr std::size_t kFoldersAtOnce = 2000;
constexpr std::size_t kFilesAtOnce = 20'000;

constexpr std::int64_t kFewRemovals = 100;
constexpr std::int64_t kTenth = 10;

}  // namespace

std::vector<Scanner::Start> Scanner::starts_for(const std::vector<std::string>& folders) {
  std::vector<Start> out;
  const auto roots = outermost_index_folders();
  for (const auto& folder : folders) {
    const auto root = std::ranges::find_if(
        roots, [&folder](const auto& candidate) { return is_below(folder, candidate); });
    if (root != roots.end()) {
      out.push_back({*root, folder});
      continue;
    }
    const auto before = out.size();
    for (const auto& inner : roots) {
      if (is_below(inner, folder)) out.push_back({inner, inner});
    }
    // A user's own library is indexed whatever the configuration says.
    const auto coverage = coverage_of(folder);
    if (out.size() == before && coverage.wants(Kind::kMusic)) out.push_back({folder, folder});
  }
  if (folders.empty()) {
    for (const auto& root : roots) out.push_back({root, root});
  }
  // Each place once: a start within another one is walked with that, unless it may not be.
  std::ranges::sort(out, {}, &Start::folder);
  std::vector<Start> starts;
  for (auto& start : out) {
    const bool is_inner = std::ranges::any_of(starts, [&](const auto& other) {
      return start.folder == other.folder ||
             (!options_.descend && is_below(start.folder, other.folder));
    });
    if (!is_inner) starts.push_back(std::move(start));
  }
  return starts;
}

void Scanner::plan(const std::vector<Start>& starts) {
  roots_.clear();
  for (const auto& start : starts) {
    if (stops()) return;
    auto [at, is_new] = roots_.try_emplace(start.root);
    auto& root = at->second;
    if (is_new) {
      root.path = start.root;
      look_at_root(root);
    }
    if (!root.is_away) plan_start(root, start);
  }
  // A file system that went away during the walk has looked like an empty one.
  for (auto& [path, root] : roots_) {
    if (root.is_away) continue;
    if (is_away(root)) {
      state_.withdraw(root.known.id);
      give_up(root);
    } else if (!options_.dry_run) {
      bring_online(path);
      state_.set_root(root.known.id, volume_id(path), false);
    }
  }
  if (state_.count_changes() == 0) return;
  state_.add_files_of_lost_folders();
  state_.find_moves();
  for (const auto& [path, root] : roots_) {
    if (!root.is_away) check_removals(root);
  }
  state_.find_consequences();
}

void Scanner::look_at_root(Root& root) {
  root.known = state_.root(root.path);
  root.has_rows = state_.holds_anything(root.path);
  if (is_away(root)) give_up(root);
}

bool Scanner::is_away(const Root& root) {
  struct stat status{};
  std::string why;
  if (stat(root.path.c_str(), &status) != 0 || !S_ISDIR(status.st_mode)) {
    why = "is not there";
  } else if (root.has_rows && is_empty_folder(root.path)) {
    why = "is empty, but was not";
  } else if (!options_.accept_volumes && !root.known.volume.empty() &&
             volume_id(root.path) != root.known.volume) {
    why = "is on another file system than last time (if that is right: --accept-volumes)";
  }
  if (why.empty()) return false;
  hooks_.say(escape_for_display(root.path) + " " + why + ": nothing of it is changed");
  return true;
}

void Scanner::give_up(Root& root) {
  root.is_away = true;
  report_.is_away = true;
  report_.away_roots.push_back(root.path);
  report_.offline += static_cast<std::size_t>(state_.count_files(root.path));
  if (options_.dry_run) return;
  take_offline(root.path);
  state_.set_root(root.known.id, root.known.volume, true);
}

void Scanner::plan_start(Root& root, const Start& start) {
  if (!options_.trust_index) {
    const Timings::Part part(timings_, Phase::kKnown);
    state_.reconcile(start.folder);
  }
  if (look_at(start.folder) == Presence::kGone) return plan_missing(root, start.folder);

  std::vector<ListedFolder> portion;
  std::size_t files_in_portion = 0;
  std::size_t files = 0;
  std::size_t folders = 0;
  const auto flush = [&] {
    plan_folders(root, portion);
    portion.clear();
    files_in_portion = 0;
  };
  std::vector<std::string> roots;
  for (const auto& other : outermost_index_folders()) roots.push_back(real_path(other));
  roots.push_back(real_path(start.folder));
  FileWalk walk(
      roots,
      [&](FoundFolder& folder) {
        if (stops()) return false;
        check_configuration();
        files += folder.files.size();
        files_in_portion += folder.files.size();
        hooks_.look(files, ++folders);
        const auto coverage = coverage_of(folder.path);
        portion.push_back({std::move(folder), coverage});
        if (portion.size() >= kFoldersAtOnce || files_in_portion >= kFilesAtOnce) flush();
        return true;
      },
      [&](const Failure& failure) {
        if (!told_.insert(failure.path).second) return;
        ++(failure.is_by_name ? report_.unstorable : report_.failed);
        hooks_.fail(failure);
      });
  walk.exclude(data_.path());
  if (options_.before) walk.before_each(options_.before);
  if (options_.descend) walk.descend_where(options_.descend);
  {
    const Timings::Part part(timings_, Phase::kLook);
    walk.walk(root.path, start.folder);
  }
  flush();
}

void Scanner::plan_missing(const Root& root, const std::string& folder) {
  Change lost;
  lost.what = What::kGoneFolder;
  lost.is_folder = true;
  lost.root = root.known.id;
  lost.path = folder;
  const auto parent = folder.substr(0, folder.rfind('/'));
  if (look_at(parent) == Presence::kFolder) state_.add({&lost, 1});
}

void Scanner::take_offline(const std::string& folder) {
  MediaInfoDBSetOnline(folder.c_str(), 0, 0);
  MediaInfoDBSetOnline((folder + "/").c_str(), 1, 0);
}

bool Scanner::has_offline_rows(const std::string& folder) {
  std::string any;
  for (const char* table : {"music", "video", "photo", "playlist", "directory"}) {
    any += std::string(any.empty() ? "" : " OR ") + "EXISTS (SELECT 1 FROM " + table +
           " WHERE fs_online = false AND (path = " + literal(folder) + " OR path ^@ " +
           literal(folder + "/") + "))";
  }
  auto rows = database_.query("SELECT " + any + " AS found");
  return rows.next() && rows.flag("found");
}

void Scanner::bring_online(const std::string& folder) {
  if (!has_offline_rows(folder)) return;
  MediaInfoDBSetOnline(folder.c_str(), 0, 1);
  MediaInfoDBSetOnline((folder + "/").c_str(), 1, 1);
  for (const auto& away : away_) take_offline(away);
}

bool Scanner::is_unmounted(const ListedFolder& listed, const KnownFolder& known) {
  const bool was_mounted = known.mounted || known.away;
  return was_mounted && !listed.found.is_mounted && !options_.accept_volumes;
}

void Scanner::plan_folders(const Root& root, std::vector<ListedFolder>& folders) {
  const Timings::Part part(timings_, Phase::kPlan);
  std::erase_if(folders, [this](const auto& listed) {
    return std::ranges::any_of(
        away_, [&listed](const auto& away) { return is_below(listed.found.path, away); });
  });
  auto known = [&] {
    const Timings::Part looking_up(timings_, Phase::kKnown);
    return state_.look_up(folders);
  }();
  CompareOptions options;
  options.full = options_.full;
  options.tolerance = time_tolerance(root.path);
  Comparison comparison;
  for (const auto& listed : folders) {
    const auto& path = listed.found.path;
    auto& before = known[path];
    const bool is_away_too =
        std::ranges::any_of(away_, [&path](const auto& away) { return is_below(path, away); });
    if (is_away_too) continue;
    if (path != root.path && is_unmounted(listed, before)) {
      away_.push_back(path);
      report_.is_away = true;
      report_.offline += static_cast<std::size_t>(state_.count_files(path));
      hooks_.say(escape_for_display(path) +
                 " has no file system mounted, but had (if that is right: --accept-volumes): "
                 "nothing of it is changed");
      if (options_.dry_run) continue;
      state_.set_folder(before.id, false, true, before.modified);
      take_offline(path);
      continue;
    }
    if (before.mounted != listed.found.is_mounted || before.away) {
      state_.set_folder(before.id, listed.found.is_mounted, false, before.modified);
    }
    if (!listed.found.is_readable) continue;
    const Timings::Part comparing(timings_, Phase::kCompare);
    compare(listed, before, options, comparison);
  }
  for (auto& change : comparison.changes) change.root = root.known.id;
  state_.add(comparison.changes);
  report_.skipped += comparison.left_alone + comparison.switched_off;
  report_.switched_off += comparison.switched_off;
}

void Scanner::check_removals(const Root& root) {
  const auto removal = state_.removal_of(root.known.id, root.path);
  if (options_.allow_mass_delete || removal.removed <= kFewRemovals ||
      removal.removed * kTenth <= removal.known) {
    return;
  }
  report_.is_refused = true;
  state_.withdraw_removals(root.known.id);
  hooks_.say("not removed: " + std::to_string(removal.removed) + " of " +
             std::to_string(removal.known) + " files of " + escape_for_display(root.path) +
             ". If they are really gone: --allow-mass-delete");
}

void Scanner::count_plan() {
  auto rows = database_.query(
      "SELECT what, kind, count(*) AS files FROM scan.change WHERE kind IS NOT NULL "
      "AND NOT (what IN (4, 5, 6) AND known = -1) GROUP BY what, kind");
  while (rows.next()) {
    const auto files = static_cast<std::size_t>(rows.number("files"));
    switch (static_cast<What>(rows.number("what"))) {
      case What::kNew:
        report_.added += files;
        break;
      case What::kChanged:
        report_.changed += files;
        break;
      case What::kMoved:
        report_.moved += files;
        break;
      case What::kGone:
      case What::kLeftOut:
      case What::kGoneWith:
        report_.removed += files;
        break;
      case What::kAgain:
      case What::kGoneFolder:
      case What::kLeftOutFolder:
      case What::kMovedAway:
        break;
    }
  }
}

}  // namespace mediidx::tool
