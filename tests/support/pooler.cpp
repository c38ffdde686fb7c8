// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "pooler.h"

#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <fstream>
#include <optional>
#include <stdexcept>
#include <thread>

#include "process.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

/// It refuses to run as root.
std::optional<tool::Account> account() {
  return geteuid() == 0 ? tool::find_account("postgres") : std::nullopt;
}

fs::path pooler_folder() {
  std::string name = "/tmp/mediidx-pb-XXXXXX";
  if (!mkdtemp(name.data())) throw std::runtime_error("no temporary folder");
  return name;
}

}  // namespace

Pooler::Pooler(const fs::path& server) : folder_(pooler_folder()) {
  fs::create_directory(socket_folder());
  configure(server);
  if (const auto owner = account()) {
    for (const auto& path : {folder_, socket_folder(), folder_ / "pooler.ini", folder_ / "users"}) {
      if (chown(path.c_str(), owner->uid, owner->gid) != 0) {
        throw std::runtime_error("cannot hand over " + path.string());
      }
    }
  }
  process_ = tool::start_program({"/usr/sbin/pgbouncer", folder_ / "pooler.ini"},
                                 folder_ / "pooler.log", account());
  wait_until_ready();
}

Pooler::~Pooler() {
  kill(process_, SIGTERM);
  waitpid(process_, nullptr, 0);
  std::error_code ignored;
  fs::remove_all(folder_, ignored);
}

void Pooler::configure(const fs::path& server) const {
  std::ofstream(folder_ / "users") << "\"postgres\" \"\"\n";
  std::ofstream ini(folder_ / "pooler.ini");
  ini << "[databases]\n"
      << "* = host=" << server.string() << " port=5432\n"
      << "[pgbouncer]\n"
      << "listen_addr =\n"
      << "listen_port = 5432\n"
      << "unix_socket_dir = " << socket_folder().string() << "\n"
      << "auth_type = trust\n"
      << "auth_file = " << (folder_ / "users").string() << "\n"
      << "pool_mode = session\n"
      // While the server is away, who asks is told so soon, and can turn to another pooler.
      << "server_login_retry = 1\n"
      << "query_wait_timeout = 2\n";
}

void Pooler::turn_to(const fs::path& server) {
  configure(server);
  kill(process_, SIGHUP);
}

void Pooler::wait_until_ready() {
  const auto limit = std::chrono::steady_clock::now() + std::chrono::seconds(20);
  while (!fs::exists(socket_folder() / ".s.PGSQL.5432")) {
    if (std::chrono::steady_clock::now() > limit) {
      throw std::runtime_error("the pooler did not start");
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
}

}  // namespace mediidx::test
