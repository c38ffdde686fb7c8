// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Adding one song after another, beside the same statements sent by hand: over libpq, on one
// connection, each statement on its own. Both start from the same rows, turn by turn, and the
// quietest turn of each counts. Then each step that is not a statement, by itself.
#include <benchmark/benchmark.h>
#include <libpq-fe.h>
#include <tavocore.h>
#include <tavodb.h>
#include <time.h>

#include <algorithm>
#include <cstdio>
#include <memory>
#include <span>
#include <stdexcept>
#include <string>
#include <vector>

#include "database.h"
#include "mediidx/database.h"
#include "mediidx/request.h"
#include "scratch.h"

namespace {

using mediidx::test::ScratchRoot;
using mediidx::test::TestServer;
using Record = __tag_TAVO_MEDIA_INFO;

constexpr int kSongs = 60;
constexpr int kSongsOfAlbum = 12;
constexpr int kTurns = 12;

double seconds(clockid_t clock) {
  timespec now{};
  clock_gettime(clock, &now);
  return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) / 1e9;
}

/// What a turn took, and how much of it was work of this process.
struct Cost {
  double wall_s = seconds(CLOCK_MONOTONIC);
  double cpu_s = seconds(CLOCK_PROCESS_CPUTIME_ID);

  static Cost since(const Cost& start) {
    const Cost now;
    return {now.wall_s - start.wall_s, now.cpu_s - start.cpu_s};
  }
  void keep_least(const Cost& other) {
    wall_s = std::min(wall_s, other.wall_s);
    cpu_s = std::min(cpu_s, other.cpu_s);
  }
};
constexpr double kNever = 1e9;

template <std::size_t N>
void set(char (&field)[N], const std::string& text) {
  std::snprintf(field, N, "%s", text.c_str());
}

/// A library of albums, without rows.
class Songs {
 public:
  Songs() {
    root_.index_everything("music", root_.at("volume1/music"));
    root_.add_user("user", 1000, root_.at("homes/user"));
    root_.make_folder("tmp");
    for (int i = 0; i < kSongs; ++i) {
      const auto album = "Album " + std::to_string(i / kSongsOfAlbum);
      const auto number = std::to_string(i % kSongsOfAlbum + 1);
      auto song = std::make_unique<Record>();
      set(song->path, root_.write("volume1/music/The Band/" + album + "/" + number + ".flac", ""));
      set(song->title, "Song " + std::to_string(i));
      set(song->album, album);
      set(song->artist, "The Band");
      set(song->album_artist, "The Band");
      set(song->genre, "Rock");
      set(song->composer, "A Writer");
      set(song->date, "2020-02-02 20:20:20");
      set(song->mdate, "2020-02-02 20:20:20");
      set(song->container_type, "flac");
      set(song->video_codec, "flac");
      song->track = i % kSongsOfAlbum + 1;
      song->year = 1975;
      song->duration = 215;
      song->bitrate = 951000;
      song->frequency = 44100;
      song->channel = 2;
      song->filesize = 31234567;
      songs_.push_back(std::move(song));
    }
  }

  const char* path() const { return songs_.front()->path; }

  Cost add_all() const {
    auto copies = std::vector<Record>();
    for (const auto& song : songs_) copies.push_back(*song);
    const Cost start;
    for (auto& song : copies) {
      if (TAVOMediaIndexAdd(&song, MEDIA_TABLE_MUSIC) != 0) throw std::runtime_error("not added");
    }
    return Cost::since(start);
  }

 private:
  ScratchRoot root_;
  std::vector<std::unique_ptr<Record>> songs_;
};

/// Runs what `add` makes the library send, each statement of a text on its own.
template <class Add>
std::vector<std::string> statements_of(Add&& add) {
  mediidx::test::clear_sent_statements();
  add();
  std::vector<std::string> statements;
  for (std::string_view text : mediidx::test::sent_statements()) {
    // No value of these songs has a semicolon.
    for (auto end = text.find("; "); end != text.npos; end = text.find("; ")) {
      statements.emplace_back(text.substr(0, end));
      text.remove_prefix(end + 2);
    }
    if (!text.empty()) statements.emplace_back(text);
  }
  mediidx::test::clear_sent_statements();
  return statements;
}

class ByHand {
 public:
  ByHand() : conn_(PQconnectdb("user=postgres dbname=mediaserver client_encoding=UTF8"), PQfinish) {
    if (PQstatus(conn_.get()) != CONNECTION_OK) throw std::runtime_error("not connected");
  }

  void send(const std::string& statement) const {
    const std::unique_ptr<PGresult, decltype(&PQclear)> result(
        PQexec(conn_.get(), statement.c_str()), PQclear);
    const auto status = PQresultStatus(result.get());
    if (status != PGRES_COMMAND_OK && status != PGRES_TUPLES_OK) {
      throw std::runtime_error(PQerrorMessage(conn_.get()));
    }
  }

  Cost send_all(std::span<const std::string> statements) const {
    const Cost start;
    for (const auto& statement : statements) send(statement);
    return Cost::since(start);
  }

 private:
  std::unique_ptr<PGconn, decltype(&PQfinish)> conn_;
};

void remove_rows() {
  TestServer::get().rows(
      "DO $$ BEGIN EXECUTE (SELECT 'TRUNCATE ' || string_agg(format('%I.%I', schemaname, "
      "tablename), ', ') || ' RESTART IDENTITY CASCADE' FROM pg_tables WHERE schemaname = "
      "'public'); END $$");
}

/// With the songs not there yet or, for `again`, there already.
void measure(benchmark::State& state, bool again) {
  TestServer::get().fresh_database();
  MediaDBConnClose();
  const Songs songs;
  const ByHand by_hand;
  Cost library{kNever, kNever};
  Cost bare{kNever, kNever};
  std::size_t sent = 0;
  for (auto _ : state) {
    remove_rows();
    std::vector<std::string> first;
    if (again) first = statements_of([&] { songs.add_all(); });
    Cost added;
    const auto statements = statements_of([&] { added = songs.add_all(); });
    remove_rows();
    by_hand.send_all(first);
    bare.keep_least(by_hand.send_all(statements));
    library.keep_least(added);
    sent = statements.size();
    state.SetIterationTime(added.wall_s);
  }
  constexpr double kToMicroseconds = 1e6 / kSongs;
  state.counters["us_per_song"] = kToMicroseconds * library.wall_s;
  state.counters["us_by_hand"] = kToMicroseconds * bare.wall_s;
  state.counters["ratio"] = library.wall_s / bare.wall_s;
  state.counters["own_cpu_us_per_song"] = kToMicroseconds * library.cpu_s;
  state.counters["own_cpu_us_by_hand"] = kToMicroseconds * bare.cpu_s;
  state.counters["statements_per_song"] = static_cast<double>(sent) / kSongs;
  MediaDBConnClose();
}

void BM_AddNewSongs(benchmark::State& state) { measure(state, false); }
void BM_AddSongsAgain(benchmark::State& state) { measure(state, true); }

// -- Steps ---------------------------------------------------------------------------------------

void BM_StepStatement(benchmark::State& state) {
  TestServer::get().fresh_database();
  auto* conn = MediaDBConnGet();
  for (auto _ : state) {
    tavodb_result* result = nullptr;
    if (TAVODBExecute(conn, "SELECT 1", &result) != 0) throw std::runtime_error("not sent");
    TAVODBFreeResult(result);
    mediidx::test::clear_sent_statements();
  }
  MediaDBConnClose();
}
void BM_StepStatementByHand(benchmark::State& state) {
  TestServer::get().fresh_database();
  const ByHand by_hand;
  for (auto _ : state) by_hand.send("SELECT 1");
}
void BM_StepIsNoFolder(benchmark::State& state) {
  const Songs songs;
  for (auto _ : state) benchmark::DoNotOptimize(IsDirExist(songs.path()));
}
void BM_StepBelongs(benchmark::State& state) {
  const Songs songs;
  for (auto _ : state) {
    benchmark::DoNotOptimize(TAVOMediaIndexIsIndexPath(songs.path(), MEDIA_TABLE_MUSIC));
  }
}
void BM_StepOwner(benchmark::State& state) {
  const Songs songs;
  for (auto _ : state) {
    benchmark::DoNotOptimize(TAVOMediaIndexGetUserIdFromPath(songs.path()));
  }
}
void BM_StepRatings(benchmark::State& state) {
  const Songs songs;
  for (auto _ : state) {
    auto* ratings = TLIBCSzHashAlloc(1024);
    benchmark::DoNotOptimize(TAVOMediaIndexGetAllUserDefinedSongRating(songs.path(), ratings));
    TLIBCSzHashFree(ratings);
  }
}
void BM_StepMarker(benchmark::State& state) {
  const Songs songs;
  for (auto _ : state) benchmark::DoNotOptimize(TAVOIndexMusicTableDirtySet(1));
}

BENCHMARK(BM_AddNewSongs)->UseManualTime()->Iterations(kTurns)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_AddSongsAgain)->UseManualTime()->Iterations(kTurns)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_StepStatement);
BENCHMARK(BM_StepStatementByHand);
BENCHMARK(BM_StepIsNoFolder);
BENCHMARK(BM_StepBelongs);
BENCHMARK(BM_StepOwner);
BENCHMARK(BM_StepRatings);
BENCHMARK(BM_StepMarker);

}  // namespace

BENCHMARK_MAIN();
