// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Files a second: in this process, and by workers. The files are copies of one of the sample
// library.
#include <benchmark/benchmark.h>

#include <filesystem>
#include <stdexcept>
#include <string>
#include <vector>

#include "scratch.h"
#include "workers/tag_workers.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;
using tool::Kind;

constexpr std::size_t kFiles = 4000;

const std::vector<std::string>& files() {
  static const ScratchFolder folder;
  static const auto made = [] {
    const auto sample =
        fs::path(MEDIIDX_SAMPLE_LIBRARY) / "music/Harbour Lights/Low Tide/03 - A Long Ebb.flac";
    std::vector<std::string> out;
    for (std::size_t i = 0; i < kFiles; ++i) {
      out.push_back(folder.at(std::to_string(i) + ".flac"));
      fs::copy_file(sample, out.back());
    }
    return out;
  }();
  return made;
}

void read_directly(benchmark::State& state) {
  const auto& paths = files();
  for (auto round : state) {
    for (const auto& path : paths) {
      benchmark::DoNotOptimize(tool::read_media_file(path, Kind::kMusic));
    }
  }
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(kFiles));
}

void read_by_workers(benchmark::State& state) {
  const auto& paths = files();
  tool::TagWorkers workers(static_cast<unsigned>(state.range(0)), {}, MEDIIDX_COMMAND);
  static_cast<void>(workers.sandbox());
  for (auto round : state) {
    std::size_t next = 0;
    for (std::size_t taken = 0; taken < kFiles;) {
      constexpr std::size_t kAhead = 256;
      while (next < kFiles && workers.outstanding() < kAhead) {
        workers.submit({next, paths[next], Kind::kMusic});
        ++next;
      }
      const auto answer = workers.take(std::chrono::seconds(1));
      if (!answer) continue;
      if (!answer->reason.empty()) throw std::runtime_error(answer->reason);
      ++taken;
    }
  }
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(kFiles));
}

BENCHMARK(read_directly)->UseRealTime()->Unit(benchmark::kMillisecond);
BENCHMARK(read_by_workers)->Arg(1)->Arg(2)->UseRealTime()->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace mediidx::test

BENCHMARK_MAIN();
