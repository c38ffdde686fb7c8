// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Disks that are away, folders that cannot be read, and removals that look like a mistake.
#include <sys/mount.h>
#include <sys/stat.h>
#include <unistd.h>

#include <fstream>

#include "scan_fixture.h"

namespace mediidx::test {
namespace {

class AVolume : public ScanTest {
 protected:
  std::vector<std::string> offline() {
    std::vector<std::string> out;
    for (const char* table : {"music", "photo", "directory"}) {
      for (const auto& row : rows("SELECT path FROM " + std::string(table) +
                                  " WHERE fs_online = false ORDER BY path")) {
        out.push_back(row[0]);
      }
    }
    return out;
  }
  void fill() {
    song("a.mp3");
    media.take_sample(kPhoto, "m/b.jpg");
    fs::create_directory(media.at("m2"));
    media.take_sample(kSong, "m2/c.mp3");
    ASSERT_EQ(run({"index", media.at("m"), media.at("m2")}).status, 0);
  }
};

TEST_F(AVolume, ThatIsMissingGoesOfflineAndComesBackUnread) {
  fill();
  const auto ids = rows("SELECT id, path FROM track ORDER BY id");
  fs::rename(media.at("m"), media.at("away"));
  const auto done = scan();
  EXPECT_EQ(done.status, 4);
  EXPECT_EQ(done.counts, Counts{.offline = 2});
  EXPECT_THAT(done.err, HasSubstr(media.at("m") + " is not there: nothing of it is changed"));
  EXPECT_THAT(offline(), ElementsAre(at("a.mp3"), at("b.jpg"), media.at("m")));
  fs::rename(media.at("away"), media.at("m"));
  expect_scan(0, {});
  EXPECT_THAT(offline(), IsEmpty());
  EXPECT_EQ(rows("SELECT id, path FROM track ORDER BY id"), ids);
}

TEST_F(AVolume, ThatIsAnEmptyMountPointIsAway) {
  fill();
  fs::rename(media.at("m"), media.at("away"));
  fs::create_directories(at("lost+found"));
  const auto done = scan();
  EXPECT_EQ(done.status, 4);
  EXPECT_EQ(done.counts, Counts{.offline = 2});
  EXPECT_EQ(count("music", "fs_online = false"), 1);
}

TEST_F(AVolume, ThatNeverHeldAnythingMayBeEmpty) {
  index();
  expect_scan(0, {});
}

TEST_F(AVolume, OnAnotherFileSystemThanLastTimeIsAway) {
  fill();
  rows("UPDATE scan.root SET volume = 'another' WHERE path = " + quoted(media.at("m")));
  remove("a.mp3");
  auto done = scan();
  EXPECT_EQ(done.status, 4);
  EXPECT_THAT(done.err, HasSubstr("is on another file system than last time"));
  EXPECT_EQ(count("music", "path = " + quoted(at("a.mp3"))), 1);
  done = scan({"--accept-volumes"});
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_EQ(done.counts, Counts{.removed = 1});
  EXPECT_THAT(offline(), IsEmpty());
}

TEST_F(AVolume, MountedBelowARootIsMissedThere) {
  if (geteuid() != 0) {
    // Only root may mount: others see the same by what is known of the folder.
    song("disk/a.mp3");
    index();
    rows("UPDATE scan.folder SET mounted = true WHERE path LIKE '%/disk'");
  } else {
    song("disk/hidden.mp3");
    fs::create_directory(media.at("volume"));
    media.take_sample(kSong, "volume/a.mp3");
    ASSERT_EQ(mount(media.at("volume").c_str(), at("disk").c_str(), nullptr, MS_BIND, nullptr), 0);
    index();
    EXPECT_THAT(stored("music"), ElementsAre("disk/a.mp3"));
    ASSERT_EQ(umount(at("disk").c_str()), 0);
  }
  const auto done = scan();
  EXPECT_EQ(done.status, 4);
  EXPECT_EQ(done.counts, Counts{.offline = 1});
  EXPECT_THAT(done.err, HasSubstr(at("disk") + " has no file system mounted, but had"));
  EXPECT_THAT(stored("music"), ElementsAre("disk/a.mp3"));
  EXPECT_EQ(count("music", "fs_online = false"), 1);
  EXPECT_EQ(scan().status, 4);
  EXPECT_EQ(scan({"--accept-volumes"}).status, 0);
  EXPECT_EQ(count("music", "fs_online = false"), 0);
}

TEST_F(AVolume, MountedAgainBelowARootComesBack) {
  if (geteuid() != 0) return index();  // nothing to be mounted by others
  fs::create_directories(at("disk"));
  fs::create_directory(media.at("volume"));
  media.take_sample(kSong, "volume/a.mp3");
  const auto mount_it = [this] {
    return mount(media.at("volume").c_str(), at("disk").c_str(), nullptr, MS_BIND, nullptr);
  };
  ASSERT_EQ(mount_it(), 0);
  index();
  ASSERT_EQ(umount(at("disk").c_str()), 0);
  EXPECT_EQ(scan().status, 4);
  ASSERT_EQ(mount_it(), 0);
  expect_scan(0, {});
  EXPECT_EQ(count("music", "fs_online = false"), 0);
  EXPECT_EQ(umount(at("disk").c_str()), 0);
}

TEST_F(AVolume, KeepsItsRowsWhileItIsAwayHoweverOftenItIsScanned) {
  fill();
  fs::rename(media.at("m"), media.at("away"));
  for (int i = 0; i < 3; ++i) EXPECT_EQ(scan().status, 4);
  EXPECT_EQ(count("track"), 2);
  EXPECT_EQ(scan({"--allow-mass-delete"}).status, 4);
  EXPECT_EQ(count("track"), 2);
}

TEST_F(AVolume, MarkedAsAwayByHandComesBackWithAScan) {
  fill();
  ASSERT_EQ(run({"volume", "offline", media.at("m")}).status, 0);
  expect_scan(0, {});
  EXPECT_THAT(offline(), IsEmpty());
}

class ManyRemovals : public ScanTest {
 protected:
  void fill(int songs) {
    fs::create_directories(at("sub"));
    for (int i = 0; i < songs; ++i) {
      fs::copy_file(fs::path(MEDIIDX_SAMPLE_LIBRARY) / kSong,
                    at("sub/" + std::to_string(i) + ".mp3"));
    }
    song("a.mp3");
    index();
  }
};

TEST_F(ManyRemovals, NeedToBeAllowed) {
  fill(101);
  remove("sub");
  song("new.mp3");
  auto done = scan();
  EXPECT_EQ(done.status, 1);
  EXPECT_EQ(done.counts, Counts{.added = 1});
  EXPECT_THAT(done.err, HasSubstr("not removed: 101 of 102 files of " + media.at("m") +
                                  ". If they are really gone: --allow-mass-delete"));
  EXPECT_EQ(count("track"), 103);
  done = scan({"--allow-mass-delete"});
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_EQ(done.counts, Counts{.removed = 101});
  EXPECT_EQ(count("track"), 2);
}

TEST_F(ManyRemovals, OfAHundredAreNotMany) {
  fill(100);
  remove("sub");
  expect_scan(0, {.removed = 100});
}

TEST_F(ManyRemovals, AreNoMovesOfAsMany) {
  fill(101);
  move("sub", "other");
  expect_scan(0, {.moved = 101});
}

/// Permissions bind others than root: as root the tests run a copy of the command as nobody.
class UnreadableThings : public ScanTest {
 protected:
  UnreadableThings() {
    command.give(data.path());
    setting.environment["HOME"] = data.path();
    setting.without_server = true;
  }
  /// The titles that "list music" shows.
  std::string listed() { return run({"list", "music"}, setting).out; }
  void start() {
    const auto done = run({"index", "--full-speed", media.at("m")}, setting);
    ASSERT_EQ(done.status, 0) << done.err;
  }

  OpenCommand command{"nobody"};
  Setting setting = command.setting();
};

TEST_F(UnreadableThings, FolderFreezesWhatIsBelowIt) {
  song("closed/deep/a.mp3", {.title = "Frozen"});
  song("b.mp3", {.title = "Open"});
  start();
  ASSERT_EQ(chmod(at("closed").c_str(), 0), 0);
  const auto done = scan({}, setting);
  EXPECT_EQ(done.status, 3);
  EXPECT_EQ(done.counts, Counts{.failed = 1});
  EXPECT_THAT(done.err, HasSubstr("not indexed: " + at("closed") + ": Permission denied"));
  EXPECT_THAT(listed(), AllOf(HasSubstr("Frozen"), HasSubstr("Open")));
  ASSERT_EQ(chmod(at("closed").c_str(), 0755), 0);
  const auto open = scan({}, setting);
  EXPECT_EQ(open.status, 0) << open.err;
  EXPECT_EQ(open.counts, Counts{});
}

TEST_F(UnreadableThings, FolderThatMayOnlyBeListedFreezesWhatIsInIt) {
  song("closed/a.mp3", {.title = "Frozen"});
  start();
  ASSERT_EQ(chmod(at("closed").c_str(), 0444), 0);
  const auto done = scan({}, setting);
  EXPECT_EQ(done.status, 3);
  EXPECT_THAT(done.err, HasSubstr("not indexed: " + at("closed/a.mp3") + ": Permission denied"));
  EXPECT_THAT(listed(), HasSubstr("Frozen"));
  chmod(at("closed").c_str(), 0755);
}

TEST_F(UnreadableThings, FileKeepsItsRows) {
  song("a.mp3", {.title = "Before"});
  start();
  remove("a.mp3");
  song("a.mp3", {.title = "Afterwards"});
  ASSERT_EQ(chmod(at("a.mp3").c_str(), 0), 0);
  const auto done = scan({}, setting);
  EXPECT_EQ(done.status, 3);
  EXPECT_EQ(done.counts, Counts{.failed = 1});
  EXPECT_THAT(listed(), HasSubstr("Before"));
  ASSERT_EQ(chmod(at("a.mp3").c_str(), 0644), 0);
  EXPECT_EQ(scan({}, setting).counts, Counts{.changed = 1});
  EXPECT_THAT(listed(), HasSubstr("Afterwards"));
}

}  // namespace
}  // namespace mediidx::test
