// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <fstream>
#include <thread>

#include "command.h"
#include "postgres_server.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;
using testing::HasSubstr;
using testing::IsEmpty;

/// Every test has a cluster of its own: some seconds each, so few tests.
class ThePrivateServer : public testing::Test {
 protected:
  ~ThePrivateServer() override { tool::PostgresServer(data.path() / "d/postgres").stop(); }

  Outcome mediidx(std::vector<std::string> words) const {
    words.insert(words.end(), {"--data-dir", data.at("d")});
    return run_mediidx(words, private_server());
  }
  static Setting private_server() {
    Setting setting;
    setting.without_server = true;
    return setting;
  }
  std::vector<pid_t> servers() const { return processes_with(data.at("d/postgres/data")); }

  OpenFolder data;
};

/// A shared lock as every user of the server holds it.
class AnotherUser {
 public:
  explicit AnotherUser(const std::string& file)
      : descriptor_(open(file.c_str(), O_RDWR | O_CLOEXEC)) {
    EXPECT_EQ(flock(descriptor_, LOCK_SH), 0);
  }
  ~AnotherUser() { close(descriptor_); }
  AnotherUser(const AnotherUser&) = delete;
  AnotherUser& operator=(const AnotherUser&) = delete;

 private:
  int descriptor_;
};

TEST_F(ThePrivateServer, IsMadeAndStoppedAgain) {
  const auto run = mediidx({"db", "init"});
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_THAT(run.out, HasSubstr("mediaserver on the private server at " +
                                 data.at("d/postgres/run") + " is ready"));
  EXPECT_THAT(servers(), IsEmpty());
  for (const char* folder : {"d/postgres", "d/postgres/run", "d/postgres/data"}) {
    struct stat status{};
    ASSERT_EQ(stat(data.at(folder).c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777U, 0700U) << folder;
  }
  EXPECT_FALSE(fs::exists(data.at("d/server.started")));
}

TEST_F(ThePrivateServer, IsSharedAndStoppedByTheLastOneOut) {
  ASSERT_EQ(mediidx({"db", "init"}).status, 0);
  {
    const AnotherUser other(data.at("d/server.lock"));
    EXPECT_EQ(mediidx({"list", "music"}).status, 0);
    const auto running = servers();
    ASSERT_EQ(running.size(), 1U);
    EXPECT_EQ(mediidx({"list", "albums"}).status, 0);
    EXPECT_EQ(servers(), running);
  }
  EXPECT_EQ(mediidx({"list", "music"}).status, 0);
  EXPECT_THAT(servers(), IsEmpty());
}

TEST_F(ThePrivateServer, ThatSomebodyElseStartedGoesOn) {
  ASSERT_EQ(mediidx({"db", "init"}).status, 0);
  tool::PostgresServer server(data.path() / "d/postgres");
  server.start({});
  EXPECT_EQ(mediidx({"list", "music"}).status, 0);
  EXPECT_TRUE(server.running());
}

TEST_F(ThePrivateServer, ListensOnItsSocketAlone) {
  ASSERT_EQ(mediidx({"db", "init"}).status, 0);
  const AnotherUser other(data.at("d/server.lock"));
  ASSERT_EQ(mediidx({"list", "music"}).status, 0);
  std::ifstream file(data.at("d/postgres/data/postmaster.pid"));
  std::string line;
  for (int number = 1; number <= 6; ++number) ASSERT_TRUE(std::getline(file, line));
  EXPECT_EQ(line, "");  // the addresses that it listens on
}

TEST_F(ThePrivateServer, IsStoppedWhenTheCommandIsAskedToEnd) {
  OpenFolder media;
  ASSERT_EQ(mediidx({"db", "init"}).status, 0);
  for (int i = 0; i < 400; ++i) {
    media.take_sample("music/Untagged/tape side A.mp3", std::to_string(i) + ".mp3");
  }
  auto setting = private_server();
  setting.meanwhile = [this](pid_t pid) {
    while (servers().empty() && kill(pid, 0) == 0) {
      std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    kill(pid, SIGTERM);
  };
  const auto run = run_mediidx({"index", media.path(), "--data-dir", data.at("d")}, setting);
  EXPECT_EQ(run.status, 128 + SIGTERM) << run.err;
  EXPECT_THAT(run.out, HasSubstr("Stopped indexing "));
  EXPECT_THAT(servers(), IsEmpty());
  EXPECT_EQ(run_mediidx({"list", "music", "--data-dir", data.at("d")}, private_server()).status, 0);
}

TEST_F(ThePrivateServer, SurvivesACrashOfTheCommandAndIsStoppedByTheNext) {
  ASSERT_EQ(mediidx({"db", "init"}).status, 0);
  auto setting = private_server();
  setting.meanwhile = [this](pid_t pid) {
    while (!fs::exists(data.at("d/postgres/run/.s.PGSQL.5432")) && kill(pid, 0) == 0) {
      std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    kill(pid, SIGKILL);
  };
  const auto killed = run_mediidx({"list", "music", "--data-dir", data.at("d")}, setting);
  EXPECT_EQ(killed.status, 128 + SIGKILL);
  EXPECT_EQ(servers().size(), 1U);
  EXPECT_EQ(mediidx({"list", "music"}).status, 0);
  EXPECT_THAT(servers(), IsEmpty());
}

TEST_F(ThePrivateServer, OfADeepDataFolderHasItsSocketElsewhere) {
  const auto deep = data.at(std::string(120, 'd'));
  const auto run = run_mediidx({"db", "init", "--data-dir", deep}, private_server());
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_THAT(processes_with(deep + "/postgres/data"), IsEmpty());
  const auto begin = run.out.find("server at ") + 10;
  const fs::path socket = run.out.substr(begin, run.out.find(" is ready") - begin);
  struct stat status{};
  ASSERT_EQ(stat(socket.c_str(), &status), 0) << socket;
  EXPECT_EQ(status.st_mode & 07777U, 0700U);
  fs::remove_all(socket);
}

TEST_F(ThePrivateServer, SaysWhoMayNotEnterItsFolder) {
  const bool is_root = geteuid() == 0;
  ASSERT_EQ(chmod(data.path().c_str(), is_root ? 0700 : 0500), 0);
  const auto run = mediidx({"db", "init"});
  EXPECT_EQ(run.status, is_root ? 5 : 1);
  EXPECT_THAT(run.err, HasSubstr(is_root ? "the user postgres, which runs root's database server, "
                                           "may not enter " +
                                               data.at("d")
                                         : "the data folder cannot be used: " + data.at("d") +
                                               ": Permission denied"));
  EXPECT_THAT(servers(), IsEmpty());
}

TEST_F(ThePrivateServer, IsStoppedThoughTheReaderIsGone) {
  ASSERT_EQ(mediidx({"db", "init"}).status, 0);
  auto setting = private_server();
  setting.reader_gone = true;
  const auto run = run_mediidx({"list", "music", "--json", "--data-dir", data.at("d")}, setting);
  EXPECT_EQ(run.status, 128 + SIGPIPE);
  EXPECT_EQ(run.err, "");
  EXPECT_THAT(servers(), IsEmpty());
}

}  // namespace
}  // namespace mediidx::test
