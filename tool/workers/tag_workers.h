// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Reads tags in processes of their own, so that a bad file costs that file only.
#ifndef MEDIIDX_TOOL_WORKERS_TAG_WORKERS_H_
#define MEDIIDX_TOOL_WORKERS_TAG_WORKERS_H_

#include <sys/types.h>

#include <chrono>
#include <cstddef>
#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "workers/tag_answer.h"
#include "workers/worker_process.h"

namespace mediidx::tool {

/// For one thread, and not to outlive it: with it go its workers.
class TagWorkers {
 public:
  /// The workers are started when there is something to do. `program` is the command, of whose
  /// processes they are more; only other programs name it.
  explicit TagWorkers(unsigned count, const WorkerLimits& limits = {},
                      std::string program = "/proc/self/exe");
  /// Ends them, whatever they do.
  ~TagWorkers();
  TagWorkers(const TagWorkers&) = delete;
  TagWorkers& operator=(const TagWorkers&) = delete;

  /// Queues; never waits for a worker. The path is absolute. Throws std::system_error when a worker
  /// that is missing cannot be started.
  void submit(TagOrder order);
  /// Submitted and not yet taken.
  std::size_t outstanding() const { return outstanding_; }
  /// The next answer, in any order. Empty when there is none within that time, when nothing is
  /// outstanding, and when a signal came. A worker that dies or takes too long costs the file that
  /// it was reading; its other files go to the one that takes its place. The clock is watched in
  /// here only. Throws std::runtime_error when no worker can be started any more.
  std::optional<TagAnswer> take(std::chrono::milliseconds wait);

  /// What the workers gave up, as enter_sandbox tells it: for people. Waits for one to be ready.
  /// Throws as take does.
  std::string sandbox();
  std::vector<pid_t> pids() const;

 private:
  using Clock = std::chrono::steady_clock;
  struct Worker;

  void start_missing();
  void feed();
  void send_orders(Worker& worker);
  /// Waits until the deadline at most for what workers send, and takes it; false when a signal
  /// came.
  bool pump(Clock::time_point deadline);
  void receive(Worker& worker);
  void understand(Worker& worker);
  void check_time(Worker& worker);
  /// The worker is to be replaced: the file in its hand is lost, because its reader did that.
  void lose(Worker& worker, const std::string& what);
  void lose_dead(Worker& worker);

  WorkerLimits limits_;
  std::string program_;
  std::vector<std::unique_ptr<Worker>> workers_;
  /// Killed, and not yet let go by the kernel.
  std::vector<std::unique_ptr<WorkerProcess>> ending_;
  std::deque<TagOrder> waiting_;
  std::deque<TagAnswer> answers_;
  std::size_t outstanding_ = 0;
  int failed_starts_ = 0;  ///< Since one went well.
  std::string sandbox_;
};

}  // namespace mediidx::tool

#endif
