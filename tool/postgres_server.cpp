// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "postgres_server.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <charconv>
#include <chrono>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <system_error>
#include <thread>
#include <utility>

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

/// Empty for what cannot be read, which a process that ends meanwhile makes of its own files: an
/// iterator over the stream's buffer would throw then.
std::string read_file(const fs::path& file) {
  std::ostringstream out;
  out << std::ifstream(file, std::ios::binary).rdbuf();
  return std::move(out).str();
}

/// A lock file that a crash left may hold the id of a process that lives now, and a server of the
/// same user would take that for a running server. Its parent's id it takes for a stale one. The
/// other lines stay: they let it find memory that an orphan still uses.
void disown_lock_file(const fs::path& file) {
  // The folder belongs to the server's user: a link there must not lead root elsewhere.
  const int descriptor = open(file.c_str(), O_RDWR | O_NOFOLLOW | O_CLOEXEC);
  if (descriptor < 0) return;
  const auto text = read_file(file);
  const auto line_end = text.find('\n');
  if (line_end != std::string::npos) {
    const auto changed = std::to_string(getpid()) + text.substr(line_end);
    if (pwrite(descriptor, changed.data(), changed.size(), 0) < 0 ||
        ftruncate(descriptor, static_cast<off_t>(changed.size())) != 0) {
      close(descriptor);
      throw std::system_error(errno, std::generic_category(), file.string());
    }
  }
  close(descriptor);
}

/// Trust inside the folder is only as good as the folder.
void check_socket_folder(const fs::path& folder, uid_t owner) {
  struct stat status{};
  if (lstat(folder.c_str(), &status) != 0) {
    throw std::system_error(errno, std::generic_category(), folder.string());
  }
  if (!S_ISDIR(status.st_mode) || status.st_uid != owner || (status.st_mode & 077U) != 0) {
    throw std::runtime_error("not used for the database's socket, since it belongs to others: " +
                             folder.string());
  }
}

bool is_empty_folder(const fs::path& folder) {
  std::error_code error;
  return fs::is_empty(folder, error) && !error;
}

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

std::size_t PostgresServer::longest_socket_folder() { return kLongestSocketFolder; }

PostgresServer::PostgresServer(fs::path folder, fs::path socket_folder)
    : folder_(std::move(folder)),
      data_(folder_ / "data"),
      socket_folder_(socket_folder.empty() ? folder_ / "run" : std::move(socket_folder)),
      log_(folder_ / "server.log") {
  if (socket_folder_.native().size() > kLongestSocketFolder) {
    throw std::runtime_error("the folder's name is too long for a socket: " +
                             socket_folder_.string());
  }
  if (geteuid() == 0) {
    account_ = find_account("postgres");
    if (!account_) throw std::runtime_error("no user postgres to run the server as");
  }
}

void PostgresServer::make_folder(const fs::path& folder) const {
  const auto fail = [&folder](int error) {
    throw std::system_error(error, std::generic_category(), folder.string());
  };
  fs::create_directories(folder.parent_path());
  if (mkdir(folder.c_str(), 0700) != 0 && errno != EEXIST) fail(errno);
  const int descriptor = open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC);
  if (descriptor < 0) fail(errno);
  struct stat status{};
  const bool mine = fstat(descriptor, &status) == 0 &&
                    (status.st_uid == geteuid() || (account_ && status.st_uid == account_->uid));
  const bool done = mine && (!account_ || fchown(descriptor, account_->uid, account_->gid) == 0) &&
                    fchmod(descriptor, 0700) == 0;
  const int error = mine ? errno : EPERM;
  close(descriptor);
  if (!done) fail(error);
}

void PostgresServer::create(bool quick) {
  if (fs::exists(data_ / "PG_VERSION")) return;
  if (fs::exists(data_) && !is_empty_folder(data_)) {
    throw std::runtime_error("not empty, and no database cluster: " + data_.string());
  }
  make_folder(folder_);
  // Made under another name first, so that an interrupted initdb leaves no half cluster in place.
  const fs::path fresh = folder_ / "data.new";
  fs::remove_all(fresh);
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

/// The id in a lock file may be another process's by now. A server stands in its data folder, and
/// was started with it as an argument, which other users can see too.
bool PostgresServer::serves_cluster(pid_t pid) const {
  if (pid <= 1 || !is_alive(pid)) return false;
  const fs::path process = "/proc/" + std::to_string(pid);
  std::error_code ignored;
  if (fs::equivalent(process / "cwd", data_, ignored)) return true;
  const auto arguments = '\0' + read_file(process / "cmdline");
  return arguments.find('\0' + data_.string() + '\0') != std::string::npos;
}

std::optional<PostgresServer::Status> PostgresServer::status() const {
  constexpr int kPidLine = 1;
  constexpr int kSocketLine = 5;
  constexpr int kReadyLine = 8;
  std::ifstream file(data_ / "postmaster.pid");
  std::string line;
  Status status;
  for (int number = 1; std::getline(file, line); ++number) {
    if (number == kPidLine) {
      std::from_chars(line.data(), line.data() + line.size(), status.pid);
    }
    if (number == kSocketLine) status.socket_folder = line;
    if (number == kReadyLine) status.ready = line.starts_with("ready");
  }
  if (!serves_cluster(status.pid)) return std::nullopt;
  return status;
}

std::optional<pid_t> PostgresServer::running() const {
  const auto now = status();
  return now ? std::optional(now->pid) : std::nullopt;
}

void PostgresServer::launch(const std::vector<std::string>& settings) {
  make_folder(socket_folder_);
  disown_lock_file(data_ / "postmaster.pid");
  disown_lock_file(socket_folder_ / ".s.PGSQL.5432.lock");
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

void PostgresServer::wait_until_ready() {
  const auto limit = std::chrono::steady_clock::now() + kStartLimit;
  for (;;) {
    const auto now = status();
    if (now && now->ready) {
      if (!now->socket_folder.empty()) socket_folder_ = now->socket_folder;
      return;
    }
    const bool ended = child_ > 0 && waitpid(child_, nullptr, WNOHANG) == child_;
    if (ended) child_ = 0;
    if (ended || std::chrono::steady_clock::now() > limit) {
      throw std::runtime_error("the database server did not start; see " + log_.string());
    }
    std::this_thread::sleep_for(kPoll);
  }
}

bool PostgresServer::start(const std::vector<std::string>& settings) {
  const bool was_running = status().has_value();
  if (!was_running) launch(settings);
  wait_until_ready();
  check_socket_folder(socket_folder_, account_ ? account_->uid : geteuid());
  return !was_running;
}

void PostgresServer::stop() {
  const auto now = status();
  if (!now) return;
  kill(now->pid, SIGINT);  // "fast": open sessions are ended, nothing is lost
  const auto limit = std::chrono::steady_clock::now() + kStopLimit;
  // Init takes the server of another mediidx from the table; until then it has no folder any more.
  while (child_ == now->pid ? waitpid(child_, nullptr, WNOHANG) == 0 : serves_cluster(now->pid)) {
    if (std::chrono::steady_clock::now() > limit) {
      throw std::runtime_error("the database server did not stop; see " + log_.string());
    }
    std::this_thread::sleep_for(kPoll);
  }
  child_ = 0;
}

}  // namespace mediidx::tool
