// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The text work of each record: filling a statement, sort keys, and a sheet's character set.
#include <benchmark/benchmark.h>

#include <stdexcept>
#include <string>

#include "playlist/cue_charset.h"
#include "support/sort_key.h"
#include "support/statement.h"

namespace {

using mediidx::NameKeys;
using mediidx::Template;
using Text = const char*;

/// As long as the statement of a song.
constexpr Template<Text, std::int64_t, Text, Text, Text, Text, Text, int, int, int, int, Text>
    kInsert{
        "INSERT INTO music(path, filesize, title, album, artist, album_artist, comment, year, "
        "frequency, bitrate, track, mdate) VALUES('@TAVO:VAR', @TAVO:LLINT, '@TAVO:VAR', "
        "'@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, @TAVO:INT, @TAVO:INT, "
        "@TAVO:INT, '@TAVO:VAR')"};

void BM_FillTemplate(benchmark::State& state) {
  for (auto _ : state) {
    const auto sql = mediidx::fill(TAVODB_TYPE_POSTGRESQL, kInsert,
                                   "/volume1/music/The Band/An Album/01 - It's a Song.flac",
                                   std::int64_t{31234567}, "It's a Song", "An Album", "The Band",
                                   "The Band", "A comment of a few words that somebody left", 1975,
                                   44100, 951000, 1, "2020-02-02 20:20:20");
    if (!sql) throw std::runtime_error("not filled");
    benchmark::DoNotOptimize(sql.get());
  }
}

void BM_FillPattern(benchmark::State& state) {
  static constexpr Template<Text, Text> kDelete{
      "DELETE FROM @TAVO:NEVAR WHERE path like '@TAVO:LVAR'"};
  for (auto _ : state) {
    const auto sql = mediidx::fill(TAVODB_TYPE_POSTGRESQL, kDelete, "music",
                                   "/volume1/music/The_Band/An_Album/01_-_100%_It's.flac");
    if (!sql) throw std::runtime_error("not filled");
    benchmark::DoNotOptimize(sql.get());
  }
}

void BM_SortKeys(benchmark::State& state) {
  std::string name = "The Name of a Song";
  for (auto _ : state) {
    benchmark::DoNotOptimize(name.data());
    const NameKeys keys(name);
    benchmark::DoNotOptimize(keys.sort);
  }
}

/// As many repeats as a sheet's beginning takes that is looked at.
std::string sample_of(std::string_view line) {
  std::string sample;
  while (sample.size() < 4096) sample += line;
  sample.resize(4096);
  return sample;
}

void detect(benchmark::State& state, std::string_view line, std::string_view code_page) {
  const auto sample = sample_of(line);
  for (auto _ : state) {
    benchmark::DoNotOptimize(mediidx::detect_charset(sample, code_page));
  }
}

void BM_CharsetOfAscii(benchmark::State& state) {
  detect(state, "  TRACK 01 AUDIO\n    TITLE \"The Song\"\n", "enu");
}
void BM_CharsetOfUtf8(benchmark::State& state) {
  detect(state, "    TITLE \"\xD0\x9F\xD0\xB5\xD1\x81\xD0\xBD\xD1\x8F\"\n", "rus");
}
void BM_CharsetOfCp1251(benchmark::State& state) {
  detect(state, "    TITLE \"\xCF\xE5\xF1\xED\xFF \xEE \xE2\xE5\xF1\xED\xE5\"\n", "rus");
}
void BM_CharsetOfGbk(benchmark::State& state) {
  detect(state, "    TITLE \"\xB8\xE8\xC7\xFA\xB5\xC4\xC3\xFB\xD7\xD6\"\n", "chs");
}

BENCHMARK(BM_FillTemplate);
BENCHMARK(BM_FillPattern);
BENCHMARK(BM_SortKeys);
BENCHMARK(BM_CharsetOfAscii);
BENCHMARK(BM_CharsetOfUtf8);
BENCHMARK(BM_CharsetOfCp1251);
BENCHMARK(BM_CharsetOfGbk);

}  // namespace

BENCHMARK_MAIN();
