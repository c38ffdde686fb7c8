// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <string>

#include "request_test.h"

namespace mediidx::test {
namespace {

class DeletingAFile : public RequestTest {
 protected:
  void add(const std::string& name, MEDIA_TABLE_TYPE type) {
    auto info = record(shared(name));
    ASSERT_EQ(TAVOMediaIndexAdd(&info, type), 0);
    clear_sent_statements();
  }
};

TEST_F(DeletingAFile, RemovesARowOfEveryKind) {
  add("a.mp3", MEDIA_TABLE_MUSIC);
  add("a.MP4", MEDIA_TABLE_VIDEO);
  add("a.jpg", MEDIA_TABLE_PHOTO);
  add("a.m3u", MEDIA_TABLE_PLAYLIST);
  for (const char* name : {"a.mp3", "a.MP4", "a.jpg", "a.m3u"}) {
    EXPECT_EQ(TAVOMediaIndexDelete(shared(name).c_str()), 0) << name;
  }
  for (const char* table : {"track", "video", "photo", "playlist"}) EXPECT_EQ(count(table), 0);
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(DeletingAFile, LeavesOtherRows) {
  add("a.mp4", MEDIA_TABLE_VIDEO);
  add("b.mp4", MEDIA_TABLE_VIDEO);
  EXPECT_EQ(TAVOMediaIndexDelete(shared("_.mp4").c_str()), 0);
  EXPECT_EQ(TAVOMediaIndexDelete(shared("a.mp4").c_str()), 0);
  EXPECT_THAT(paths("video"), ElementsAre(shared("b.mp4")));
}

TEST_F(DeletingAFile, IsRefusedWhileItExists) {
  add("a.mp4", MEDIA_TABLE_VIDEO);
  root.write("volume1/media/a.mp4", "a film");
  EXPECT_EQ(TAVOMediaIndexDelete(shared("a.mp4").c_str()), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N File exists. Skip remove it from database."));
  EXPECT_EQ(logged()[0].priority, 6);
  EXPECT_EQ(count("video"), 1);
}

TEST_F(DeletingAFile, DoesNothingForAnotherExtension) {
  for (const char* name : {"a.txt", "a", ".mp4", "a.", "a.mp4/b"}) {
    EXPECT_EQ(TAVOMediaIndexDelete(shared(name).c_str()), 0) << name;
  }
  EXPECT_EQ(TAVOMediaIndexDelete(""), 0);
  EXPECT_EQ(TAVOMediaIndexDelete(nullptr), 0);
  EXPECT_THAT(sent_statements(), IsEmpty());
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(DeletingAFile, FailsWhenTheRowCannotBeRemoved) {
  take_away("video");
  const auto path = shared("100%s.mp4");
  EXPECT_EQ(TAVOMediaIndexDelete(path.c_str()), -1);
  EXPECT_EQ(log_lines().back(), "mediidx:N Failed to remove [" + path + "] from database");
  EXPECT_EQ(logged().back().priority, 3);
}

class RenamingAFile : public DeletingAFile {};

TEST_F(RenamingAFile, MovesTheRowAndGivesMinusOne) {
  add("old.mp4", MEDIA_TABLE_VIDEO);
  auto info = record(shared("new.mp4"));
  EXPECT_EQ(TAVOMediaIndexRename(&info, MEDIA_TABLE_VIDEO, shared("old.mp4").c_str()), -1);
  EXPECT_THAT(paths("video"), ElementsAre(shared("new.mp4")));
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(RenamingAFile, OutOfTheIndexRemovesTheRow) {
  add("old.mp4", MEDIA_TABLE_VIDEO);
  auto info = record(outside("new.mp4"));
  EXPECT_EQ(TAVOMediaIndexRename(&info, MEDIA_TABLE_VIDEO, shared("old.mp4").c_str()), 0);
  EXPECT_EQ(count("video"), 0);
}

TEST_F(RenamingAFile, KeepsTheOldRowWhileAFileIsThere) {
  add("old.mp4", MEDIA_TABLE_VIDEO);
  root.write("volume1/media/old.mp4", "a film");
  auto info = record(shared("new.mp4"));
  EXPECT_EQ(TAVOMediaIndexRename(&info, MEDIA_TABLE_VIDEO, shared("old.mp4").c_str()), -1);
  EXPECT_THAT(paths("video"), ElementsAre(shared("new.mp4"), shared("old.mp4")));
  EXPECT_TRUE(was_logged("File exists. Skip remove it from database."));
}

TEST_F(RenamingAFile, GivesMinusOneWhenTheAddFails) {
  take_away("video");
  auto info = record(shared("new.mp4"));
  EXPECT_EQ(TAVOMediaIndexRename(&info, MEDIA_TABLE_VIDEO, shared("old.txt").c_str()), -1);
  EXPECT_EQ(log_lines().back(), "mediidx:N Failed to save media info.");
}

TEST_F(RenamingAFile, NeedsARecordAndAnOldPath) {
  auto info = record(shared("new.mp4"));
  EXPECT_EQ(TAVOMediaIndexRename(nullptr, MEDIA_TABLE_VIDEO, "/old.mp4"), -1);
  EXPECT_EQ(TAVOMediaIndexRename(&info, MEDIA_TABLE_VIDEO, nullptr), -1);
  EXPECT_EQ(TAVOMediaIndexRename(&info, MEDIA_TABLE_VIDEO, ""), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx:N Bad parameter.", "mediidx:N Bad parameter.",
                                       "mediidx:N Bad parameter."));
  EXPECT_THAT(sent_statements(), IsEmpty());
}

TEST_F(RenamingAFile, RefusesAFolderBeforeItDeletes) {
  add("old.mp4", MEDIA_TABLE_VIDEO);
  const auto folder = root.make_folder("volume1/media/sub");
  auto info = record(folder);
  EXPECT_EQ(TAVOMediaIndexRename(&info, MEDIA_TABLE_VIDEO, shared("old.mp4").c_str()), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre("mediidx:N Path should be a file, not a directory: " + folder));
  EXPECT_EQ(count("video"), 1);
}

class RenamingJson : public DeletingAFile {};

TEST_F(RenamingJson, MovesTheRowAndGivesMinusOne) {
  add("old.mp4", MEDIA_TABLE_VIDEO);
  const auto json = json_record(shared("new.mp4"));
  EXPECT_EQ(TAVOMediaIndexRename_Json(json, MEDIA_TABLE_VIDEO, shared("old.mp4").c_str()), -1);
  EXPECT_THAT(paths("video"), ElementsAre(shared("new.mp4")));
}

TEST_F(RenamingJson, OutOfTheIndexRemovesTheRow) {
  add("old.mp4", MEDIA_TABLE_VIDEO);
  const auto json = json_record(outside("new.mp4"));
  EXPECT_EQ(TAVOMediaIndexRename_Json(json, MEDIA_TABLE_VIDEO, shared("old.mp4").c_str()), 0);
  EXPECT_EQ(count("video"), 0);
}

TEST_F(RenamingJson, NeedsAPathAndAnOldPath) {
  const auto json = json_record(shared("new.mp4"));
  EXPECT_EQ(TAVOMediaIndexRename_Json(Json::Value(), MEDIA_TABLE_VIDEO, "/old.mp4"), -1);
  EXPECT_EQ(TAVOMediaIndexRename_Json(Json::Value(7), MEDIA_TABLE_VIDEO, "/old.mp4"), -1);
  EXPECT_EQ(TAVOMediaIndexRename_Json(json, MEDIA_TABLE_VIDEO, nullptr), -1);
  EXPECT_EQ(TAVOMediaIndexRename_Json(json, MEDIA_TABLE_VIDEO, ""), -1);
  EXPECT_EQ(log_lines(), std::vector<std::string>(4, "mediidx:N Bad parameter."));
}

TEST_F(RenamingJson, RefusesAFolder) {
  const auto folder = root.make_folder("volume1/media/sub");
  EXPECT_EQ(TAVOMediaIndexRename_Json(json_record(folder), MEDIA_TABLE_VIDEO, "/old.mp4"), -1);
  EXPECT_THAT(log_lines(),
              ElementsAre("mediidx:N Path should be a file, not a directory: " + folder));
}

}  // namespace
}  // namespace mediidx::test
