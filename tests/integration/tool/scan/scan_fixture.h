// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the tests of the scan have in common.
#ifndef MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_SCAN_FIXTURE_H_
#define MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_SCAN_FIXTURE_H_

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "database.h"
#include "integration/tool/command.h"

namespace mediidx::test {

namespace fs = std::filesystem;
using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::UnorderedElementsAre;
using Words = std::vector<std::string>;

inline constexpr const char* kSong = "music/Untagged/tape side A.mp3";
inline constexpr const char* kPhoto = "photos/2021 Harbour/IMG_0001.jpg";
inline constexpr const char* kFilm = "videos/harbour.mp4";

/// What a scan's last line counts.
struct Counts {
  int added = 0;
  int changed = 0;
  int moved = 0;
  int removed = 0;
  int offline = 0;
  int skipped = 0;
  int failed = 0;

  bool operator==(const Counts&) const = default;
};
std::ostream& operator<<(std::ostream& out, const Counts& counts);

struct ScanOutcome : Outcome {
  Counts counts;
};

/// Tags of a song.
struct SongTags {
  std::string title{};
  std::string album{};
  std::string artist{};
  std::string album_artist{};
};

/// An index of media/m on the test's server.
class ScanTest : public DatabaseTest {
 protected:
  ScanTest();

  /// Runs the command on this test's data folder.
  Outcome run(Words words, const Setting& setting = {}) const;
  /// Makes media/m an index folder and scans it; it has to succeed.
  void index();
  /// Scans at full speed.
  ScanOutcome scan(Words words = {}, const Setting& setting = {}) const;
  /// A scan that has to end with this status and these counts.
  void expect_scan(int status, const Counts& counts, const Words& words = {}) const;
  std::string song(const std::string& name, const SongTags& tags = {}) const;
  std::string at(const std::string& name) const { return media.at("m/" + name); }
  void remove(const std::string& name) const { fs::remove_all(at(name)); }
  void move(const std::string& from, const std::string& to) const;
  /// Paths below media/m in a table.
  std::vector<std::string> stored(const std::string& table);
  /// Every row of the library's tables but for the ids, as text.
  std::vector<std::string> everything();
  /// What a scan of the same tree leaves in an empty index.
  void expect_as_fresh();

  OpenFolder data;
  OpenFolder media;
};

}  // namespace mediidx::test

#endif
