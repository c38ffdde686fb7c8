// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <json/writer.h>
#include <signal.h>
#include <sys/file.h>
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

TEST_F(IndexPrograms, IndexerDropsNothingThatIsAwayWhileTheConfigurationDoesNotTell) {
  fill("m");
  output({"folder", "add", media.at("m")});
  fs::rename(media.at("m"), media.at("moved"));
  const std::string unusable = R"({"path": "/m", "music": "yes"})";
  for (const auto& text : {std::string(), std::string("["), std::string("{}"), "[" + unusable + "]",
                           std::string(R"([{"path": "/unknown"}])"), std::string(100'000, '[')}) {
    std::ofstream(settings("index_folder.conf")) << text;
    const auto done = run_program("tavoindex", words_for("-D", media.at("m")));
    EXPECT_EQ(done.status, 1);
    EXPECT_THAT(done.err, HasSubstr("its index is kept"));
    EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3")) << text.substr(0, 80);
  }
  std::ofstream(settings("index_folder.conf")) << "[]";
  EXPECT_EQ(run_program("tavoindex", words_for("-D", media.at("m"))).status, 0);
  EXPECT_THAT(stored("music"), IsEmpty());
}

TEST_F(IndexPrograms, IndexerDropsNothingThatIsAwayWhenTheSharesAreLost) {
  fill("m");
  output({"folder", "add", media.at("m")});
  fs::rename(media.at("m"), media.at("moved"));
  fs::remove(settings("share.conf"));
  EXPECT_EQ(run_program("tavoindex", words_for("-D", media.at("m"))).status, 1);
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
}

TEST_F(IndexPrograms, TakeNothingButTheServerFromTheEnvironment) {
  fill("m");
  output({"folder", "add", media.at("m")});
  rows("DELETE FROM music");
  const auto elsewhere = media.at("elsewhere");
  Setting setting;
  setting.program = data.at("d/root/usr/tavo/bin/tavoindex");
  for (const char* name : {"HOME", "XDG_DATA_HOME", "XDG_CONFIG_HOME", "XDG_RUNTIME_DIR", "TMPDIR",
                           "PATH", "MEDIIDX_DATA_DIR", "MEDIIDX_ROOT"}) {
    setting.environment[name] = elsewhere;
  }
  const auto done = run_mediidx(words_for("-A", media.at("m")), setting);
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
  setting.program = data.at("d/root/usr/tavo/bin/tavoindex_mgr");
  EXPECT_EQ(run_mediidx({"--check-indexbit"}, setting).status, 0);
  EXPECT_FALSE(fs::exists(elsewhere));
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

/// The data folder's lock in the hands of this very process.
class HeldLock {
 public:
  explicit HeldLock(const std::string& file) : descriptor_(open(file.c_str(), O_RDWR | O_CLOEXEC)) {
    EXPECT_EQ(flock(descriptor_, LOCK_EX), 0);
  }
  ~HeldLock() { close(descriptor_); }
  HeldLock(const HeldLock&) = delete;
  HeldLock& operator=(const HeldLock&) = delete;
  void release() const { flock(descriptor_, LOCK_UN); }

 private:
  int descriptor_;
};

/// False when the process does not open the file within half a minute.
bool wait_until_open(pid_t pid, const std::string& file) {
  for (int i = 0; i < 3000; ++i) {
    std::error_code error;
    for (const auto& entry :
         fs::directory_iterator("/proc/" + std::to_string(pid) + "/fd", error)) {
      if (fs::read_symlink(entry, error) == file) return true;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
  return false;
}

TEST_F(IndexPrograms, ManagerWaitsForWhoeverChangesTheSettings) {
  fs::create_directory(media.at("m"));
  output({"folder", "add", media.at("m")});
  const HeldLock lock(data.at("d/lock"));
  Setting setting;
  setting.program = data.at("d/root/usr/tavo/bin/tavoindex_mgr");
  setting.meanwhile = [&](pid_t pid) {
    EXPECT_TRUE(wait_until_open(pid, data.at("d/lock")));
    auto shares = read_json(settings("share.conf"));
    shares["late"] = shares["m"];
    shares["late"]["status"] = 0x01;
    std::ofstream(settings("share.conf")) << shares;
    lock.release();
  };
  EXPECT_EQ(run_mediidx({"--check-indexbit"}, setting).status, 0);
  EXPECT_EQ(read_json(settings("share.conf"))["late"]["status"], 0x21);
}

TEST_F(IndexPrograms, ManagerWorksUnderTheLockOfWhoeverRunsIt) {
  fs::create_directory(media.at("m"));
  output({"folder", "add", media.at("m")});
  auto shares = read_json(settings("share.conf"));
  shares["m"]["status"] = 0;
  std::ofstream(settings("share.conf")) << shares;
  const HeldLock lock(data.at("d/lock"));
  std::ofstream(data.at("d/lock")) << getpid();
  EXPECT_EQ(run_program("tavoindex_mgr", {"--check-indexbit"}).status, 0);
  EXPECT_EQ(read_json(settings("share.conf"))["m"]["status"], 0x20);
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

TEST_F(RunningIndexer, ThatWasKilledLeavesItsFileToTheNext) {
  constexpr int kSongs = 300;
  fill("m");
  for (int i = 0; i < kSongs; ++i) {
    fs::copy_file(media.at("m/a.mp3"), media.at("m/" + std::to_string(i) + ".mp3"));
  }
  const Words words{"--data-dir", data.at("d"), "index", media.at("m")};
  const auto run_and_signal = [&](int signal) {
    Setting setting;
    setting.meanwhile = [&](pid_t pid) {
      EXPECT_TRUE(wait_for_pid_file());
      kill(pid, signal);
    };
    return run_mediidx(words, setting).status;
  };
  EXPECT_EQ(run_and_signal(SIGKILL), 128 + SIGKILL);
  EXPECT_TRUE(fs::exists(pid_file()));
  output({"folder", "list"});
  EXPECT_TRUE(fs::exists(pid_file()));

  pid_t named = 0;
  pid_t started = 0;
  Setting setting;
  setting.meanwhile = [&](pid_t pid) {
    started = pid;
    for (int i = 0; i < 3000 && named != pid; ++i) {
      std::ifstream(pid_file()) >> named;
      std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
  };
  EXPECT_EQ(run_mediidx(words, setting).status, 0);
  EXPECT_EQ(named, started);
  EXPECT_FALSE(fs::exists(pid_file()));

  EXPECT_EQ(run_and_signal(SIGKILL), 128 + SIGKILL);
  output({"folder", "set", media.at("m"), "--no-music"});
  EXPECT_FALSE(fs::exists(pid_file()));
}

TEST_F(RunningIndexer, ThatIsInterruptedRemovesItsFile) {
  constexpr int kSongs = 300;
  fill("m");
  for (int i = 0; i < kSongs; ++i) {
    fs::copy_file(media.at("m/a.mp3"), media.at("m/" + std::to_string(i) + ".mp3"));
  }
  for (const int signal : {SIGINT, SIGTERM}) {
    Setting setting;
    setting.meanwhile = [&](pid_t pid) {
      EXPECT_TRUE(wait_for_pid_file());
      kill(pid, signal);
    };
    const auto done = run_mediidx({"--data-dir", data.at("d"), "index", media.at("m")}, setting);
    EXPECT_EQ(done.status, 128 + signal) << done.err;
    EXPECT_FALSE(fs::exists(pid_file())) << signal;
  }
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
