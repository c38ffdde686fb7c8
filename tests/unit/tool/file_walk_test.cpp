// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/file_walk.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include "scratch.h"

namespace mediidx::tool {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class AWalk : public testing::Test {
 protected:
  /// What a walk of this folder finds.
  Found walk(const std::string& relative = "") {
    FileWalk files([this] { return folders_until_stop_-- <= 0; });
    files.add(relative.empty() ? scratch.path().string() : scratch.at(relative));
    return files.finish();
  }
  /// Paths below the scratch folder.
  std::vector<std::string> names(const std::vector<std::string>& paths) const {
    std::vector<std::string> out;
    const auto length = scratch.path().native().size();
    for (const auto& path : paths) out.push_back(path.substr(std::min(length + 1, path.size())));
    return out;
  }
  std::vector<std::string> file_names(const Found& found) const {
    std::vector<std::string> paths;
    for (const auto& file : found.files) paths.push_back(file.path);
    return names(paths);
  }

  test::ScratchFolder scratch;
  int folders_until_stop_ = 1000;
};

TEST_F(AWalk, TakesFilesBeforeSubfoldersInTheOrderOfBytes) {
  for (const char* file : {"b.mp3", "a/z.mp3", "Z.mp3", "a/b/c.mp3", "é.mp3", "c/1.mp3"}) {
    scratch.write(file, "x");
  }
  const auto found = walk();
  EXPECT_THAT(file_names(found),
              ElementsAre("Z.mp3", "b.mp3", "é.mp3", "a/z.mp3", "a/b/c.mp3", "c/1.mp3"));
  EXPECT_THAT(names(found.folders), ElementsAre("", "a", "a/b", "c"));
}

TEST_F(AWalk, TellsKindsByExtension) {
  for (const char* file : {"1.MP3", "2.jpg", "3.mkv", "4.m3u", "5.CUE", "6.txt", "7"}) {
    scratch.write(file, "x");
  }
  std::vector<Kind> kinds;
  for (const auto& file : walk().files) kinds.push_back(file.kind);
  EXPECT_THAT(kinds, ElementsAre(Kind::kMusic, Kind::kPhoto, Kind::kVideo, Kind::kPlaylist,
                                 Kind::kCueSheet));
}

TEST_F(AWalk, PassesOverWhatIsNoMediaOfTheUsers) {
  for (const char* file :
       {".hidden.mp3", "._a.mp3", "@eaDir/a.mp3", "#recycle/a.mp3", "lost+found/a.mp3",
        "$RECYCLE.BIN/a.mp3", ".Trash-1000/a.mp3", "#Recycle/a.mp3"}) {
    scratch.write(file, "x");
  }
  scratch.write("empty.mp3", "");
  mkfifo(scratch.at("pipe.mp3").c_str(), 0600);
  const auto found = walk();
  EXPECT_THAT(file_names(found), IsEmpty());
  EXPECT_THAT(names(found.folders), ElementsAre(""));
  EXPECT_THAT(found.failures, IsEmpty());
}

TEST_F(AWalk, EndsInALoopOfLinks) {
  scratch.write("a/b/song.mp3", "x");
  scratch.make_link("a/b/up", scratch.at("a"));
  scratch.make_link("a/self", "self");
  const auto found = walk();
  EXPECT_THAT(file_names(found), ElementsAre("a/b/song.mp3"));
  EXPECT_THAT(names(found.folders), ElementsAre("", "a", "a/b"));
}

TEST_F(AWalk, FindsARealFileOnceUnderItsOwnName) {
  scratch.write("z/song.mp3", "x");
  scratch.make_link("a.mp3", scratch.at("z/song.mp3"));
  scratch.make_link("b", scratch.at("z"));
  EXPECT_THAT(file_names(walk()), ElementsAre("z/song.mp3"));
}

TEST_F(AWalk, FollowsLinksThatLeadOut) {
  test::ScratchFolder elsewhere;
  elsewhere.write("far/song.mp3", "x");
  scratch.make_link("here", elsewhere.at("far"));
  const auto found = walk();
  EXPECT_THAT(file_names(found), ElementsAre("here/song.mp3"));
  EXPECT_THAT(names(found.folders), ElementsAre("", "here"));
}

TEST_F(AWalk, ListsNamesThatAreNotUtf8) {
  scratch.write("caf\xE9.mp3", "x");
  scratch.write("good.mp3", "x");
  const auto found = walk();
  EXPECT_THAT(file_names(found), ElementsAre("good.mp3"));
  ASSERT_EQ(found.failures.size(), 1U);
  EXPECT_EQ(found.failures[0].path, scratch.at("caf\xE9.mp3"));
  EXPECT_EQ(found.failures[0].reason, "its name is not valid UTF-8");
}

TEST_F(AWalk, ListsAFolderThatIsGone) {
  const auto found = walk("missing");
  ASSERT_EQ(found.failures.size(), 1U);
  EXPECT_EQ(found.failures[0].reason, "No such file or directory");
}

TEST_F(AWalk, PassesOverAnExcludedFolder) {
  scratch.write("data/song.mp3", "x");
  FileWalk files([] { return false; });
  files.exclude(scratch.at("data"));
  files.add(scratch.path());
  EXPECT_THAT(file_names(files.finish()), IsEmpty());
}

TEST_F(AWalk, EndsWhenItIsToldTo) {
  scratch.write("a/1.mp3", "x");
  scratch.write("b/2.mp3", "x");
  folders_until_stop_ = 2;
  EXPECT_THAT(file_names(walk()), ElementsAre("a/1.mp3"));
}

}  // namespace
}  // namespace mediidx::tool
