// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "machine.h"

#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <stdexcept>
#include <thread>
#include <vector>

#include "database.h"
#include "postgres_server.h"
#include "process.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

const std::vector<std::string> kSettings{"fsync=off", "shared_buffers=32MB", "max_connections=40",
                                         "autovacuum=off", "jit=off"};

/// Short enough for a socket.
fs::path server_folder() {
  std::string name = "/tmp/mediidx-pg-XXXXXX";
  if (!mkdtemp(name.data())) throw std::runtime_error("no temporary folder");
  return name;
}

}  // namespace

struct Machine::Parts {
  fs::path folder = server_folder();
  tool::PostgresServer server{folder};
};

Machine::Machine() : parts_(std::make_unique<Parts>()) {}

Machine::~Machine() {
  parts_->server.stop();
  std::error_code ignored;
  fs::remove_all(parts_->folder, ignored);
}

std::unique_ptr<Machine> Machine::alone() {
  std::unique_ptr<Machine> machine(new Machine);
  machine->parts_->server.create(true);
  machine->parts_->server.start(kSettings);
  return machine;
}

std::unique_ptr<Machine> Machine::standby_of(const fs::path& primary) {
  std::unique_ptr<Machine> machine(new Machine);
  const auto& folder = machine->parts_->folder;
  const auto account = geteuid() == 0 ? tool::find_account("postgres") : std::nullopt;
  if (account && chown(folder.c_str(), account->uid, account->gid) != 0) {
    throw std::runtime_error("cannot hand over " + folder.string());
  }
  const int status = tool::run_program(
      {tool::find_server_programs() / "pg_basebackup", "--pgdata=" + (folder / "data").string(),
       "--host=" + primary.string(), "--username=postgres", "--checkpoint=fast", "--no-sync",
       "--write-recovery-conf"},
      folder / "copy.log", account);
  if (status != 0) throw std::runtime_error("the primary cannot be copied");
  machine->parts_->server.start(kSettings);
  return machine;
}

const fs::path& Machine::socket_folder() const { return parts_->server.socket_folder(); }

void Machine::crash() {
  if (const auto server = parts_->server.running()) kill(*server, SIGQUIT);
  parts_->server.stop();
}

void Machine::follow_nobody() {
  rows_at(socket_folder(), "ALTER SYSTEM SET primary_conninfo = ''");
  rows_at(socket_folder(), "SELECT pg_reload_conf()");
  while (!rows_at(socket_folder(), "SELECT FROM pg_stat_wal_receiver").empty()) {
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }
}

void Machine::promote() {
  if (rows_at(socket_folder(), "SELECT pg_promote()") != std::vector<Row>{{"t"}}) {
    throw std::runtime_error("the standby is not promoted");
  }
}

}  // namespace mediidx::test
