// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A worker as its parent has it: a process and the channel to it.
#ifndef MEDIIDX_TOOL_WORKERS_WORKER_PROCESS_H_
#define MEDIIDX_TOOL_WORKERS_WORKER_PROCESS_H_

#include <sys/types.h>

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>

namespace mediidx::tool {

/// What a worker may use.
struct WorkerLimits {
  std::uint64_t memory_bytes = 1024UL * 1024 * 1024;
  std::chrono::seconds processor_time{30};  ///< For one file.
  std::chrono::seconds time{60};            ///< For one file, by the clock; see `is_runnable`.
};

/// Whether a process computes, or could if the machine were less busy. On a busy one, a process of
/// the idle class may wait for minutes: that is not time which its file took.
bool is_runnable(pid_t pid);

class WorkerProcess {
 public:
  /// Starts `program` as a worker: in a session of its own, deaf to the signals by which people and
  /// services end a program, its outputs to nowhere and no other descriptor but its channel. Throws
  /// std::system_error.
  WorkerProcess(const std::string& program, const WorkerLimits& limits);
  /// Kills it and waits for its end; in vain for one that the kernel cannot end, see `end`.
  ~WorkerProcess();
  WorkerProcess(const WorkerProcess&) = delete;
  WorkerProcess& operator=(const WorkerProcess&) = delete;

  pid_t pid() const { return pid_; }
  /// A stream socket.
  int channel() const { return channel_; }

  /// Sends it the signal that ends it, and does not wait.
  void kill();
  /// Kills it, if it has not ended by itself; how it ended, as waitpid tells. Empty when it has not
  /// yet: it waits in the kernel, for a disk or a server that does not answer.
  std::optional<int> end();

 private:
  pid_t pid_ = -1;
  int channel_ = -1;
  std::optional<int> status_;
};

/// "died of SIGSEGV", "ended with status 1": what waitpid tells, in words.
std::string describe_end(int status, const WorkerLimits& limits);

}  // namespace mediidx::tool

#endif
