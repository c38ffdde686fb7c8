// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "child.h"

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <stdexcept>

namespace mediidx::platform {

namespace {

void check(int error) {
  if (error != 0) throw std::runtime_error("posix_spawn");
}

class SpawnActions {
 public:
  explicit SpawnActions(const ChildStreams& streams) {
    check(posix_spawn_file_actions_init(&actions_));
    try {
      fill(streams);
    } catch (...) {
      posix_spawn_file_actions_destroy(&actions_);
      throw;
    }
  }
  ~SpawnActions() { posix_spawn_file_actions_destroy(&actions_); }
  SpawnActions(const SpawnActions&) = delete;
  SpawnActions& operator=(const SpawnActions&) = delete;
  const posix_spawn_file_actions_t* get() const { return &actions_; }

 private:
  // The streams first: their descriptors may be 0 to 2 themselves when the caller has closed his.
  void fill(const ChildStreams& streams) {
    if (streams.output >= 0) {
      check(posix_spawn_file_actions_adddup2(&actions_, streams.output, STDOUT_FILENO));
    }
    if (streams.input >= 0) {
      check(posix_spawn_file_actions_adddup2(&actions_, streams.input, STDIN_FILENO));
    }
    if (streams.input_from_nowhere) {
      check(posix_spawn_file_actions_addopen(&actions_, STDIN_FILENO, "/dev/null", O_RDONLY, 0));
    }
    check(posix_spawn_file_actions_addclosefrom_np(&actions_, STDERR_FILENO + 1));
  }

  posix_spawn_file_actions_t actions_;
};

class SpawnAttributes {
 public:
  SpawnAttributes() {
    check(posix_spawnattr_init(&attributes_));
    sigset_t all;
    sigset_t none;
    sigfillset(&all);
    sigemptyset(&none);
    posix_spawnattr_setsigdefault(&attributes_, &all);
    posix_spawnattr_setsigmask(&attributes_, &none);
    posix_spawnattr_setflags(&attributes_, POSIX_SPAWN_SETSIGDEF | POSIX_SPAWN_SETSIGMASK);
  }
  ~SpawnAttributes() { posix_spawnattr_destroy(&attributes_); }
  SpawnAttributes(const SpawnAttributes&) = delete;
  SpawnAttributes& operator=(const SpawnAttributes&) = delete;
  const posix_spawnattr_t* get() const { return &attributes_; }

 private:
  posix_spawnattr_t attributes_;
};

}  // namespace

StartedChild start_child(const std::vector<const char*>& arguments, const ChildStreams& streams) {
  std::vector<char*> argv;
  argv.reserve(arguments.size() + 1);
  for (const char* argument : arguments) argv.push_back(const_cast<char*>(argument));
  argv.push_back(nullptr);
  const SpawnActions actions(streams);
  const SpawnAttributes attributes;
  StartedChild child;
  child.error =
      posix_spawn(&child.pid, argv[0], actions.get(), attributes.get(), argv.data(), environ);
  return child;
}

int wait_for_child(pid_t pid) {
  int status = 0;
  while (waitpid(pid, &status, 0) < 0) {
    if (errno != EINTR) return -1;
  }
  return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

}  // namespace mediidx::platform
