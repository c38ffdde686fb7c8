// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <string>

#include "mediidx/database.h"
#include "request_test.h"

namespace mediidx::test {
namespace {

class AFolder : public RequestTest {
 protected:
  /// Makes a folder in the indexed share and adds it.
  std::string add(const std::string& name) {
    auto path = root.make_folder("volume1/media/" + name);
    const auto folder = folder_record(path);
    EXPECT_EQ(TAVOMediaIndexDirAdd(&folder), 0);
    return path;
  }
  void add_video(const std::string& name) {
    auto info = record(shared(name));
    EXPECT_EQ(TAVOMediaIndexAdd(&info, MEDIA_TABLE_VIDEO), 0);
  }
};

TEST_F(AFolder, IsAdded) {
  const auto path = add("2010");
  EXPECT_THAT(paths("directory"), ElementsAre(path));
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(AFolder, IsAddedOnceHoweverOften) {
  const auto path = add("2010");
  const auto folder = folder_record(path);
  EXPECT_EQ(TAVOMediaIndexReindexDirUpdate(&folder), 0);
  EXPECT_EQ(count("directory"), 1);
}

TEST_F(AFolder, IsNotAddedWithoutARecord) {
  EXPECT_EQ(TAVOMediaIndexDirAdd(nullptr), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Bad parameter"));
}

TEST_F(AFolder, IsNotAddedWhenItIsAFileOrMissing) {
  const auto file = folder_record(root.write("volume1/media/%s", ""));
  const auto missing = folder_record(shared("missing"));
  EXPECT_EQ(TAVOMediaIndexDirAdd(&file), -1);
  EXPECT_EQ(TAVOMediaIndexDirAdd(&missing), -1);
  EXPECT_THAT(
      log_lines(),
      ElementsAre("mediidx:N Path should be a directory, not a file: " + shared("%s"),
                  "mediidx:N Path should be a directory, not a file: " + shared("missing")));
}

TEST_F(AFolder, IsIgnoredOutsideOfTheIndex) {
  const auto folder = folder_record(root.make_folder("volume1/other/sub"));
  EXPECT_EQ(TAVOMediaIndexDirAdd(&folder), 0);
  EXPECT_THAT(sent_statements(), IsEmpty());
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(AFolder, ThatCannotBeSavedIsAnError) {
  take_away("directory");
  const auto folder = folder_record(root.make_folder("volume1/media/2010"));
  EXPECT_EQ(TAVOMediaIndexDirAdd(&folder), -1);
  EXPECT_EQ(log_lines().back(), "mediidx:N Failed to save dir info.");
}

TEST_F(AFolder, IsDeletedWithAllBelowIt) {
  const auto path = add("2010");
  add("2010/trip");
  const auto other = add("2010x");
  add_video("2010/trip/a.mp4");
  add_video("b.mp4");
  EXPECT_EQ(TAVOMediaIndexDirDelete(path.c_str()), 0);
  EXPECT_THAT(paths("directory"), ElementsAre(other));
  EXPECT_THAT(paths("video"), ElementsAre(shared("b.mp4")));
}

TEST_F(AFolder, IsNotDeletedWithoutAPath) {
  add_video("a.mp4");
  EXPECT_EQ(TAVOMediaIndexDirDelete(nullptr), -1);
  EXPECT_EQ(TAVOMediaIndexDirDelete(""), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Bad parameter.", "mediidx:N Bad parameter."));
  EXPECT_EQ(count("video"), 1);
}

TEST_F(AFolder, ThatCannotBeDeletedIsAnError) {
  take_away("video_convert");
  EXPECT_EQ(TAVOMediaIndexDirDelete(shared("2010").c_str()), -1);
}

TEST_F(AFolder, RenamedInTheIndexIsMovedAndGivesMinusOne) {
  const auto old_path = add("old");
  add_video("old/a.mp4");
  const auto folder = folder_record(root.make_folder("volume1/media/new"));
  EXPECT_EQ(TAVOMediaIndexDirRename(&folder, old_path.c_str()), -1);
  EXPECT_THAT(paths("directory"), ElementsAre(shared("new")));
  EXPECT_EQ(count("video"), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(AFolder, RenamedOutOfTheIndexIsRemoved) {
  const auto old_path = add("old");
  const auto folder = folder_record(root.make_folder("volume1/other/new"));
  EXPECT_EQ(TAVOMediaIndexDirRename(&folder, old_path.c_str()), 0);
  EXPECT_EQ(count("directory"), 0);
}

TEST_F(AFolder, RenamedToAMissingOneGivesMinusOne) {
  const auto folder = folder_record(shared("missing"));
  EXPECT_EQ(TAVOMediaIndexDirRename(&folder, shared("old").c_str()), -1);
  EXPECT_EQ(log_lines().back(),
            "mediidx:N Path should be a directory, not a file: " + shared("missing"));
}

TEST_F(AFolder, IsNotRenamedWithoutARecordOrAnOldPath) {
  const auto folder = folder_record(shared("new"));
  EXPECT_EQ(TAVOMediaIndexDirRename(nullptr, "/old"), -1);
  EXPECT_EQ(TAVOMediaIndexDirRename(&folder, nullptr), -1);
  EXPECT_EQ(TAVOMediaIndexDirRename(&folder, ""), -1);
  EXPECT_EQ(log_lines(), std::vector<std::string>(3, "mediidx:N Bad parameter."));
  EXPECT_THAT(sent_statements(), IsEmpty());
}

TEST_F(AFolder, IsClearedBeforeItIsIndexedAgain) {
  const auto path = add("2010");
  add_video("2010/a.mp4");
  add_video("b.mp4");
  EXPECT_EQ(TAVOMediaIndexPreReindex(path.c_str()), 0);
  EXPECT_THAT(paths("video"), ElementsAre(shared("b.mp4")));
  EXPECT_EQ(count("directory"), 0);
}

TEST_F(AFolder, IsNotClearedWithoutAPath) {
  add_video("a.mp4");
  EXPECT_EQ(TAVOMediaIndexPreReindex(nullptr), -1);
  EXPECT_EQ(TAVOMediaIndexPreReindex(""), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Bad parameter.", "mediidx:N Bad parameter."));
  EXPECT_EQ(count("video"), 1);
}

TEST_F(AFolder, ThatCannotBeClearedIsAnError) {
  take_away("video_convert");
  EXPECT_EQ(TAVOMediaIndexPreReindex(shared("2010").c_str()), -1);
}

TEST_F(AFolder, IsClearedWithEveryOtherBeforeAWholeReindex) {
  add("2010");
  add_video("a.mp4");
  EXPECT_EQ(TAVOMediaIndexPreReindexAll(), 0);
  EXPECT_EQ(count("video"), 0);
  EXPECT_EQ(count("directory"), 0);
}

TEST_F(AFolder, WhenNothingCanBeClearedIsAnError) {
  take_away("photo");
  EXPECT_EQ(TAVOMediaIndexPreReindexAll(), -1);
}

class TheDatabase : public RequestTest {};

TEST_F(TheDatabase, ClosesWhetherItIsOpenOrNot) {
  EXPECT_EQ(gpDBConnect, nullptr);
  EXPECT_EQ(TAVOMediaIndexDBClose(), 0);
  ASSERT_NE(MediaDBConnGet(), nullptr);
  EXPECT_EQ(TAVOMediaIndexDBClose(), 0);
  EXPECT_EQ(gpDBConnect, nullptr);
  EXPECT_EQ(TAVOMediaIndexDBClose(), 0);
}

TEST_F(TheDatabase, AnswersUnderItsSecondNames) {
  auto saved = record(shared("a.mp4"));
  EXPECT_EQ(TAVOMediaIndexAdd(&saved, MEDIA_TABLE_VIDEO), 0);
  Info found{};
  EXPECT_EQ(TAVOMediaIndexDBGetOne(MEDIA_TABLE_VIDEO, shared("a.mp4").c_str(), &found, 0), 0);
  EXPECT_EQ(found.path, shared("a.mp4"));
  EXPECT_EQ(TAVOMediaIndexDBVacuum(), 0);
}

}  // namespace
}  // namespace mediidx::test
