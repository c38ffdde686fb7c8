// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "postgres_server.h"

#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <charconv>
#include <chrono>
#include <fstream>
#include <stdexcept>
#include <system_error>
#include <thread>

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;
using namespace std::chrono_literals;

constexpr auto kStartLimit = 120s;
constexpr auto kStopLimit = 60s;
constexpr auto kPoll = 10ms;
/// Bytes of a socket address, less "/.s.PGSQL.5432" and the terminator.
constexpr std::size_t kLongestSocketFolder = 107 - 14;

bool is_alive(pid_t pid) { return kill(pid, 0) == 0 || errno == EPERM; }

}  // namespace

fs::path find_server_programs() {
  fs::path newest;
  int newest_version = 0;
  std::error_code ignored;
  for (const auto& entry : fs::directory_iterator("/usr/lib/postgresql", ignored)) {
    const auto name = entry.path().filename().string();
    int version = 0;
    std::from_chars(name.data(), name.data() + name.size(), version);
    if (version > newest_version && fs::exists(entry.path() / "bin/postgres", ignored)) {
      newest_version = version;
      newest = entry.path() / "bin";
    }
  }
  if (newest.empty()) {
    throw std::runtime_error(
        "no PostgreSQL server programs below /usr/lib/postgresql: install the package postgresql");
  }
  return newest;
}

PostgresServer::PostgresServer(fs::path folder)
    : folder_(std::move(folder)),
      data_(folder_ / "data"),
      socket_folder_(folder_ / "run"),
      log_(folder_ / "server.log") {
  if (socket_folder_.native().size() > kLongestSocketFolder) {
    throw std::runtime_error("the folder's name is too long for a socket: " + folder_.string());
  }
  if (geteuid() == 0) {
    account_ = find_account("postgres");
    if (!account_) throw std::runtime_error("no user postgres to run the server as");
  }
}

void PostgresServer::make_folder(const fs::path& folder) const {
  fs::create_directories(folder);
  if (chmod(folder.c_str(), 0700) != 0 ||
      (account_ && chown(folder.c_str(), account_->uid, account_->gid) != 0)) {
    throw std::system_error(errno, std::generic_category(), folder.string());
  }
}

void PostgresServer::create(bool quick) {
  if (fs::exists(data_ / "PG_VERSION")) return;
  make_folder(folder_);
  // Made under another name first, so that an interrupted initdb leaves no half cluster in place.
  const fs::path fresh = folder_ / "data.new";
  fs::remove_all(fresh);
  fs::remove_all(data_);
  std::vector<std::string> arguments{find_server_programs() / "initdb",
                                     "--pgdata=" + fresh.string(),
                                     "--username=postgres",
                                     "--auth=trust",
                                     "--encoding=UTF8",
                                     "--locale=C",
                                     "--lc-ctype=C.UTF-8"};
  if (quick) arguments.emplace_back("--no-sync");
  if (run_program(arguments, log_, account_) != 0) {
    throw std::runtime_error("the database cluster could not be made; see " + log_.string());
  }
  fs::rename(fresh, data_);
}

std::optional<PostgresServer::Status> PostgresServer::status() const {
  std::ifstream file(data_ / "postmaster.pid");
  std::string line;
  Status status{0, false};
  for (int number = 1; std::getline(file, line); ++number) {
    if (number == 1) std::from_chars(line.data(), line.data() + line.size(), status.pid);
    if (number == 8) status.ready = line.starts_with("ready");
  }
  if (status.pid <= 1 || !is_alive(status.pid)) return std::nullopt;
  return status;
}

std::optional<pid_t> PostgresServer::running() const {
  const auto now = status();
  return now ? std::optional(now->pid) : std::nullopt;
}

bool PostgresServer::start(const std::vector<std::string>& settings) {
  const bool was_running = status().has_value();
  if (!was_running) {
    make_folder(socket_folder_);
    std::vector<std::string> arguments{find_server_programs() / "postgres",
                                       "-D",
                                       data_,
                                       "-k",
                                       socket_folder_,
                                       "-c",
                                       "listen_addresses="};
    for (const auto& setting : settings) {
      arguments.emplace_back("-c");
      arguments.push_back(setting);
    }
    child_ = start_program(arguments, log_, account_);
  }
  const auto limit = std::chrono::steady_clock::now() + kStartLimit;
  for (;;) {
    const auto now = status();
    if (now && now->ready) return !was_running;
    const bool ended = child_ > 0 && waitpid(child_, nullptr, WNOHANG) == child_;
    if (ended) child_ = 0;
    if (ended || std::chrono::steady_clock::now() > limit) {
      throw std::runtime_error("the database server did not start; see " + log_.string());
    }
    std::this_thread::sleep_for(kPoll);
  }
}

void PostgresServer::stop() {
  const auto now = status();
  if (!now) return;
  kill(now->pid, SIGINT);  // "fast": open sessions are ended, nothing is lost
  const auto limit = std::chrono::steady_clock::now() + kStopLimit;
  while (is_alive(now->pid) && std::chrono::steady_clock::now() < limit) {
    if (child_ == now->pid && waitpid(child_, nullptr, WNOHANG) == child_) break;
    std::this_thread::sleep_for(kPoll);
  }
  child_ = 0;
}

}  // namespace mediidx::tool
