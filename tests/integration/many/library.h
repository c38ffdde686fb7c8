// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Random batches over small vocabularies, so that paths, albums and artists meet.
#ifndef MEDIIDX_TESTS_MANY_LIBRARY_H_
#define MEDIIDX_TESTS_MANY_LIBRARY_H_

#include <cstddef>
#include <random>
#include <string>
#include <vector>

#include "twin_test.h"

namespace mediidx::test {

class RandomLibrary {
 public:
  RandomLibrary(const ScratchRoot& root, unsigned seed);

  unsigned below(unsigned n) { return static_cast<unsigned>(random_() % n); }
  bool one_in(unsigned n) { return below(n) == 0; }

  Info song();
  Json::Value json_song();
  Info video();
  Info photo();
  /// A playlist or cue sheet.
  Info playlist();
  DIR_INFO_REC folder();
  /// The path of a song or sheet that may be in the index.
  std::string any_path();

  /// Writes every cue sheet anew. Their tracks of one file have numbers of their own, but where
  /// `clashing`.
  void write_cue_sheets(bool clashing);
  /// Writes playlists and rating files; some of the latter cannot be read.
  void write_files();

  /// Makes a record one that the database refuses.
  void spoil(Info& info);

 private:
  std::string text();
  std::string one_of(const std::vector<std::string>& texts) {
    return texts[below(static_cast<unsigned>(texts.size()))];
  }
  void fill(Info& info);
  std::string sheet(const std::vector<std::string>& files, int first_number);

  const ScratchRoot& root_;
  std::mt19937 random_;
  std::vector<std::string> songs_;
  std::vector<std::string> sheets_;
  std::vector<std::string> playlists_;
};

}  // namespace mediidx::test

#endif
