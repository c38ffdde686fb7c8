// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "postgres_server.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <fstream>
#include <iterator>
#include <stdexcept>

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

class AServer : public testing::Test {
 protected:
  AServer() {
    std::string name = "/tmp/mediidx-server-XXXXXX";
    if (!mkdtemp(name.data())) throw std::runtime_error("no temporary folder");
    folder = name;
  }
  ~AServer() override {
    std::error_code ignored;
    fs::remove_all(folder, ignored);
  }

  std::string read(const fs::path& file) const {
    std::ifstream in(file);
    return {std::istreambuf_iterator<char>(in), {}};
  }

  fs::path folder;
};

/// A live process of the server's user, which is no server.
class Bystander {
 public:
  Bystander()
      : pid_(start_program({"/usr/bin/sleep", "600"}, "/dev/null",
                           geteuid() == 0 ? find_account("postgres") : std::nullopt)) {}
  ~Bystander() {
    kill(pid_, SIGKILL);
    waitpid(pid_, nullptr, 0);
  }
  Bystander(const Bystander&) = delete;
  Bystander& operator=(const Bystander&) = delete;
  pid_t pid() const { return pid_; }

 private:
  pid_t pid_;
};

TEST_F(AServer, StartsOnceAndStops) {
  PostgresServer server(folder);
  server.create(true);
  EXPECT_EQ(server.running(), std::nullopt);
  EXPECT_TRUE(server.start({"fsync=off"}));
  EXPECT_TRUE(server.running());
  PostgresServer another(folder);
  EXPECT_FALSE(another.start({}));
  EXPECT_EQ(another.running(), server.running());
  const auto pid = *server.running();
  server.stop();
  EXPECT_EQ(server.running(), std::nullopt);
  EXPECT_EQ(kill(pid, 0), -1);
  server.stop();
}

TEST_F(AServer, HasItsSocketInAFolderOfItsOwn) {
  PostgresServer server(folder);
  server.create(true);
  server.start({"fsync=off"});
  struct stat status{};
  ASSERT_EQ(stat(server.socket_folder().c_str(), &status), 0);
  EXPECT_EQ(status.st_mode & 07777U, 0700U);
  EXPECT_TRUE(fs::exists(server.socket_folder() / ".s.PGSQL.5432"));
  server.stop();
}

TEST_F(AServer, TellsWhereItsSocketIs) {
  PostgresServer server(folder, folder / "elsewhere");
  server.create(true);
  server.start({"fsync=off"});
  PostgresServer another(folder);
  another.start({});
  EXPECT_EQ(another.socket_folder(), folder / "elsewhere");
  server.stop();
}

TEST_F(AServer, StartsAfterACrashThoughItsProcessIdIsTakenByAnother) {
  PostgresServer server(folder);
  server.create(true);
  server.start({});
  const auto crashed = *server.running();
  kill(crashed, SIGKILL);
  waitpid(crashed, nullptr, 0);
  const Bystander bystander;
  for (const auto& file : {folder / "data/postmaster.pid", folder / "run/.s.PGSQL.5432.lock"}) {
    const auto text = read(file);
    std::ofstream(file) << bystander.pid() << text.substr(text.find('\n'));
  }
  PostgresServer next(folder);
  EXPECT_EQ(next.running(), std::nullopt);
  EXPECT_TRUE(next.start({}));
  next.stop();
  EXPECT_EQ(kill(bystander.pid(), 0), 0);
}

TEST_F(AServer, LeavesAFolderAloneThatIsNoCluster) {
  fs::create_directories(folder / "data");
  std::ofstream(folder / "data/thesis.txt") << "mine";
  PostgresServer server(folder);
  EXPECT_THROW(server.create(true), std::runtime_error);
  EXPECT_EQ(read(folder / "data/thesis.txt"), "mine");
}

TEST_F(AServer, RefusesASocketFolderOfSomebodyElses) {
  if (geteuid() == 0) {
    fs::create_directories(folder / "run");
    ASSERT_EQ(chown((folder / "run").c_str(), 65534, 65534), 0);
  } else {
    fs::create_symlink("/tmp", folder / "run");
  }
  PostgresServer server(folder);
  server.create(true);
  EXPECT_THROW(server.start({"fsync=off"}), std::system_error);
  EXPECT_EQ(server.running(), std::nullopt);
}

TEST_F(AServer, ThatCannotStartSaysWhereItsMessagesAre) {
  PostgresServer server(folder);
  server.create(true);
  try {
    server.start({"no_such_setting=1"});
    FAIL() << "started";
  } catch (const std::runtime_error& error) {
    EXPECT_EQ(error.what(),
              "the database server did not start; see " + (folder / "server.log").string());
  }
}

}  // namespace
}  // namespace mediidx::tool
