// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/file_walk.h"

#include <fcntl.h>
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
  /// Walks this folder; what it finds goes to the members, by paths below the scratch folder.
  void walk(const std::string& relative = "", const std::string& start = "") {
    const auto root = relative.empty() ? scratch.path().string() : scratch.at(relative);
    FileWalk walk(
        {root},
        [this](FoundFolder& folder) {
          folders.push_back(name_of(folder.path));
          for (const auto& file : folder.files) {
            files.push_back(name_of(folder.path + "/" + file.name));
            kinds.push_back(file.kind);
          }
          for (const auto& name : folder.unreadable) unreadable.push_back(name);
          found.push_back(folder);
          return --folders_until_stop > 0;
        },
        [this](const Failure& failure) { failures.push_back(failure); });
    if (!excluded.empty()) walk.exclude(excluded);
    walk.walk(root, start.empty() ? root : scratch.at(start));
  }
  std::string name_of(const std::string& path) const {
    return path.substr(std::min(scratch.path().native().size() + 1, path.size()));
  }

  test::ScratchFolder scratch;
  std::string excluded;
  int folders_until_stop = 1000;
  std::vector<std::string> folders;
  std::vector<std::string> files;
  std::vector<Kind> kinds;
  std::vector<std::string> unreadable;
  std::vector<FoundFolder> found;
  std::vector<Failure> failures;
};

TEST_F(AWalk, TakesFilesBeforeSubfoldersInTheOrderOfBytes) {
  for (const char* file : {"b.mp3", "a/z.mp3", "Z.mp3", "a/b/c.mp3", "é.mp3", "c/1.mp3"}) {
    scratch.write(file, "x");
  }
  walk();
  EXPECT_THAT(files, ElementsAre("Z.mp3", "b.mp3", "é.mp3", "a/z.mp3", "a/b/c.mp3", "c/1.mp3"));
  EXPECT_THAT(folders, ElementsAre("", "a", "a/b", "c"));
}

TEST_F(AWalk, TellsKindsByExtension) {
  for (const char* file : {"1.MP3", "2.jpg", "3.mkv", "4.m3u", "5.CUE", "6.txt", "7"}) {
    scratch.write(file, "x");
  }
  walk();
  EXPECT_THAT(kinds, ElementsAre(Kind::kMusic, Kind::kPhoto, Kind::kVideo, Kind::kPlaylist,
                                 Kind::kCueSheet));
}

TEST_F(AWalk, TellsSizeTimeAndIdentity) {
  const auto path = scratch.write("a.mp3", "12345");
  const timespec times[2] = {{7, 8}, {1'000'000'000, 123'456'789}};
  ASSERT_EQ(utimensat(AT_FDCWD, path.c_str(), times, 0), 0);
  struct stat status{};
  ASSERT_EQ(stat(path.c_str(), &status), 0);
  walk();
  const auto& file = found.at(0).files.at(0).status;
  EXPECT_EQ(file.size, 5);
  EXPECT_EQ(file.modified, 1'000'000'000'123'456'789);
  EXPECT_EQ(file.inode, static_cast<std::int64_t>(status.st_ino));
  EXPECT_EQ(file.device, static_cast<std::int64_t>(status.st_dev));
}

TEST_F(AWalk, PassesOverWhatIsNoMediaOfTheUsers) {
  for (const char* file :
       {".hidden.mp3", "._a.mp3", "@eaDir/a.mp3", "#recycle/a.mp3", "lost+found/a.mp3",
        "#snapshot/a.mp3", "$RECYCLE.BIN/a.mp3", ".thumbs/a.jpg"}) {
    scratch.write(file, "x");
  }
  scratch.write("empty.mp3", "");
  ASSERT_EQ(mkfifo(scratch.at("pipe.mp3").c_str(), 0600), 0);
  scratch.make_link("dangling.mp3", "nowhere");
  walk();
  EXPECT_THAT(files, IsEmpty());
  EXPECT_THAT(folders, ElementsAre(""));
  EXPECT_THAT(failures, IsEmpty());
}

TEST_F(AWalk, EndsInALoopOfLinks) {
  scratch.write("a/b/song.mp3", "x");
  scratch.make_link("a/b/up", scratch.at("a"));
  scratch.make_link("a/self", "self");
  walk();
  EXPECT_THAT(files, ElementsAre("a/b/song.mp3"));
  EXPECT_THAT(folders, ElementsAre("", "a", "a/b"));
}

TEST_F(AWalk, EndsInALoopOfLinksOutside) {
  test::ScratchFolder elsewhere;
  elsewhere.write("song.mp3", "x");
  elsewhere.make_link("self", elsewhere.path());
  elsewhere.make_link("back", scratch.path());
  scratch.make_link("here", elsewhere.path());
  walk();
  EXPECT_THAT(files, ElementsAre("here/song.mp3"));
}

TEST_F(AWalk, FindsARealFileOnceUnderItsOwnName) {
  scratch.write("z/song.mp3", "x");
  scratch.make_link("a.mp3", scratch.at("z/song.mp3"));
  scratch.make_link("b", scratch.at("z"));
  walk();
  EXPECT_THAT(files, ElementsAre("z/song.mp3"));
}

TEST_F(AWalk, FindsAFileWithSeveralNamesUnderTheFirst) {
  scratch.write("b.mp3", "x");
  ASSERT_EQ(link(scratch.at("b.mp3").c_str(), scratch.at("a.mp3").c_str()), 0);
  walk();
  EXPECT_THAT(files, ElementsAre("a.mp3"));
}

TEST_F(AWalk, FollowsLinksThatLeadOutButOnce) {
  test::ScratchFolder elsewhere;
  elsewhere.write("far/song.mp3", "x");
  scratch.make_link("here", elsewhere.at("far"));
  scratch.make_link("there", elsewhere.at("far"));
  scratch.make_link("too.mp3", elsewhere.at("far/song.mp3"));
  walk();
  EXPECT_THAT(files, ElementsAre("too.mp3"));
  EXPECT_THAT(folders, ElementsAre("", "here"));
}

TEST_F(AWalk, FollowsALinkToWhatIsHiddenWithinTheRoot) {
  scratch.write(".store/song.mp3", "x");
  scratch.make_link("a.mp3", ".store/song.mp3");
  walk();
  EXPECT_THAT(files, ElementsAre("a.mp3"));
}

TEST_F(AWalk, ListsNamesThatAreNotUtf8) {
  scratch.write("caf\xE9.mp3", "x");
  scratch.write("good.mp3", "x");
  walk();
  EXPECT_THAT(files, ElementsAre("good.mp3"));
  ASSERT_EQ(failures.size(), 1U);
  EXPECT_EQ(failures[0].path, scratch.at("caf\xE9.mp3"));
  EXPECT_EQ(failures[0].reason, "its name is not valid UTF-8");
  EXPECT_TRUE(failures[0].is_by_name);
}

TEST_F(AWalk, SaysWhichFolderCannotBeRead) {
  if (geteuid() == 0) {
    // Permissions do not bind root: one that is gone by then.
    walk("", "missing");
    ASSERT_EQ(failures.size(), 1U);
    EXPECT_EQ(failures[0].reason, "No such file or directory");
    return;
  }
  scratch.write("closed/a.mp3", "x");
  ASSERT_EQ(chmod(scratch.at("closed").c_str(), 0), 0);
  walk();
  ASSERT_EQ(failures.size(), 1U);
  EXPECT_EQ(failures[0].reason, "Permission denied");
  EXPECT_FALSE(found.at(1).is_readable);
  chmod(scratch.at("closed").c_str(), 0755);
}

TEST_F(AWalk, PassesOverAnExcludedFolder) {
  scratch.write("data/song.mp3", "x");
  excluded = scratch.at("data");
  walk();
  EXPECT_THAT(files, IsEmpty());
  EXPECT_THAT(folders, ElementsAre(""));
}

TEST_F(AWalk, EndsWhenItIsToldTo) {
  scratch.write("a/1.mp3", "x");
  scratch.write("b/2.mp3", "x");
  folders_until_stop = 2;
  walk();
  EXPECT_THAT(files, ElementsAre("a/1.mp3"));
}

TEST_F(AWalk, KnowsTheIgnoreFilesAboveItsStart) {
  scratch.write(".mediidxignore", "*.flac\n");
  scratch.write("sub/.mediidxignore", "!keep.flac\n");
  for (const char* file : {"sub/a.flac", "sub/keep.flac", "sub/b.mp3"}) scratch.write(file, "x");
  walk("", "sub");
  EXPECT_THAT(files, ElementsAre("sub/b.mp3", "sub/keep.flac"));
}

TEST_F(AWalk, DoesNotStartInWhatIsLeftOut) {
  scratch.write(".mediidxignore", "drafts/\n");
  scratch.write("drafts/deep/a.mp3", "x");
  scratch.write(".hidden/a.mp3", "x");
  walk("", "drafts/deep");
  walk("", ".hidden");
  EXPECT_THAT(folders, IsEmpty());
}

TEST_F(AWalk, DoesNotReadAnIgnoreFileThroughAPipe) {
  ASSERT_EQ(mkfifo(scratch.at(".mediidxignore").c_str(), 0600), 0);
  scratch.write("a.mp3", "x");
  walk();
  EXPECT_THAT(files, ElementsAre("a.mp3"));
}

TEST(AnEmptyFolder, HoldsNothingButNamesThatArePassedOver) {
  test::ScratchFolder scratch;
  EXPECT_TRUE(is_empty_folder(scratch.path()));
  scratch.make_folder("lost+found");
  scratch.write(".hidden", "x");
  EXPECT_TRUE(is_empty_folder(scratch.path()));
  scratch.write("notes.txt", "");
  EXPECT_FALSE(is_empty_folder(scratch.path()));
  EXPECT_FALSE(is_empty_folder(scratch.at("missing")));
}

}  // namespace
}  // namespace mediidx::tool
