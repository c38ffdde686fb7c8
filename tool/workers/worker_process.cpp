// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

#include "workers/worker_process.h"

#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <string.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <tavoindex.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <fstream>
#include <initializer_list>
#include <system_error>
#include <thread>

#include "workers/worker_main.h"

namespace mediidx::tool {
namespace {

constexpr const char* kNowhere = "/dev/null";

class Attributes {
 public:
  Attributes() {
    posix_spawnattr_init(&attributes_);
    sigset_t signals;
    sigfillset(&signals);
    posix_spawnattr_setsigdefault(&attributes_, &signals);
    // Blocked, not ignored: so it holds from the first instruction on. The parent alone decides
    // when its workers end, also where a service manager signals every process of the service.
    sigemptyset(&signals);
    for (const int number : {SIGHUP, SIGINT, SIGQUIT, SIGTERM}) sigaddset(&signals, number);
    posix_spawnattr_setsigmask(&attributes_, &signals);
    posix_spawnattr_setflags(&attributes_,
                             POSIX_SPAWN_SETSIGDEF | POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSID);
  }
  ~Attributes() { posix_spawnattr_destroy(&attributes_); }
  Attributes(const Attributes&) = delete;
  Attributes& operator=(const Attributes&) = delete;

  const posix_spawnattr_t* get() const { return &attributes_; }

 private:
  posix_spawnattr_t attributes_;
};

class Descriptors {
 public:
  explicit Descriptors(int channel) {
    posix_spawn_file_actions_init(&actions_);
    // First, for it may stand at the number of another.
    posix_spawn_file_actions_adddup2(&actions_, channel, kWorkerChannel);
    posix_spawn_file_actions_addopen(&actions_, STDIN_FILENO, kNowhere, O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&actions_, STDOUT_FILENO, kNowhere, O_WRONLY, 0);
    posix_spawn_file_actions_addopen(&actions_, STDERR_FILENO, kNowhere, O_WRONLY, 0);
    posix_spawn_file_actions_addclosefrom_np(&actions_, kWorkerChannel + 1);
  }
  ~Descriptors() { posix_spawn_file_actions_destroy(&actions_); }
  Descriptors(const Descriptors&) = delete;
  Descriptors& operator=(const Descriptors&) = delete;

  const posix_spawn_file_actions_t* get() const { return &actions_; }

 private:
  posix_spawn_file_actions_t actions_;
};

}  // namespace

bool is_runnable(pid_t pid) {
  std::ifstream file("/proc/" + std::to_string(pid) + "/stat");
  std::string line;
  std::getline(file, line);
  // "pid (name) state …", where the name may hold anything.
  const auto name_end = line.rfind(')');
  return name_end != line.npos && line.substr(name_end).starts_with(") R");
}

WorkerProcess::WorkerProcess(const std::string& program, const WorkerLimits& limits) {
  std::array<int, 2> ends;
  if (socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends.data()) != 0) {
    throw std::system_error(errno, std::generic_category(), "socketpair");
  }
  std::string name = "mediidx";
  std::string word = kWorkerWord;
  auto memory = std::to_string(limits.memory_bytes);
  auto seconds = std::to_string(limits.processor_time.count());
  std::string page = TAVOIndexCodePageGet();
  const std::array<char*, 6> words{name.data(),    word.data(), memory.data(),
                                   seconds.data(), page.data(), nullptr};
  const int error = posix_spawn(&pid_, program.c_str(), Descriptors(ends[1]).get(),
                                Attributes().get(), words.data(), environ);
  close(ends[1]);
  channel_ = ends[0];
  if (error != 0) {
    close(channel_);
    throw std::system_error(error, std::generic_category(), program);
  }
}

WorkerProcess::~WorkerProcess() {
  close(channel_);
  end();
}

void WorkerProcess::kill() {
  if (!status_) ::kill(pid_, SIGKILL);
}

std::optional<int> WorkerProcess::end() {
  using std::chrono::milliseconds;
  constexpr auto kStep = milliseconds(1);
  constexpr int kSteps = 2000;
  if (status_) return status_;
  kill();
  for (int step = 0; step < kSteps; ++step) {
    int status = 0;
    const pid_t ended = waitpid(pid_, &status, WNOHANG);
    // Where this process ignores the ends of its children, nobody can say how they ended.
    if (ended == pid_ || (ended < 0 && errno == ECHILD)) return status_ = status;
    std::this_thread::sleep_for(kStep);
  }
  return std::nullopt;
}

std::string describe_end(int status, const WorkerLimits& limits) {
  if (WIFEXITED(status)) return "ended with status " + std::to_string(WEXITSTATUS(status));
  const int number = WTERMSIG(status);
  if (number == SIGXCPU) {
    return "took more than " + std::to_string(limits.processor_time.count()) +
           " s of processor time";
  }
  const char* name = sigabbrev_np(number);
  return "died of " + (name ? "SIG" + std::string(name) : "signal " + std::to_string(number));
}

}  // namespace mediidx::tool
