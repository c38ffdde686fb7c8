// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <json/writer.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <fstream>
#include <thread>

#include "folder_test.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

Words words_for(const std::string& what, const std::string& folder) {
  return {what, folder, "-P", "MediaIndex"};
}

class IndexPrograms : public FolderTest {};

TEST_F(IndexPrograms, AreTheCommandBelowTheRoot) {
  output({"folder", "list"});
  for (const char* name : {"tavoindex", "tavoindex_mgr"}) {
    EXPECT_TRUE(fs::is_symlink(data.at("d/root/usr/tavo/bin/") + name)) << name;
    EXPECT_TRUE(fs::equivalent(data.at("d/root/usr/tavo/bin/") + name, MEDIIDX_COMMAND)) << name;
  }
}

TEST_F(IndexPrograms, IndexerDropsAndAddsAFolderWithoutTouchingTheConfiguration) {
  fill("m");
  output({"folder", "add", media.at("m")});
  const auto before = read_json(settings("index_folder.conf"));
  EXPECT_EQ(run_program("tavoindex", words_for("-D", media.at("m"))).status, 0);
  EXPECT_THAT(stored("music"), IsEmpty());
  const auto added = run_program("tavoindex", words_for("-A", media.at("m")));
  EXPECT_EQ(added.status, 0) << added.err;
  EXPECT_EQ(added.out, "");
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
  EXPECT_EQ(read_json(settings("index_folder.conf")), before);
}

TEST_F(IndexPrograms, IndexerDropsNothingOfAConfiguredFolderThatIsAway) {
  fill("m/sub");
  output({"folder", "add", media.at("m")});
  fs::rename(media.at("m"), media.at("moved"));
  for (const char* folder : {"m", "m/sub"}) {
    EXPECT_EQ(run_program("tavoindex", words_for("-D", media.at(folder))).status, 0);
    EXPECT_THAT(stored("music"), ElementsAre("m/sub/a.mp3")) << folder;
  }
}

TEST_F(IndexPrograms, IndexerDropsNothingAboveAConfiguredFolderThatIsAway) {
  fill("m/sub");
  output({"folder", "add", media.at("m/sub")});
  fs::rename(media.at("m"), media.at("moved"));
  EXPECT_EQ(run_program("tavoindex", words_for("-D", media.at("m"))).status, 0);
  EXPECT_THAT(stored("music"), ElementsAre("m/sub/a.mp3"));
}

TEST_F(IndexPrograms, IndexerDropsAFolderThatIsAwayAndNoLongerConfigured) {
  fill("m");
  output({"folder", "add", media.at("m")});
  fs::rename(media.at("m"), media.at("moved"));
  fs::remove(settings("index_folder.conf"));
  EXPECT_EQ(run_program("tavoindex", words_for("-D", media.at("m"))).status, 0);
  EXPECT_THAT(stored("music"), IsEmpty());
}

TEST_F(IndexPrograms, IndexerAddsNothingThatIsNotConfigured) {
  fill("m");
  fill("n");
  output({"folder", "add", media.at("m")});
  for (const char* folder : {"n", "gone"}) {
    const auto done = run_program("tavoindex", words_for("-A", media.at(folder)));
    EXPECT_EQ(done.status, 0) << done.err;
  }
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
}

TEST_F(IndexPrograms, IndexerAddsNothingOfAConfiguredFolderThatIsAway) {
  fill("m");
  output({"folder", "add", media.at("m")});
  fs::rename(media.at("m"), media.at("moved"));
  const auto done = run_program("tavoindex", words_for("-A", media.at("m")));
  EXPECT_EQ(done.status, 0);
  EXPECT_EQ(done.err, "");
}

TEST_F(IndexPrograms, IndexerTellsWhatItCouldNotIndex) {
  fs::create_directory(media.at("m"));
  output({"folder", "add", media.at("m")});
  media.write("m/broken.jpg", "no photo");
  const auto done = run_program("tavoindex", words_for("-A", media.at("m")));
  EXPECT_EQ(done.status, 3);
  EXPECT_THAT(done.err, HasSubstr("not indexed: " + media.at("m/broken.jpg")));
}

TEST_F(IndexPrograms, RefuseOtherWords) {
  output({"folder", "list"});
  const auto folder = media.path().string();
  for (const Words& words :
       {Words{}, Words{"-A", folder}, Words{"-X", folder, "-P", "MediaIndex"},
        Words{"-A", folder, "-P", "Other"}, words_for("-D", ""), words_for("-D", "/")}) {
    EXPECT_NE(run_program("tavoindex", words).status, 0);
  }
  EXPECT_EQ(run_program("tavoindex_mgr", {}).status, 2);
  EXPECT_EQ(run_program("tavoindex_mgr", {"--other"}).status, 2);
}

TEST_F(IndexPrograms, WorkOnlyBelowTheRootOfADataFolder) {
  fs::create_directories(media.at("x/root/usr/tavo/bin"));
  fs::create_symlink(MEDIIDX_COMMAND, media.at("x/root/usr/tavo/bin/tavoindex"));
  Setting setting;
  setting.program = media.at("x/root/usr/tavo/bin/tavoindex");
  const auto refused = run_mediidx(words_for("-A", media.path()), setting);
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.err, HasSubstr("is not below the root of a data folder"));
  EXPECT_FALSE(fs::exists(media.at("x/.mediidx")));
}

TEST_F(IndexPrograms, ManagerMarksTheSharesThatHoldAnIndexFolder) {
  fill("m/sub");
  fs::create_directory(media.at("n"));
  output({"share", "add", "m", media.at("m")});
  output({"share", "add", "n", media.at("n")});
  output({"folder", "add", media.at("m/sub")});
  auto shares = read_json(settings("share.conf"));
  EXPECT_EQ(shares["m"]["status"], 0x20);
  EXPECT_EQ(shares["n"]["status"], 0);
  shares["m"]["status"] = 0x01;
  shares["n"]["status"] = 0x23;
  std::ofstream(settings("share.conf")) << shares;
  EXPECT_EQ(run_program("tavoindex_mgr", {"--check-indexbit"}).status, 0);
  shares = read_json(settings("share.conf"));
  EXPECT_EQ(shares["m"]["status"], 0x21);
  EXPECT_EQ(shares["n"]["status"], 0x03);
}

TEST_F(IndexPrograms, ReuseThePrivateServerThatRuns) {
  fill("m");
  Setting setting;
  setting.without_server = true;
  const auto done =
      run_mediidx({"--data-dir", data.at("d"), "folder", "add", media.at("m")}, setting);
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_THAT(done.out, HasSubstr("1 music, 1 photos, 1 videos"));
  setting.program = data.at("d/root/usr/tavo/bin/tavoindex");
  const auto dropped = run_mediidx(words_for("-D", media.at("m")), setting);
  EXPECT_EQ(dropped.status, 0) << dropped.err;
}

/// A run of "mediidx index" that others reach by its pid file.
class RunningIndexer : public FolderTest {
 protected:
  std::string pid_file() const { return data.at("d/root/var/run/tavoindexd.pid"); }
  bool wait_for_pid_file() const {
    for (int i = 0; i < 3000; ++i) {
      if (std::ifstream in(pid_file()); in && in.peek() != std::ifstream::traits_type::eof()) {
        return true;
      }
      std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    return false;
  }
};

TEST_F(RunningIndexer, IsNamedInThePidFileWhileItRuns) {
  fill("m");
  pid_t named = 0;
  pid_t started = 0;
  Setting setting;
  setting.meanwhile = [&](pid_t pid) {
    started = pid;
    ASSERT_TRUE(wait_for_pid_file());
    std::ifstream(pid_file()) >> named;
    kill(pid, SIGHUP);
  };
  const auto done = run_mediidx({"--data-dir", data.at("d"), "index", media.at("m")}, setting);
  EXPECT_EQ(named, started);
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
  EXPECT_FALSE(fs::exists(pid_file()));
}

TEST_F(RunningIndexer, TakesOnAChangedConfigurationBetweenTwoFiles) {
  constexpr int kSongs = 1500;
  fill("m");
  for (int i = 0; i < kSongs; ++i) {
    fs::copy_file(media.at("m/a.mp3"), media.at("m/" + std::to_string(i) + ".mp3"));
  }
  Setting setting;
  setting.meanwhile = [&](pid_t) {
    while (count("music") == 0 && wait_for_pid_file()) std::this_thread::yield();
    output({"folder", "set", media.at("m"), "--no-music"});
  };
  const auto done = run_mediidx({"--data-dir", data.at("d"), "index", media.at("m")}, setting);
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_THAT(done.out, HasSubstr("switched off"));
  EXPECT_LE(count("music"), 1);  // the one file that was under way
  EXPECT_THAT(stored("photo"), ElementsAre("m/b.jpg"));
}

TEST_F(RunningIndexer, ThatWasKilledIsNotSignalledAnyMore) {
  fs::create_directory(media.at("m"));
  output({"folder", "list"});
  // This very process: the signal would end it.
  std::ofstream(pid_file()) << getpid();
  output({"folder", "add", media.at("m")});
  EXPECT_FALSE(fs::exists(pid_file()));
}

}  // namespace
}  // namespace mediidx::test
