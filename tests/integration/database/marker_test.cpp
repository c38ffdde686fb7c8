// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The marker file of changed tables.
#include <filesystem>

#include "media_test.h"
#include "mediidx/root.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

class Marker : public testing::Test {
 protected:
  Marker() { clear_log(); }
  ScratchRoot root;
};

TEST_F(Marker, IsMadeEmptyWhenItIsMissing) {
  EXPECT_EQ(TAVOIndexTableDirtySet(root.at("marker").c_str()), 0);
  EXPECT_TRUE(root.exists("marker"));
  EXPECT_EQ(root.read("marker"), "");
}

TEST_F(Marker, IsLeftAloneWhenItIsThere) {
  root.write("marker", "content");
  const auto written = fs::last_write_time(root.at("marker"));
  EXPECT_NE(TAVOIndexTableDirtySet(root.at("marker").c_str()), 0);
  EXPECT_EQ(root.read("marker"), "content");
  EXPECT_EQ(fs::last_write_time(root.at("marker")), written);
}

TEST_F(Marker, CannotBeMadeInAFolderThatIsMissing) {
  EXPECT_EQ(TAVOIndexTableDirtySet(root.at("none/marker").c_str()), 0);
  EXPECT_FALSE(root.exists("none"));
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_F(Marker, IsNotMadeWithoutAPath) { EXPECT_EQ(TAVOIndexTableDirtySet(nullptr), 0); }

TEST_F(Marker, OfAGivenPathIsNotLookedUpBelowTheRoot) {
  const ScratchFolder elsewhere;
  TAVOIndexTableDirtySet(elsewhere.at("marker").c_str());
  EXPECT_TRUE(elsewhere.exists("marker"));
  EXPECT_FALSE(root.exists(elsewhere.at("marker")));
}

class MarkerOfATable : public Marker, public testing::WithParamInterface<int (*)(int)> {};

TEST_P(MarkerOfATable, LiesBelowTheRoot) {
  root.make_folder("tmp");
  EXPECT_EQ(GetParam()(0), 0);
  EXPECT_TRUE(root.exists("tmp/tavoindexdaapd_checkin"));
}

TEST_P(MarkerOfATable, IsOneForBothTables) {
  root.make_folder("tmp");
  TAVOIndexMusicTableDirtySet(1);
  EXPECT_NE(GetParam()(1), 0);
}

TEST_P(MarkerOfATable, LogsNothingWhenItCannotBeMade) {
  EXPECT_EQ(GetParam()(1), 0);
  EXPECT_THAT(log_lines(), IsEmpty());
}

INSTANTIATE_TEST_SUITE_P(MusicAndVideo, MarkerOfATable,
                         testing::Values(&TAVOIndexMusicTableDirtySet,
                                         &TAVOIndexVideoTableDirtySet));

}  // namespace
}  // namespace mediidx::test
