// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Scans that are cut short, round after round: by a kill, by a database that stops at once, by both
// together as a loss of power does it. What had been committed is there afterwards, what the scan
// knows of the files is true of the library's rows, and one more scan leaves what scans that nobody
// disturbed have left in an index of the same files.
//
// MEDIIDX_KILL_ROUNDS: how many rounds, 6 unless set.
// MEDIIDX_KILL_SEED: the seed of the first library, a fresh one unless set.
#include <gtest/gtest.h>
#include <signal.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdlib>
#include <fstream>
#include <functional>
#include <iomanip>
#include <iostream>
#include <memory>
#include <random>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "database.h"
#include "dice.h"
#include "index_rows.h"
#include "integration/tool/command.h"
#include "machine.h"
#include "media_tree.h"
#include "scan_claims.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;
using Clock = std::chrono::steady_clock;
using Milliseconds = std::chrono::duration<double, std::milli>;
using Words = std::vector<std::string>;
using Rows = std::multiset<std::string>;

constexpr int kDone = 0;
constexpr int kFileErrors = 3;
constexpr int kNoDatabase = 5;
constexpr int kRoundsOfALibrary = 10;
constexpr std::size_t kFirstSongs = 150;
/// The files of a batch, and a folder or list that came with one of them.
constexpr std::size_t kInHand = 100;

enum class Way { kKill, kCrash, kPowerLoss };
constexpr std::array kWays{"kill", "stop of the database", "loss of power"};

/// How a scan is cut short.
struct Strike {
  Way way;
  bool is_async;    ///< Commits do not wait for the disk.
  bool is_watched;  ///< The scan stands still meanwhile, so that what is committed can be compared.
  double moment;    ///< Of the time that an undisturbed scan takes.
};

/// What became of a round.
struct Round {
  Strike strike{};
  bool was_cut = true;      ///< The scan had not ended before.
  std::size_t to_do = 0;    ///< Rows in which the index before and after the scan differ.
  std::size_t done = 0;     ///< Those of them that were as afterwards.
  std::size_t missing = 0;  ///< Paths that the index had and has again, but not in between.
  std::size_t lost = 0;     ///< Committed rows that went with the server.
};

Rows in_both(const Rows& one, const Rows& two) {
  Rows both;
  std::ranges::set_intersection(one, two, std::inserter(both, both.end()));
  return both;
}

Rows without(const Rows& one, const Rows& two) {
  Rows left;
  std::ranges::set_difference(one, two, std::inserter(left, left.end()));
  return left;
}

/// Every row of an index, ids aside.
Rows lines_of(const std::map<std::string, std::string>& tables) {
  Rows lines;
  for (const auto& [table, text] : tables) {
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) lines.insert(table + " " + line);
  }
  return lines;
}

/// Of all rounds of this program.
std::vector<Round>& rounds_done() {
  static std::vector<Round> rounds;
  return rounds;
}

void print(const std::string& what, const std::function<bool(const Round&)>& is_of) {
  std::size_t count = 0;
  std::size_t cut = 0;
  std::size_t halfway = 0;
  std::size_t lossy = 0;
  std::size_t lost = 0;
  std::size_t missing = 0;
  for (const auto& round : rounds_done()) {
    if (!is_of(round)) continue;
    ++count;
    cut += round.was_cut ? 1 : 0;
    halfway += round.done > 0 && round.done < round.to_do ? 1 : 0;
    lossy += round.lost > 0 ? 1 : 0;
    lost += round.lost;
    missing = std::max(missing, round.missing);
  }
  std::cout << std::left << std::setw(34) << what << std::right << std::setw(8) << count
            << std::setw(8) << cut << std::setw(10) << halfway << std::setw(14) << lossy
            << std::setw(12) << lost << std::setw(14) << missing << "\n";
}

class InterruptedScans : public DatabaseTest {
 protected:
  ~InterruptedScans() override { tree_.reset(); }

  static void TearDownTestSuite() {
    std::cout << std::left << std::setw(34) << "rounds" << std::right << std::setw(8) << "all"
              << std::setw(8) << "cut" << std::setw(10) << "halfway" << std::setw(14)
              << "with losses" << std::setw(12) << "rows lost" << std::setw(14) << "most missing"
              << "\n";
    for (std::size_t way = 0; way < kWays.size(); ++way) {
      for (const bool is_async : {false, true}) {
        print(std::string(kWays[way]) + (is_async ? ", async" : ", sync"),
              [way, is_async](const Round& round) {
                return static_cast<std::size_t>(round.strike.way) == way &&
                       round.strike.is_async == is_async;
              });
      }
    }
    for (int tenth = 0; tenth < 11; ++tenth) {
      print("at " + std::to_string(tenth) + " tenths", [tenth](const Round& round) {
        return static_cast<int>(round.strike.moment * 10) == tenth;
      });
    }
    print("together", [](const Round&) { return true; });
  }

  void live(std::uint64_t seed, int rounds) {
    std::cout << "seed " << seed << std::endl;
    dice_ = std::make_unique<Dice>(seed);
    tree_ = std::make_unique<MediaTree>(media_.path(), *dice_);
    choose_roots();
    // As much as can be lost is to be lost.
    rows("ALTER SYSTEM SET wal_writer_delay = '10s'");
    rows("SELECT pg_reload_conf()");
    for (int i = 0; i < 15; ++i) note(tree_->add_folder());
    for (std::size_t i = 0; i < kFirstSongs; ++i) note(tree_->add_audio());
    for (int i = 0; i < rounds && !HasFailure(); ++i) {
      change_files();
      interrupt_a_scan();
    }
    rows("ALTER SYSTEM RESET wal_writer_delay");
    rows("SELECT pg_reload_conf()");
    if (!HasFailure()) compare_with_a_first_scan();
    if (HasFailure()) ADD_FAILURE() << "seed " << seed << ":\n" << story_;
  }

 private:
  Outcome run(const std::string& data, Words words, const Setting& given = {}) {
    auto setting = given;
    if (data == "undisturbed") setting.environment["PGHOST"] = twin_->socket_folder();
    words.insert(words.begin(), {"--data-dir", data_.at(data)});
    return run_mediidx(words, setting);
  }
  Outcome scan(const std::string& data, const Setting& setting = {}) {
    return run(data, {"scan", "--full-speed", "--allow-mass-delete"}, setting);
  }
  void note(const std::string& what) {
    if (!what.empty()) story_ += what + "\n";
  }
  static void expect_end(const std::string& what, const Outcome& run) {
    EXPECT_TRUE(run.status == kDone || run.status == kFileErrors)
        << what << " ended with " << run.status << ":\n"
        << run.out << run.err;
  }

  void choose_roots() {
    const auto& roots = tree_->roots();
    for (const char* data : {"disturbed", "undisturbed"}) {
      EXPECT_EQ(run(data, {"index", "--full-speed", roots[0], roots[1]}).status, kDone);
      std::ofstream(data_.at(std::string(data) + "/root/etc/passwd"))
          << "ann:x:1026:1026::" << media_.at("homes/ann") << ":/bin/sh\n";
      EXPECT_EQ(run(data, {"index", "--full-speed", roots[2]}).status, kDone);
    }
  }

  void change_files() {
    using Change = std::string (MediaTree::*)();
    struct Weighed {
      int weight;
      Change change;
    };
    constexpr Weighed kChanges[] = {
        {30, &MediaTree::add_audio},   {4, &MediaTree::add_picture_or_film},
        {4, &MediaTree::add_playlist}, {5, &MediaTree::add_cue_sheet},
        {5, &MediaTree::add_folder},   {1, &MediaTree::add_damaged},
        {25, &MediaTree::retag},       {5, &MediaTree::replace},
        {4, &MediaTree::touch},        {10, &MediaTree::move_file},
        {3, &MediaTree::move_folder},  {3, &MediaTree::swap_files},
        {1, &MediaTree::swap_folders}, {12, &MediaTree::remove_file},
        {1, &MediaTree::remove_folder}};
    std::vector<Change> choice;
    for (const auto& [weight, change] : kChanges) choice.insert(choice.end(), weight, change);
    const auto changes = 10 + dice_->below(dice_->chance(50) ? 30 : 150);
    for (std::size_t i = 0; i < changes; ++i) note((tree_.get()->*dice_->one_of(choice))());
    tree_->tell_apart();
    // What was written just now would be read twice.
    std::this_thread::sleep_for(std::chrono::milliseconds(60));
  }

  void interrupt_a_scan() {
    const auto begin = Clock::now();
    expect_end("the undisturbed scan", scan("undisturbed"));
    const Milliseconds usual = Clock::now() - begin;
    const auto before = lines_of(index_rows());
    const auto paths_before = rows_below("");
    const auto after = lines_of(index_rows(twin_->socket_folder()));
    const auto paths_after = rows_below("", twin_->socket_folder());

    Round round;
    round.strike = {static_cast<Way>(dice_->below(kWays.size())), dice_->chance(50),
                    dice_->chance(40), 0.001 * static_cast<double>(dice_->below(1100))};
    const auto& strike = round.strike;
    // Only what this scan commits may be lost: with earlier scans, moves would be found that were
    // none to them.
    rows("CHECKPOINT");
    note("a scan, at " + std::to_string(strike.moment) + " of " + std::to_string(usual.count()) +
         " ms: " + kWays[static_cast<std::size_t>(strike.way)] +
         (strike.is_async ? ", asynchronous commits" : "") +
         (strike.is_watched ? ", standing still" : ""));
    Setting setting;
    setting.environment["PGOPTIONS"] =
        std::string("-c synchronous_commit=") + (strike.is_async ? "off" : "on");
    setting.meanwhile = [&](pid_t pid) {
      std::this_thread::sleep_for(usual * strike.moment);
      round.lost = cut_short(pid, strike);
    };
    const auto cut = scan("disturbed", setting);
    if (strike.way == Way::kCrash) {
      round.was_cut = cut.err.find("waiting for it") != cut.err.npos;
      // At its very start a scan does not wait.
      const bool had_none = cut.status == kNoDatabase && !round.was_cut;
      if (!had_none) expect_end("a scan whose database stopped", cut);
    } else {
      round.was_cut = cut.status == 128 + SIGKILL;
      if (!round.was_cut) expect_end("a scan that ended before", cut);
      expect_true_claims();
      const auto to_do = without(after, before);
      round.to_do = to_do.size();
      round.done = in_both(to_do, lines_of(index_rows())).size();
      round.missing = count_missing(paths_before, rows_below(""), paths_after);
      EXPECT_LE(round.missing, kInHand);
    }
    expect_end("the next scan", scan("disturbed"));
    expect_rows(after, "scans that nobody disturbed");
    std::cout << "  " << std::fixed << std::setprecision(2) << strike.moment << " of "
              << static_cast<int>(usual.count()) << " ms, "
              << kWays[static_cast<std::size_t>(strike.way)]
              << (strike.is_async ? ", async" : ", sync") << (strike.is_watched ? ", watched" : "")
              << (round.was_cut ? "" : ", too late") << ": " << round.done << " of " << round.to_do
              << " rows done, " << round.missing << " missing, " << round.lost << " lost"
              << std::endl;
    rounds_done().push_back(round);
  }

  /// The committed rows that went with it.
  std::size_t cut_short(pid_t pid, const Strike& strike) {
    Rows committed;
    if (strike.is_watched) {
      kill(pid, SIGSTOP);
      wait_until_idle(pid);
      committed = committed_rows();
    }
    if (strike.way != Way::kCrash) kill(pid, SIGKILL);
    if (strike.way != Way::kKill) {
      TestServer::get().crash();
      TestServer::get().start();
    }
    if (!strike.is_watched) return 0;
    const auto held = committed_rows();
    expect_true_claims();
    kill(pid, SIGCONT);
    const auto lost = without(committed, held).size() + without(held, committed).size();
    if (strike.way == Way::kKill || !strike.is_async) {
      EXPECT_EQ(lost, 0U) << "committed rows, or rows that were never committed";
    }
    return lost;
  }

  /// The server goes on with what it was asked last.
  void wait_until_idle(pid_t scan) {
    const auto busy =
        "SELECT count(*) FROM pg_stat_activity WHERE state = 'active' AND application_name LIKE "
        "'mediidx, process " +
        std::to_string(scan) + " on %'";
    while (value(busy) != "0") std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }

  /// Every row of the library's tables and the scan's, ids included. The plan of a scan is not
  /// meant to last.
  Rows committed_rows() {
    std::string sql;
    for (const auto& table :
         rows("SELECT format('%I.%I', schemaname, tablename) FROM pg_tables WHERE schemaname IN "
              "('public', 'scan') AND tablename <> 'change'")) {
      sql += (sql.empty() ? "" : " UNION ALL ") + ("SELECT '" + table[0]) +
             " ' || to_jsonb(t)::text FROM " + table[0] + " t";
    }
    Rows found;
    for (const auto& row : rows(sql)) found.insert(row[0]);
    return found;
  }

  void expect_true_claims() {
    EXPECT_EQ(false_claims(), std::vector<std::string>{})
        << "the scan's state is ahead of the rows";
  }

  /// Paths, not rows: a song has rows in several tables.
  static std::size_t count_missing(const Rows& before, const Rows& now, const Rows& after) {
    std::set<std::string> missing;
    for (const auto& row : without(in_both(before, after), now)) {
      missing.insert(row.substr(row.find(' ') + 1));
    }
    return missing.size();
  }

  static void expect_rows(const Rows& wanted, const std::string& whose) {
    const auto held = lines_of(index_rows());
    ASSERT_FALSE(wanted.empty());
    EXPECT_EQ(without(wanted, held), Rows{}) << "rows that " << whose << " left are not there";
    EXPECT_EQ(without(held, wanted), Rows{}) << "rows that " << whose << " did not leave";
  }

  void compare_with_a_first_scan() {
    const auto grown = lines_of(index_rows());
    TestServer::get().fresh_database();
    expect_end("a first scan", run("disturbed", {"scan", "--full-speed"}));
    expect_rows(grown, "the scans before");
  }

  OpenFolder data_;
  OpenFolder media_;
  std::unique_ptr<Machine> twin_ = Machine::alone();
  std::unique_ptr<Dice> dice_;
  std::unique_ptr<MediaTree> tree_;
  std::string story_;
};

struct Life {
  std::uint64_t seed;
  int rounds;
};
std::ostream& operator<<(std::ostream& out, const Life& life) {
  return out << life.rounds << " rounds";
}

std::vector<Life> lives() {
  const char* wanted = std::getenv("MEDIIDX_KILL_ROUNDS");
  const char* first = std::getenv("MEDIIDX_KILL_SEED");
  std::vector<Life> out;
  for (int left = wanted ? std::atoi(wanted) : 6; left > 0; left -= kRoundsOfALibrary) {
    const auto seed = first && out.empty() ? std::strtoull(first, nullptr, 10)
                                           : std::uint64_t{std::random_device()()};
    out.push_back({seed, std::min(left, kRoundsOfALibrary)});
  }
  return out;
}

class ALibraryInUse : public InterruptedScans, public testing::WithParamInterface<Life> {};

TEST_P(ALibraryInUse, IsIndexedAsIfNoScanHadBeenInterrupted) {
  live(GetParam().seed, GetParam().rounds);
}

INSTANTIATE_TEST_SUITE_P(Lives, ALibraryInUse, testing::ValuesIn(lives()));

}  // namespace
}  // namespace mediidx::test
