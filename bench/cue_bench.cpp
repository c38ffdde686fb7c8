// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// A cue sheet: its lines parsed into a list of records, beside what the records alone cost (each is
// cleared once and copied once) and beside libcue, which makes no records. The whole request reads
// the file, finds its character set and connects to the database for the length of its last track.
#include <benchmark/benchmark.h>
#include <libcue.h>

#include <cstring>
#include <memory>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "api/virtual_tracks.h"
#include "database.h"
#include "playlist/cue_durations.h"
#include "scratch.h"

namespace {

using mediidx::test::ScratchRoot;
using mediidx::test::TestServer;
using Record = __tag_TAVO_MEDIA_INFO;
using OwnedCd = std::unique_ptr<Cd, decltype(&cd_delete)>;

std::string two_digits(int number) { return (number < 10 ? "0" : "") + std::to_string(number); }

/// One album in one file, as rippers write it.
std::string sheet_of(int tracks) {
  std::string text =
      "REM GENRE \"Progressive Rock\"\nREM DATE 1975\nREM DISCID A50C9B0C\n"
      "REM COMMENT \"ExactAudioCopy v1.3\"\nPERFORMER \"The Band of the Album\"\n"
      "TITLE \"An Album with a Name of Some Words\"\nFILE \"The Band - An Album.flac\" WAVE\n";
  for (int i = 1; i <= tracks; ++i) {
    const auto number = two_digits(i);
    text += "  TRACK " + number + " AUDIO\n    TITLE \"The Song Number " + number +
            "\"\n    PERFORMER \"The Band of the Album\"\n    FLAGS DCP\n"
            "    ISRC GBAYE75000" +
            number + "\n";
    if (i > 1) text += "    INDEX 00 " + two_digits(4 * i - 1) + ":58:12\n";
    text += "    INDEX 01 " + two_digits(4 * i) + ":00:37\n";
  }
  return text;
}

std::vector<std::string> lines_of(const std::string& text) {
  std::vector<std::string> lines;
  std::istringstream in(text);
  for (std::string line; std::getline(in, line);) lines.push_back(line);
  return lines;
}

/// No folder is indexed, so that nothing is asked of a database.
void BM_CueSheet(benchmark::State& state) {
  const ScratchRoot root;
  const auto path = root.write("music/album.cue", "");
  root.write("music/The Band - An Album.flac", "");
  const auto lines = lines_of(sheet_of(static_cast<int>(state.range(0))));
  const mediidx::KnownDurations none;
  for (auto _ : state) {
    _PLAYLIST_REC* tracks = nullptr;
    if (!mediidx::parse_again(lines, path.c_str(), none, &tracks) || !tracks) {
      throw std::runtime_error("not parsed");
    }
    TAVOPlaylistRecFree(tracks);
  }
}

void BM_CueRecordsClearedAndCopied(benchmark::State& state) {
  const auto count = static_cast<std::size_t>(state.range(0));
  std::vector<Record> records(count);
  std::vector<Record> copies(count);
  for (auto _ : state) {
    std::memset(records.data(), 0, count * sizeof(Record));
    benchmark::ClobberMemory();
    std::memcpy(copies.data(), records.data(), count * sizeof(Record));
    benchmark::ClobberMemory();
  }
}

void BM_CueSheetByLibcue(benchmark::State& state) {
  const auto text = sheet_of(static_cast<int>(state.range(0)));
  for (auto _ : state) {
    const OwnedCd cd(cue_parse_string(text.c_str()), cd_delete);
    if (!cd || cd_get_ntrack(cd.get()) != state.range(0)) throw std::runtime_error("not parsed");
  }
}

void BM_CueRequest(benchmark::State& state) {
  TestServer::get().fresh_database();
  const ScratchRoot root;
  const auto path = root.write("album.cue", sheet_of(static_cast<int>(state.range(0))));
  for (auto _ : state) {
    if (!mediidx::parse_virtual_tracks(path.c_str())) throw std::runtime_error("not parsed");
  }
}

BENCHMARK(BM_CueSheet)->Arg(12)->Arg(99)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_CueRecordsClearedAndCopied)->Arg(12)->Arg(99)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_CueSheetByLibcue)->Arg(12)->Arg(99)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_CueRequest)->Arg(12)->Unit(benchmark::kMicrosecond);

}  // namespace

BENCHMARK_MAIN();
