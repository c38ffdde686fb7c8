// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// growth [TRACKS…]: what a request costs in libraries of rising size, and in one album of many
// untagged tracks. Prints Markdown tables; of what grows, the statements with their plans.
//
// Times are medians in microseconds on a server whose commits are not awaited.
#include <json/reader.h>
#include <json/value.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <functional>
#include <iterator>
#include <map>
#include <sstream>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "database.h"
#include "mediidx/database.h"
#include "mediidx/request.h"
#include "scratch.h"
#include "sql_text.h"

namespace mediidx::test {
namespace {

using Info = __tag_TAVO_MEDIA_INFO;

constexpr int kRuns = 41;
constexpr int kBatchRuns = 11;
constexpr unsigned kBatch = 100;
constexpr double kGoal = 1.3;
constexpr int kTracksOfAlbum = 10;

template <std::size_t kSize>
void set(char (&field)[kSize], std::string_view text) {
  field[text.copy(field, kSize - 1)] = '\0';
}

void must(bool good, const char* what) {
  if (!good) throw std::runtime_error(std::string(what) + " failed");
}

double median(std::vector<double> values) {
  const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
  std::ranges::nth_element(values, middle);
  return *middle;
}

double microseconds(const std::function<void()>& work) {
  const auto started = std::chrono::steady_clock::now();
  work();
  return std::chrono::duration<double, std::micro>(std::chrono::steady_clock::now() - started)
      .count();
}

struct Statement {
  std::string text;
  double microseconds;
  std::string plan;
};

/// What one request sends, each statement with its plan, without a trace of it in the database.
std::vector<Statement> explain(const std::vector<std::string>& texts) {
  std::string script = "BEGIN";
  std::vector<Statement> out;
  auto& server = TestServer::get();
  // One session for all: each statement finds what those before it did.
  server.rows("CREATE TABLE IF NOT EXISTS bench_plan(n serial, line text)");
  server.rows("DELETE FROM bench_plan");
  for (const auto& text : texts) {
    for (auto& statement : split_statements(text)) out.push_back({std::move(statement), 0, {}});
  }
  if (out.empty()) return out;
  std::string block = "DO $bench$ DECLARE told text; BEGIN ";
  for (std::size_t i = 0; i < out.size(); ++i) {
    // Side rows of an id that is no more are refused: a text is from an earlier run.
    block += "BEGIN FOR told IN EXECUTE $explain$EXPLAIN (ANALYZE) " + out[i].text +
             "$explain$ LOOP INSERT INTO bench_plan(n, line) VALUES(" + std::to_string(i) +
             ", told); END LOOP; EXCEPTION WHEN OTHERS THEN NULL; END; ";
  }
  // Undone but for the plans, which a notice cannot carry: they are raised as the error's text.
  block +=
      "RAISE EXCEPTION '%', (SELECT json_agg(json_build_array(n, line)) FROM bench_plan); "
      "END $bench$";
  try {
    server.rows(block);
  } catch (const std::runtime_error& error) {
    const std::string told = error.what();
    Json::Value lines;
    std::istringstream in(told.substr(std::min(told.find('['), told.size())));
    std::string errors;
    Json::CharReaderBuilder reader;
    reader["failIfExtra"] = false;  // the server tells where it was raised
    if (!Json::parseFromStream(reader, in, &lines, &errors)) throw std::runtime_error(told);
    for (const auto& line : lines) {
      auto& statement = out.at(line[0].asUInt());
      const auto text = line[1].asString();
      statement.plan += "    " + text + "\n";
      constexpr std::string_view kTime = "Execution Time: ";
      if (text.starts_with(kTime)) {
        statement.microseconds = std::stod(text.substr(kTime.size())) * 1000;
      }
    }
  }
  return out;
}

/// One request, with what puts the library back.
struct Operation {
  std::string name;
  int runs;
  std::function<void(int run)> before;
  std::function<void(int run)> work;
  std::function<void(int run)> after;
};

struct Cost {
  double microseconds = 0;
  std::vector<Statement> statements;
};

class Bench {
 public:
  Bench() {
    root_.index_everything("music", root_.make_folder("volume1/music"));
    TestServer::get().fresh_database();
    std::ifstream in(MEDIIDX_GROWTH_LIBRARY);
    library_.assign(std::istreambuf_iterator<char>(in), {});
    must(!library_.empty(), "reading the library's text");
  }

  void grow_to(int tracks) {
    const int albums = tracks / kTracksOfAlbum;
    TestServer::get().rows("SET bench.first = " + std::to_string(albums_ + 1) +
                           "; SET bench.last = " + std::to_string(albums) + "; " + library_);
    albums_ = albums;
    tidy();
  }

  void tidy() {
    MediaDBConnClose();
    TestServer::get().rows("VACUUM ANALYZE");
  }

  /// An album in which so many untagged tracks have artists of their own.
  void make_untagged_album(int tracks) {
    TestServer::get().rows(
        "DELETE FROM track; DELETE FROM music; "
        "INSERT INTO track(userid, path, title, is_virtual, has_virtual) SELECT 0, "
        "'/volume3/loose/' || n || '.mp3', n, 'FALSE', 'FALSE' FROM generate_series(1, " +
        std::to_string(tracks) +
        ") n; INSERT INTO artist_track SELECT id, 'Artist ' || id, '', '', 'FALSE' FROM track; "
        "INSERT INTO album_track SELECT id, '', '', '', '', '', '', 'FALSE' FROM track; "
        "INSERT INTO genre_track SELECT id, '', '', '' FROM track; "
        "INSERT INTO composer_track SELECT id, '', '', '' FROM track");
    tidy();
  }

  Cost measure(const Operation& operation) {
    std::vector<double> times;
    Cost cost;
    for (int run = -2; run < operation.runs; ++run) {
      operation.before(run);
      if (run == -1) {
        clear_sent_statements();
        operation.work(run);
        const auto sent = sent_statements();
        operation.after(run);
        operation.before(run);
        cost.statements = explain(sent);
      }
      const auto time = microseconds([&] { operation.work(run); });
      if (run >= 0) times.push_back(time);
      operation.after(run);
    }
    cost.microseconds = median(times);
    return cost;
  }

  /// A path that is in every library.
  const std::string& known_song() const {
    static const auto kPath = TestServer::get().rows(
        "SELECT path FROM music WHERE album = 'Collected Works 42' "
        "AND track = 7")[0][0];
    return kPath;
  }

  std::string path(const std::string& name) const { return root_.at("volume1/music/" + name); }

  Info song(int album, int number, bool tagged) const {
    Info info{};
    const auto name = "New Works " + std::to_string(album);
    set(info.path, path(name + "/" + std::to_string(number) + ".mp3"));
    set(info.title, "Song " + std::to_string(number));
    set(info.album, name);
    set(info.artist, "New Artist " + std::to_string(album));
    if (tagged) set(info.album_artist, info.artist);
    set(info.genre, "Rock");
    info.track = number;
    return info;
  }

  Info loose(int number) const {
    Info info{};
    set(info.path, path("loose/" + std::to_string(number) + ".mp3"));
    set(info.artist, "Loose Artist " + std::to_string(number));
    return info;
  }

 private:
  ScratchRoot root_;
  std::string library_;
  int albums_ = 0;
};

void add(Info info) { must(TAVOMediaIndexAdd(&info, MEDIA_TABLE_MUSIC) == 0, "an add"); }
void remove(const Info& info) { must(TAVOMediaIndexDelete(info.path) == 0, "a delete"); }
void add_many(std::vector<Info> songs) {
  must(TAVOMediaIndexAddMany(songs.data(), static_cast<unsigned>(songs.size()), MEDIA_TABLE_MUSIC,
                             nullptr) == 0,
       "a batch");
}

void look_up(const std::string& path, int by_end) {
  static Info info;
  must(MediaInfoDBGetOne(MEDIA_TABLE_MUSIC, path.c_str(), &info, by_end) == 0, "a look-up");
}

void read_list(const std::string& where, const char* order, unsigned limit, int expected) {
  auto* handle =
      MediaInfoDBOpenEx(MEDIA_TABLE_MUSIC, nullptr, where.c_str(), nullptr, order, 0, limit, 0);
  must(handle != nullptr, "a list");
  int count = 0;
  static Info info;
  while (MediaInfoDBGet(handle, &info) == 0) ++count;
  MediaInfoDBClose(handle);
  must(count == expected, "the length of a list");
}

std::vector<Operation> operations(const Bench& bench) {
  const auto nothing = [](int) {};
  const auto batch = [&bench](int run) {
    std::vector<Info> songs;
    for (unsigned i = 0; i < kBatch; ++i) {
      songs.push_back(bench.song(1000 * (run + 3) + static_cast<int>(i) / kTracksOfAlbum,
                                 static_cast<int>(i), i % 4 == 1));
    }
    return songs;
  };
  const auto album = [&bench](int run) {
    std::vector<Info> songs;
    for (int i = 0; i < kTracksOfAlbum; ++i) songs.push_back(bench.song(run + 5, i, false));
    return songs;
  };
  const auto drop_folder = [&bench](int album_number) {
    must(TAVOMediaIndexDirDelete(bench.path("New Works " + std::to_string(album_number)).c_str()) >=
             0,
         "a folder delete");
  };
  const auto drop_batch = [drop_folder](int run) {
    for (int i = 0; i < static_cast<int>(kBatch) / kTracksOfAlbum; ++i) {
      drop_folder(1000 * (run + 3) + i);
    }
  };
  return {
      {"add, tagged", kRuns, nothing, [&](int run) { add(bench.song(run + 5, 1, true)); },
       [&](int run) { remove(bench.song(run + 5, 1, true)); }},
      {"add to an untagged album", kRuns, [album](int run) { add_many(album(run)); },
       [&](int run) { add(bench.song(run + 5, 90, false)); },
       [drop_folder](int run) { drop_folder(run + 5); }},
      {"re-save, tagged", kRuns, [&](int run) { add(bench.song(run + 5, 1, true)); },
       [&](int run) { add(bench.song(run + 5, 1, true)); },
       [&](int run) { remove(bench.song(run + 5, 1, true)); }},
      {"re-save, untagged", kRuns, [album](int run) { add_many(album(run)); },
       [&](int run) { add(bench.song(run + 5, 1, false)); },
       [drop_folder](int run) { drop_folder(run + 5); }},
      {"delete", kRuns, [&](int run) { add(bench.song(run + 5, 1, true)); },
       [&](int run) { remove(bench.song(run + 5, 1, true)); }, nothing},
      {"folder delete, 10 songs", kRuns, [album](int run) { add_many(album(run)); },
       [drop_folder](int run) { drop_folder(run + 5); }, nothing},
      {"batch of 100, new", kBatchRuns, nothing, [batch](int run) { add_many(batch(run)); },
       drop_batch},
      {"batch of 100, re-save", kBatchRuns, [batch](int run) { add_many(batch(run)); },
       [batch](int run) { add_many(batch(run)); }, drop_batch},
      {"look a path up", kRuns, nothing, [&](int) { look_up(bench.known_song(), 0); }, nothing},
      {"look a file name up", kRuns, nothing,
       [&](int) { look_up(bench.known_song().substr(bench.known_song().rfind('/')), 1); }, nothing},
      {"list a folder", kRuns, nothing,
       [](int) {
         read_list("path like '/volume3/sounds/1/Collected Works 42/%'", "path", 0, kTracksOfAlbum);
       },
       nothing},
      {"list of 50, by path", kRuns, nothing, [](int) { read_list("", "path", 50, 50); }, nothing},
      {"search an album title", kRuns, nothing,
       [](int) { read_list("album = 'Collected Works 42'", "path", 0, kTracksOfAlbum); }, nothing},
      {"count all", kRuns, nothing,
       [](int) { must(MediaInfoDBGetCount(MEDIA_TABLE_MUSIC, "id", "", "", 0) > 0, "a count"); },
       nothing},
  };
}

/// Names the statements that make an operation dearer.
void print_growth(const std::string& name, const Cost& small, const Cost& large) {
  std::printf("\n`%s`\n", name.c_str());
  for (std::size_t i = 0; i < large.statements.size(); ++i) {
    const auto& now = large.statements[i];
    const double before = i < small.statements.size() ? small.statements[i].microseconds : 0;
    const double more = now.microseconds - before;
    if (now.microseconds <= kGoal * before || more < 0.05 * large.microseconds) continue;
    std::printf("\n- %.0f µs, was %.0f µs: `%s`\n\n%s", now.microseconds, before,
                shape_of(now.text).substr(0, 400).c_str(), now.plan.c_str());
  }
}

void print_table(const std::string& what, const std::vector<int>& sizes,
                 const std::vector<std::string>& names,
                 const std::map<std::string, std::map<int, Cost>>& costs) {
  std::printf("| %s |", what.c_str());
  for (const int size : sizes) std::printf(" %d |", size);
  std::printf(" growth |\n|---|");
  for (std::size_t i = 0; i <= sizes.size(); ++i) std::printf("--:|");
  std::printf("\n");
  for (const auto& name : names) {
    const auto& row = costs.at(name);
    std::printf("| %s |", name.c_str());
    for (const int size : sizes) std::printf(" %.0f |", row.at(size).microseconds);
    std::printf(" %.2f |\n", row.at(sizes.back()).microseconds / row.at(sizes[0]).microseconds);
  }
}

void run_series(Bench& bench, const std::string& what, const std::vector<int>& sizes,
                const std::vector<Operation>& operations, void (Bench::*prepare)(int)) {
  std::map<std::string, std::map<int, Cost>> costs;
  std::vector<std::string> names;
  for (const auto& operation : operations) names.push_back(operation.name);
  for (const int size : sizes) {
    std::fprintf(stderr, "growth: %s, %d\n", what.c_str(), size);
    (bench.*prepare)(size);
    for (const auto& operation : operations) {
      costs[operation.name][size] = bench.measure(operation);
      bench.tidy();
    }
  }
  print_table(what, sizes, names, costs);
  for (const auto& name : names) {
    const auto& small = costs[name][sizes[0]];
    const auto& large = costs[name][sizes.back()];
    if (large.microseconds > kGoal * small.microseconds) print_growth(name, small, large);
  }
  std::printf("\n");
}

std::vector<Operation> untagged_operations(const Bench& bench) {
  const auto nothing = [](int) {};
  const auto batch = [&bench](int run) {
    std::vector<Info> songs;
    for (unsigned i = 0; i < kBatch; ++i) {
      songs.push_back(bench.loose(1000 * (run + 3) + static_cast<int>(i)));
    }
    return songs;
  };
  const auto drop = [&bench](int) {
    must(TAVOMediaIndexDirDelete(bench.path("loose").c_str()) >= 0, "a folder delete");
  };
  constexpr int kFewRuns = 5;
  return {
      {"add", kFewRuns, nothing, [&](int run) { add(bench.loose(run + 5)); }, drop},
      {"re-save", kFewRuns, [&](int run) { add(bench.loose(run + 5)); },
       [&](int run) { add(bench.loose(run + 5)); }, drop},
      {"delete", kFewRuns, [&](int run) { add(bench.loose(run + 5)); },
       [&](int run) { remove(bench.loose(run + 5)); }, nothing},
      {"batch of 100, new", kFewRuns, nothing, [batch](int run) { add_many(batch(run)); }, drop},
      {"batch of 100, re-save", kFewRuns, [batch](int run) { add_many(batch(run)); },
       [batch](int run) { add_many(batch(run)); }, drop},
  };
}

int run(const std::vector<int>& sizes) {
  Bench bench;
  run_series(bench, "µs at so many tracks", sizes, operations(bench), &Bench::grow_to);
  run_series(bench, "µs at so many tracks of one album text", {100, 1000, 5000, 20000},
             untagged_operations(bench), &Bench::make_untagged_album);
  return 0;
}

}  // namespace
}  // namespace mediidx::test

int main(int argc, char** argv) {
  std::vector<int> sizes;
  for (int i = 1; i < argc; ++i) sizes.push_back(std::atoi(argv[i]));
  if (sizes.empty()) sizes = {1000, 10000, 100000, 1000000};
  if (!std::ranges::is_sorted(sizes) || sizes[0] < 1000) {
    std::fprintf(stderr, "usage: growth [TRACKS…], rising, from 1000\n");
    return 2;
  }
  try {
    return mediidx::test::run(sizes);
  } catch (const std::exception& error) {
    std::fprintf(stderr, "growth: %s\n", error.what());
    return 1;
  }
}
