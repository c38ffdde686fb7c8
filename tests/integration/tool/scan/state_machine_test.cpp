// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Random sequences of what happens to a library, with scans in between, some of them cut short: in
// the end one scan leaves what a first scan of the same files leaves.
//
// MEDIIDX_SCAN_SEEDS: how many fresh seeds are tried, one unless set.
// MEDIIDX_SCAN_SEED: one seed that is tried instead of the fresh ones.
#include <gtest/gtest.h>
#include <signal.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <fstream>
#include <functional>
#include <iostream>
#include <map>
#include <memory>
#include <random>
#include <set>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "database.h"
#include "dice.h"
#include "index_rows.h"
#include "integration/tool/command.h"
#include "media_tree.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;
using Words = std::vector<std::string>;

constexpr int kDone = 0;
constexpr int kFailed = 1;
constexpr int kFileErrors = 3;
constexpr int kVolumeAway = 4;
constexpr int kNoDatabase = 5;
constexpr int kSteps = 30;

/// Permissions do not bind root: as root the command runs as the user of the database server.
const OpenCommand& open_command() {
  static const OpenCommand command("postgres");
  return command;
}

/// The numbers of the last line: "added", "changed", … by their names.
std::map<std::string, double> summary_of(const std::string& out) {
  std::map<std::string, double> numbers;
  const auto text = out.substr(0, out.find_last_not_of('\n') + 1);
  std::istringstream words(text.substr(text.rfind('\n') + 1));
  std::string name;
  for (std::string word; words >> word;) {
    while (!word.empty() && std::string(",;:.").find(word.back()) != std::string::npos) {
      word.pop_back();
    }
    char* end = nullptr;
    const double number = std::strtod(word.c_str(), &end);
    if (end == word.c_str()) {
      name = word;
    } else {
      numbers[name] = number;
    }
  }
  return numbers;
}

/// One library, its index, and what happens to them.
class ALibrary : public DatabaseTest {
 protected:
  struct Step {
    std::size_t weight;
    std::function<std::string()> take;
  };

  /// A whole sequence and what it is for.
  void live(std::uint64_t seed) {
    std::cout << "seed " << seed << std::endl;
    dice_ = std::make_unique<Dice>(seed);
    tree_ = std::make_unique<MediaTree>(media_.path(), *dice_);
    choose_roots();
    const auto changes = steps_of_users();
    const auto scans = steps_of_scans();
    for (int i = 0; i < 6; ++i) note(tree_->add_folder());
    for (int i = 0; i < 16; ++i) note(tree_->add_audio());
    for (int i = 0; i < 3; ++i) note(tree_->add_picture_or_film() + tree_->add_cue_sheet());
    tree_->tell_apart();
    for (int step = 0; step < kSteps && !HasFailure(); ++step) {
      note(one_of(changes));
      while (dice_->chance(40)) note(one_of(changes));
      tree_->tell_apart();
      if (dice_->chance(50)) note(one_of(scans));
    }
    if (!HasFailure()) compare_with_a_first_scan();
    if (HasFailure()) ADD_FAILURE() << "seed " << seed << ":\n" << story_;
    tree_.reset();
  }

 private:
  Outcome run(const std::string& data, Words words,
              const std::function<void(pid_t)>& meanwhile = {}) {
    auto setting = open_command().setting();
    setting.environment["HOME"] = data_.path();
    setting.meanwhile = meanwhile;
    open_command().give(media_.path());
    open_command().give(data_.path());
    words.insert(words.begin() + 1, {"--data-dir", data_.at(data)});
    return run_mediidx(words, setting);
  }
  void note(const std::string& what) {
    if (!what.empty()) story_ += what + "\n";
  }
  std::string one_of(const std::vector<Step>& steps) {
    std::size_t sum = 0;
    for (const auto& step : steps) sum += step.weight;
    auto at = dice_->below(sum);
    for (const auto& step : steps) {
      if (at < step.weight) return step.take();
      at -= step.weight;
    }
    return "";
  }
  /// Notes how a run ended, and that it ended in one of these ways.
  std::string ended(const std::string& what, const Outcome& run, const std::set<int>& statuses) {
    EXPECT_TRUE(statuses.contains(run.status)) << what << " ended with " << run.status << ":\n"
                                               << run.out << run.err;
    return what + " = " + std::to_string(run.status);
  }

  void choose_roots() {
    const auto& roots = tree_->roots();
    EXPECT_EQ(run("d", {"index", roots[0], roots[1]}).status, kDone);
    std::ofstream(data_.at("d/root/etc/passwd"))
        << "ann:x:1026:1026::" << media_.at("homes/ann") << ":/bin/sh\n";
    EXPECT_EQ(run("d", {"index", roots[2]}).status, kDone);
  }

  std::vector<Step> steps_of_users() {
    const auto of_tree = [this](std::string (MediaTree::*change)()) {
      return [this, change] { return (tree_.get()->*change)(); };
    };
    return {{24, of_tree(&MediaTree::add_audio)},
            {6, of_tree(&MediaTree::add_picture_or_film)},
            {5, of_tree(&MediaTree::add_playlist)},
            {6, of_tree(&MediaTree::add_cue_sheet)},
            {8, of_tree(&MediaTree::add_folder)},
            {3, of_tree(&MediaTree::add_damaged)},
            {14, of_tree(&MediaTree::retag)},
            {4, of_tree(&MediaTree::replace)},
            {4, of_tree(&MediaTree::touch)},
            {1, of_tree(&MediaTree::empty_out)},
            {12, of_tree(&MediaTree::move_file)},
            {6, of_tree(&MediaTree::move_folder)},
            {5, of_tree(&MediaTree::swap_files)},
            {2, of_tree(&MediaTree::swap_folders)},
            {10, of_tree(&MediaTree::remove_file)},
            {2, of_tree(&MediaTree::remove_folder)},
            {3, of_tree(&MediaTree::ignore_something)},
            {4, of_tree(&MediaTree::close_something)},
            {3, of_tree(&MediaTree::open_all)},
            {3, of_tree(&MediaTree::take_root_away)},
            {14, of_tree(&MediaTree::bring_root_back)},
            {3, [this] { return change_kinds(); }},
            {2, [this] { return choose_subfolder(); }},
            {2, [this] { return give_up_subfolder(); }},
            {2, [this] { return lose_rows(); }},
            {1, [this] { return set_offline(); }},
            {1, [this] { return crash_server({}); }}};
  }

  std::vector<Step> steps_of_scans() {
    return {{50, [this] { return scan({}); }},
            {6, [this] { return scan({"--full"}); }},
            {12, [this] { return scan_one_folder(); }},
            {5, [this] { return rehearse(); }},
            {14, [this] { return interrupt(SIGKILL, 128 + SIGKILL); }},
            {4, [this] { return interrupt(SIGINT, 130); }},
            {4, [this] { return interrupt(SIGTERM, 143); }},
            {4, [this] { return scan_while_the_server_crashes(); }},
            {3, [this] { return scan_while_a_root_goes(); }}};
  }

  // -- Scans -------------------------------------------------------------------------------------

  Words scan_words(const Words& options) const {
    Words words{"scan", "--full-speed"};
    words.insert(words.end(), options.begin(), options.end());
    return words;
  }

  /// What the index holds below a folder, the folder itself apart.
  static std::multiset<std::string> rows_in(const std::string& folder) {
    auto held = rows_below(folder);
    held.erase("directory " + folder);
    held.erase("personal_directory " + folder);
    return held;
  }

  /// A scan of everything. What is away keeps its rows and goes offline; what is closed keeps them.
  std::string scan(const Words& options) {
    std::map<std::string, std::multiset<std::string>> away;
    std::map<std::string, std::multiset<std::string>> closed;
    for (const auto& folder : tree_->roots()) {
      if (tree_->is_away(folder)) away[folder] = rows_in(folder);
    }
    for (const auto& path : tree_->closed()) {
      if (tree_->is_there(path) && !tree_->may_be_ignored(path)) closed[path] = rows_in(path);
    }
    const auto done = run("d", scan_words(options));
    for (const auto& [folder, held] : closed) {
      EXPECT_EQ(rows_in(folder), held) << folder << " is closed";
    }
    for (const auto& [folder, held] : away) {
      if (held.empty()) continue;  // An empty root may be a new one.
      EXPECT_EQ(rows_in(folder), held) << folder << " is away";
      EXPECT_FALSE(any_online(folder)) << folder << " is away";
      EXPECT_EQ(done.status, kVolumeAway) << done.out << done.err;
    }
    return ended(
        "scan" + (options.empty() ? "" : " " + options[0]), done,
        away.empty() ? std::set{kDone, kFileErrors} : std::set{kDone, kFileErrors, kVolumeAway});
  }

  /// A scan of one folder, which may be a root that is away: it is nothing to other roots.
  std::string scan_one_folder() {
    std::vector<std::string> away = tree_->roots();
    std::erase_if(away, [this](const auto& one) { return !tree_->is_away(one); });
    const auto folder =
        away.empty() || dice_->chance(30) ? tree_->any_folder() : dice_->one_of(away);
    if (folder.empty()) return "";
    std::map<std::string, bool> others;
    for (const auto& other : tree_->roots()) {
      if (folder != other && !folder.starts_with(other + "/")) others[other] = any_online(other);
    }
    const auto done = run("d", scan_words({folder}));
    for (const auto& [other, was_online] : others) {
      EXPECT_EQ(any_online(other), was_online) << other << " after a scan of " << folder;
    }
    return ended("scan " + folder, done, {kDone, kFileErrors, kVolumeAway});
  }

  std::string rehearse() {
    const auto before = index_rows();
    const auto done = run("d", scan_words({"--dry-run"}));
    EXPECT_EQ(index_rows(), before) << "a rehearsal wrote";
    return ended("scan --dry-run", done, {kDone, kFileErrors, kVolumeAway});
  }

  void pause() {
    // Most scans of so few files take about as long.
    std::this_thread::sleep_for(std::chrono::milliseconds(dice_->below(400)));
  }

  std::string interrupt(int signal, int status) {
    const auto done = run("d", scan_words({}), [&](pid_t pid) {
      pause();
      kill(pid, signal);
    });
    return ended("scan, " + std::string(strsignal(signal)), done,
                 {kDone, kFileErrors, kVolumeAway, status});
  }

  std::string crash_server(const std::function<void()>& meanwhile) {
    TestServer::get().crash();
    if (meanwhile) meanwhile();
    TestServer::get().start();
    return "the server crashed";
  }

  std::string scan_while_the_server_crashes() {
    const auto done = run("d", scan_words({}), [&](pid_t) {
      pause();
      crash_server([&] { pause(); });
    });
    return ended("scan while the server crashes", done,
                 {kDone, kFailed, kFileErrors, kVolumeAway, kNoDatabase});
  }

  std::string scan_while_a_root_goes() {
    std::string what;
    const auto done = run("d", scan_words({}), [&](pid_t) {
      pause();
      what = tree_->take_root_away();
    });
    return ended("scan while: " + what, done, {kDone, kFileErrors, kVolumeAway});
  }

  // -- Changes of index and configuration --------------------------------------------------------

  bool all_there() const {
    return std::ranges::none_of(tree_->roots(),
                                [this](const auto& folder) { return tree_->is_away(folder); }) &&
           std::ranges::all_of(subfolders_,
                               [this](const auto& folder) { return tree_->is_there(folder); });
  }

  std::string configure(const Words& words) {
    std::string what;
    for (const auto& word : words) what += word + " ";
    return ended(what, run("d", words), {kDone, kFileErrors});
  }

  std::string change_kinds() {
    constexpr const char* kKinds[] = {"--music",    "--photo",    "--video",
                                      "--no-music", "--no-photo", "--no-video"};
    if (!all_there()) return "";
    std::vector<std::string> folders = tree_->roots();
    folders.insert(folders.end(), subfolders_.begin(), subfolders_.end());
    return configure({"folder", "set", dice_->one_of(folders), dice_->one_of(kKinds)});
  }

  std::string choose_subfolder() {
    const auto folder = tree_->any_folder();
    const auto& roots = tree_->roots();
    if (!all_there() || std::ranges::find(roots, folder) != roots.end() ||
        subfolders_.contains(folder)) {
      return "";
    }
    subfolders_.insert(folder);
    return configure({"folder", "add", folder, dice_->chance(50) ? "--photo" : "--music"});
  }

  std::string give_up_subfolder() {
    if (subfolders_.empty() || !all_there()) return "";
    const auto folder = *subfolders_.begin();
    subfolders_.erase(folder);
    return configure({"folder", "remove", folder});
  }

  /// Another program deletes what the index holds of a file.
  std::string lose_rows() {
    const auto file = tree_->any_file();
    if (file.empty()) return "";
    for (const char* table :
         {"track", "music", "photo", "video", "playlist", "personal_playlist"}) {
      rows("DELETE FROM " + std::string(table) + " WHERE path = " + quoted(file));
    }
    note("lose the rows of " + file);
    return scan({});
  }

  std::string set_offline() {
    const auto folder = tree_->any_folder();
    if (folder.empty()) return "";
    return ended("set offline " + folder, run("d", {"volume", "offline", folder}), {kDone});
  }

  // -- The end -----------------------------------------------------------------------------------

  void compare_with_a_first_scan() {
    tree_->restore();
    // All that are missing are dropped with the first.
    const auto lost = std::ranges::find_if(
        subfolders_, [this](const auto& folder) { return !tree_->is_there(folder); });
    if (lost != subfolders_.end()) note(configure({"folder", "remove", "--drop-missing", *lost}));
    // A file that was written just now is read once more, as it may be written again in the same
    // tick of the file system's clock.
    std::this_thread::sleep_for(std::chrono::milliseconds(100));
    note(ended("the last scan", run("d", scan_words({})), {kDone, kFileErrors}));
    const auto grown = index_rows();
    const auto again = run("d", scan_words({}));
    note(ended("once more", again, {kDone, kFileErrors}));
    for (const char* change : {"added", "changed", "moved", "removed", "offline"}) {
      const auto numbers = summary_of(again.out);
      ASSERT_TRUE(numbers.contains(change)) << again.out;
      EXPECT_EQ(numbers.at(change), 0) << change << " though nothing happened:\n" << again.out;
    }
    EXPECT_EQ(index_rows(), grown) << "though nothing happened";

    TestServer::get().fresh_database();
    EXPECT_EQ(run("first", {"folder", "list"}).status, kDone);
    fs::copy(data_.at("d/root/usr/tavo/etc"), data_.at("first/root/usr/tavo/etc"),
             fs::copy_options::recursive | fs::copy_options::overwrite_existing);
    fs::copy(data_.at("d/root/etc/passwd"), data_.at("first/root/etc/passwd"));
    note(ended("a first scan", run("first", scan_words({})), {kDone, kFileErrors}));
    const auto first = index_rows();
    ASSERT_FALSE(first.empty());
    for (const auto& [table, lines] : first) {
      const auto found = grown.find(table);
      EXPECT_EQ(found == grown.end() ? "" : found->second, lines) << "in " << table;
    }
  }

  OpenFolder data_;
  OpenFolder media_;
  std::unique_ptr<Dice> dice_;
  std::unique_ptr<MediaTree> tree_;
  std::set<std::string> subfolders_;  ///< Those with an entry of their own.
  std::string story_;
};

class AKnownLibrary : public ALibrary, public testing::WithParamInterface<int> {};

TEST_P(AKnownLibrary, EndsAsAFirstScanLeavesIt) { live(static_cast<std::uint64_t>(GetParam())); }

INSTANTIATE_TEST_SUITE_P(Seeds, AKnownLibrary, testing::Range(1, 6));

std::vector<std::uint64_t> fresh_seeds() {
  if (const char* seed = std::getenv("MEDIIDX_SCAN_SEED"))
    return {std::strtoull(seed, nullptr, 10)};
  const char* count = std::getenv("MEDIIDX_SCAN_SEEDS");
  std::vector<std::uint64_t> seeds(count ? std::strtoull(count, nullptr, 10) : 1);
  for (auto& seed : seeds) seed = std::random_device()();
  return seeds;
}

class AFreshLibrary : public ALibrary, public testing::WithParamInterface<std::uint64_t> {};

TEST_P(AFreshLibrary, EndsAsAFirstScanLeavesIt) { live(GetParam()); }

INSTANTIATE_TEST_SUITE_P(Seeds, AFreshLibrary, testing::ValuesIn(fresh_seeds()));

}  // namespace
}  // namespace mediidx::test
