// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

#include "workers/tag_workers.h"

#include <limits.h>
#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <iterator>
#include <limits>
#include <stdexcept>
#include <string_view>
#include <utility>

#include "workers/messages.h"

namespace mediidx::tool {
namespace {

/// Orders that a worker has at most: enough for the time in which its parent writes to the
/// database, and no more answers than its channel holds.
constexpr std::size_t kMostOrders = 128;
/// It gets more once it has so few, several in one go.
constexpr std::size_t kFewOrders = 64;
constexpr auto kLongestWait = std::chrono::hours(24);
constexpr int kMostFailedStarts = 3;

TagAnswer failed(const TagOrder& order, TagAnswer::Outcome outcome, int error, std::string reason) {
  TagAnswer answer;
  answer.ticket = order.ticket;
  answer.outcome = outcome;
  answer.error = error;
  answer.reason = std::move(reason);
  return answer;
}

}  // namespace

struct TagWorkers::Worker {
  std::unique_ptr<WorkerProcess> process;  ///< Empty while it is to be started anew.
  bool ready = false;                      ///< It said so.
  std::deque<TagOrder> orders;             ///< Not answered yet, the one in hand first.
  std::string unsent;
  std::string received;
  /// When it began what it does: to start, to read the file in hand, or to send its answer.
  Clock::time_point began;
  int extensions = 0;  ///< Of its time since then.

  bool is_busy() const { return process && (!ready || !orders.empty()); }
};

TagWorkers::TagWorkers(unsigned count, const WorkerLimits& limits, std::string program)
    : limits_(limits), program_(std::move(program)) {
  for (unsigned i = 0; i < std::max(count, 1U); ++i) {
    workers_.push_back(std::make_unique<Worker>());
  }
}

TagWorkers::~TagWorkers() {
  // All together, so that each is waited for while the others end, too.
  for (const auto& worker : workers_) {
    if (worker->process) worker->process->kill();
  }
}

void TagWorkers::submit(TagOrder order) {
  start_missing();
  ++outstanding_;
  if (order.path.size() >= PATH_MAX) {
    answers_.push_back(
        failed(order, TagAnswer::Outcome::kUnreadable, ENAMETOOLONG, std::strerror(ENAMETOOLONG)));
    return;
  }
  waiting_.push_back(std::move(order));
  feed();
}

std::optional<TagAnswer> TagWorkers::take(std::chrono::milliseconds wait) {
  const auto deadline = Clock::now() + std::min<std::chrono::milliseconds>(wait, kLongestWait);
  while (answers_.empty()) {
    if (outstanding_ == 0 || !pump(deadline)) return std::nullopt;
    if (answers_.empty() && Clock::now() >= deadline) return std::nullopt;
  }
  auto answer = std::move(answers_.front());
  answers_.pop_front();
  --outstanding_;
  return answer;
}

std::string TagWorkers::sandbox() {
  while (sandbox_.empty()) pump(Clock::now() + limits_.time);
  return sandbox_;
}

std::vector<pid_t> TagWorkers::pids() const {
  std::vector<pid_t> out;
  for (const auto& worker : workers_) {
    if (worker->process) out.push_back(worker->process->pid());
  }
  return out;
}

void TagWorkers::start_missing() {
  std::erase_if(ending_, [](const auto& process) { return process->end().has_value(); });
  for (const auto& worker : workers_) {
    if (worker->process) continue;
    worker->process = std::make_unique<WorkerProcess>(program_, limits_);
    worker->began = Clock::now();
  }
}

void TagWorkers::feed() {
  const auto least = [this]() -> Worker& {
    return **std::ranges::min_element(workers_, {},
                                      [](const auto& worker) { return worker->orders.size(); });
  };
  if (least().orders.size() <= kFewOrders) {
    for (Worker* worker = &least(); !waiting_.empty() && worker->orders.size() < kMostOrders;
         worker = &least()) {
      if (worker->orders.empty() && worker->ready) worker->began = Clock::now();
      put_order(worker->unsent, waiting_.front());
      worker->orders.push_back(std::move(waiting_.front()));
      waiting_.pop_front();
    }
  }
  for (const auto& worker : workers_) send_orders(*worker);
}

void TagWorkers::send_orders(Worker& worker) {
  if (worker.unsent.empty() || !worker.process) return;
  const auto sent = send(worker.process->channel(), worker.unsent.data(), worker.unsent.size(),
                         MSG_DONTWAIT | MSG_NOSIGNAL);
  // Of an error the next receiving tells.
  if (sent > 0) worker.unsent.erase(0, static_cast<std::size_t>(sent));
}

bool TagWorkers::pump(Clock::time_point deadline) {
  start_missing();
  feed();
  std::vector<pollfd> channels;
  for (const auto& worker : workers_) {
    const short events = worker->unsent.empty() ? POLLIN : POLLIN | POLLOUT;
    channels.push_back({worker->process->channel(), events, 0});
    if (worker->is_busy()) deadline = std::min(deadline, worker->began + limits_.time);
  }
  const auto wait = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now()).count();
  const int most = std::numeric_limits<int>::max();
  const int timeout = static_cast<int>(std::clamp<decltype(wait)>(wait, 0, most));
  if (poll(channels.data(), channels.size(), timeout) < 0) return false;
  for (std::size_t i = 0; i < workers_.size(); ++i) {
    if ((channels[i].revents & ~POLLOUT) != 0) receive(*workers_[i]);
    check_time(*workers_[i]);
  }
  feed();
  return true;
}

void TagWorkers::receive(Worker& worker) {
  std::array<char, 64UL * 1024> block;
  for (;;) {
    const auto length = recv(worker.process->channel(), block.data(), block.size(), MSG_DONTWAIT);
    if (length < 0 && (errno == EAGAIN || errno == EINTR)) return;
    if (length <= 0) return lose_dead(worker);
    if (worker.received.empty()) worker.began = Clock::now();
    worker.received.append(block.data(), static_cast<std::size_t>(length));
    try {
      understand(worker);
    } catch (const MessageError&) {
      return lose(worker, "gave an answer that makes no sense");
    }
    if (static_cast<std::size_t>(length) < block.size()) return;
  }
}

void TagWorkers::understand(Worker& worker) {
  std::string_view rest = worker.received;
  while (const auto message = take_message(rest)) {
    worker.began = Clock::now();
    worker.extensions = 0;
    if (!worker.ready) {
      worker.ready = true;
      failed_starts_ = 0;
      sandbox_ = sendable(*message);
      continue;
    }
    if (worker.orders.empty()) throw MessageError("an answer without an order");
    answers_.push_back(read_answer(*message, worker.orders.front()));
    worker.orders.pop_front();
  }
  worker.received.erase(0, worker.received.size() - rest.size());
}

void TagWorkers::check_time(Worker& worker) {
  if (!worker.is_busy() || Clock::now() < worker.began + limits_.time) return;
  // What it computes is bounded by its processor time; yet a program that was taken over could have
  // that limit taken off.
  constexpr int kMostExtensions = 9;
  if (worker.extensions < kMostExtensions && is_runnable(worker.process->pid())) {
    ++worker.extensions;
    worker.began = Clock::now();
    return;
  }
  lose(worker, "took more than " + std::to_string(limits_.time.count()) + " s");
}

void TagWorkers::lose_dead(Worker& worker) {
  // The channel closes when the process is already ending, and how is settled.
  const auto status = worker.process->end();
  lose(worker, status ? describe_end(*status, limits_) : "closed its channel");
}

void TagWorkers::lose(Worker& worker, const std::string& what) {
  const bool was_ready = worker.ready;
  auto process = std::move(worker.process);
  auto orders = std::exchange(worker.orders, {});
  worker = {};
  if (was_ready && !orders.empty()) {
    answers_.push_back(failed(orders.front(), TagAnswer::Outcome::kLost, 0, "its reader " + what));
    orders.pop_front();
  }
  // Each death costs a file, so there is an end to it.
  waiting_.insert(waiting_.begin(), std::move_iterator(orders.begin()),
                  std::move_iterator(orders.end()));
  if (!process->end()) ending_.push_back(std::move(process));
  if (!was_ready && ++failed_starts_ >= kMostFailedStarts) {
    throw std::runtime_error("the reader of tags does not start: it " + what);
  }
}

}  // namespace mediidx::tool
