// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Reading playlists of rising length: the time per entry stays flat.
#include <benchmark/benchmark.h>

#include <stdexcept>
#include <string>

#include "database.h"
#include "mediidx/database.h"
#include "mediidx/playlist.h"
#include "scratch.h"

namespace {

using mediidx::test::ScratchRoot;
using mediidx::test::TestServer;

/// Every entry has tags of its own, which the index does not know.
std::string tagged_playlist(int entries) {
  std::string text = "#EXTM3U\n";
  for (int i = 0; i < entries; ++i) {
    const auto number = std::to_string(i);
    text += "#EXTINF:215,Song " + number + "\n#EXTINFARTIST:Artist\nalbum/" + number + ".mp3\n";
  }
  return text;
}

/// One record is handed out: a list of all would be 12 KB an entry.
void read_playlist(benchmark::State& state, int limit) {
  TestServer::get().fresh_database();
  MediaDBConnClose();
  const ScratchRoot root;
  const auto entries = static_cast<int>(state.range(0));
  const auto path = root.write("list.m3u", tagged_playlist(entries));
  for (auto _ : state) {
    int count = 0;
    auto* list = ParsePlayListByFieldGivenPath(
        path.c_str(), &count, entries - 1, limit, "id, path",
        MEDIIDX_KEEP_KNOWN | MEDIIDX_KEEP_UNKNOWN | MEDIIDX_KEEP_STREAMS);
    if (count != entries || (limit > 0 && !list)) throw std::runtime_error("not read");
    TAVOPlaylistRecFree(list);
  }
  state.counters["per entry"] = benchmark::Counter(
      static_cast<double>(entries),
      benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
  MediaDBConnClose();
}

void BM_ReadTaggedPlaylist(benchmark::State& state) { read_playlist(state, 1); }
void BM_CountPlaylist(benchmark::State& state) { read_playlist(state, -1); }

BENCHMARK(BM_ReadTaggedPlaylist)
    ->RangeMultiplier(10)
    ->Range(1000, 100000)
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_CountPlaylist)
    ->RangeMultiplier(10)
    ->Range(1000, 100000)
    ->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
