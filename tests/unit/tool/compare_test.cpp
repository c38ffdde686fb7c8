// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/compare.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <map>

#include "scratch.h"

namespace mediidx::tool {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

/// A folder of ours whose every file is wanted, before and now.
class AComparison : public testing::Test {
 protected:
  AComparison() {
    listed.found.path = "/m";
    listed.found.status.modified = 7;
    listed.coverage.kinds.fill(true);
    listed.coverage.folder = true;
    known.id = 3;
    known.modified = 7;
    options.look = [this](const std::string& path) {
      const auto found = looks.find(path);
      return found == looks.end() ? Presence::kGone : found->second;
    };
  }
  void there(const std::string& name, std::int64_t size, std::int64_t modified) {
    FileStatus status;
    status.size = size;
    status.modified = modified;
    listed.found.files.push_back({name, Kind::kMusic, status});
  }
  void before(const std::string& name, std::int64_t size, std::int64_t modified,
              bool has_failed = false) {
    known.files.push_back({name, Kind::kMusic, size, modified, has_failed});
  }
  /// "what path" of each change.
  std::vector<std::string> changes() {
    comparison = {};
    compare(listed, known, options, comparison);
    constexpr const char* kNames[] = {"new",  "changed", "again",      "moved",      "gone",
                                      "left", "with",    "gonefolder", "leftfolder", "away"};
    std::vector<std::string> out;
    for (const auto& change : comparison.changes) {
      out.push_back(kNames[static_cast<int>(change.what)] + std::string(" ") + change.path);
    }
    return out;
  }

  ListedFolder listed;
  KnownFolder known;
  CompareOptions options;
  std::map<std::string, Presence> looks;
  Comparison comparison;
};

TEST_F(AComparison, OfTheSameIsEmpty) {
  there("a.mp3", 10, 20);
  before("a.mp3", 10, 20);
  EXPECT_THAT(changes(), IsEmpty());
}

TEST_F(AComparison, TakesAnyDifferenceAsAChange) {
  before("a.mp3", 10, 20);
  there("a.mp3", 11, 20);
  EXPECT_THAT(changes(), ElementsAre("changed /m/a.mp3"));
  listed.found.files[0].status = {};
  listed.found.files[0].status.size = 10;
  for (const std::int64_t time : {19, 21, -20}) {
    listed.found.files[0].status.modified = time;
    EXPECT_THAT(changes(), ElementsAre("changed /m/a.mp3")) << time;
  }
}

TEST_F(AComparison, ForgivesFatItsTwoSeconds) {
  options.tolerance = 2'000'000'000;
  before("a.mp3", 10, 10'000'000'000);
  there("a.mp3", 10, 12'000'000'000);
  EXPECT_THAT(changes(), IsEmpty());
  listed.found.files[0].status.modified = 8'000'000'000;
  EXPECT_THAT(changes(), IsEmpty());
  listed.found.files[0].status.modified = 12'000'000'001;
  EXPECT_THAT(changes(), ElementsAre("changed /m/a.mp3"));
  listed.found.files[0].status.modified = 10'000'000'000;
  listed.found.files[0].status.size = 11;
  EXPECT_THAT(changes(), ElementsAre("changed /m/a.mp3"));
}

TEST_F(AComparison, WithoutTrustTakesEverythingAsChanged) {
  options.full = true;
  there("a.mp3", 10, 20);
  before("a.mp3", 10, 20);
  EXPECT_THAT(changes(), ElementsAre("changed /m", "changed /m/a.mp3"));
}

TEST_F(AComparison, ReadsAgainWhatIsUnsure) {
  there("a.mp3", 10, 20);
  before("a.mp3", -2, 20);
  EXPECT_THAT(changes(), ElementsAre("changed /m/a.mp3"));
}

TEST_F(AComparison, FindsNewFilesAndFolders) {
  known.modified.reset();
  there("a.mp3", 10, 20);
  EXPECT_THAT(changes(), ElementsAre("new /m", "new /m/a.mp3"));
}

TEST_F(AComparison, LeavesAFailedFileAloneUntilItChanges) {
  there("a.mp3", 10, 20);
  before("a.mp3", 10, 20, true);
  EXPECT_THAT(changes(), IsEmpty());
  EXPECT_EQ(comparison.left_alone, 1U);
  listed.found.files[0].status.size = 11;
  EXPECT_THAT(changes(), ElementsAre("changed /m/a.mp3"));
  EXPECT_EQ(comparison.changes[0].known, -1);
}

TEST_F(AComparison, CallsOnlyWhatIsReallyMissingGone) {
  for (const char* name : {"gone.mp3", "hidden.mp3", "unknown.mp3", "now-a-folder.mp3"}) {
    before(name, 1, 1);
  }
  looks["/m/hidden.mp3"] = Presence::kOther;
  looks["/m/unknown.mp3"] = Presence::kUnknown;
  looks["/m/now-a-folder.mp3"] = Presence::kFolder;
  EXPECT_THAT(changes(),
              ElementsAre("gone /m/gone.mp3", "left /m/hidden.mp3", "left /m/now-a-folder.mp3"));
}

TEST_F(AComparison, FreezesWhatCouldNotBeLookedAt) {
  before("a.mp3", 1, 1);
  known.subfolders = {"/m/sub"};
  listed.found.unreadable = {"a.mp3", "sub"};
  EXPECT_THAT(changes(), IsEmpty());
}

TEST_F(AComparison, MissesSubfolders) {
  known.subfolders = {"/m/there", "/m/gone", "/m/file", "/m/left", "/m/unknown"};
  listed.found.subfolders = {"there", "new"};
  looks["/m/file"] = Presence::kOther;
  looks["/m/left"] = Presence::kFolder;
  looks["/m/unknown"] = Presence::kUnknown;
  EXPECT_THAT(changes(),
              ElementsAre("gonefolder /m/gone", "gonefolder /m/file", "leftfolder /m/left"));
}

TEST_F(AComparison, ForgetsWhatIsSwitchedOff) {
  listed.coverage.kinds.fill(false);
  listed.coverage.folder = false;
  there("a.mp3", 10, 20);
  there("b.mp3", 10, 20);
  before("a.mp3", 10, 20);
  EXPECT_THAT(changes(), ElementsAre("left /m", "left /m/a.mp3"));
  EXPECT_EQ(comparison.switched_off, 2U);
}

TEST(ALook, TellsWhatIsThere) {
  test::ScratchFolder scratch;
  const auto file = scratch.write("a", "x");
  scratch.make_link("dangling", "nowhere");
  EXPECT_EQ(look_at(file), Presence::kOther);
  EXPECT_EQ(look_at(scratch.path()), Presence::kFolder);
  EXPECT_EQ(look_at(scratch.at("dangling")), Presence::kOther);
  EXPECT_EQ(look_at(scratch.at("missing")), Presence::kGone);
  EXPECT_EQ(look_at(file + "/below"), Presence::kGone);
  EXPECT_EQ(look_at(scratch.at(std::string(300, 'x'))), Presence::kUnknown);
}

}  // namespace
}  // namespace mediidx::tool
