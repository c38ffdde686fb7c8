// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

#include "workers/worker_main.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <charconv>
#include <chrono>
#include <cstring>
#include <exception>
#include <optional>
#include <string_view>

#include "text/legacy_text.h"
#include "workers/messages.h"
#include "workers/sandbox.h"

namespace mediidx::tool {
namespace {

constexpr std::size_t kWords = 4;

/// Empty when the file could not be looked at, with errno set.
std::optional<struct statx> look_at(const std::string& path) {
  struct statx status{};
  if (statx(AT_FDCWD, path.c_str(), 0, STATX_BASIC_STATS, &status) != 0) return std::nullopt;
  return status;
}

FileStamp stamp_of(const std::optional<struct statx>& status) {
  if (!status) return {};
  return {static_cast<std::int64_t>(status->stx_size), status->stx_mtime.tv_sec,
          static_cast<std::int32_t>(status->stx_mtime.tv_nsec)};
}

/// The error with which the file system refuses a file where tags may be, at its two ends; 0 when
/// it does not. The tag libraries take such a file for one that ends early.
int refusal_of(const std::string& path, std::int64_t size) {
  const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY);
  if (descriptor < 0) return errno;
  std::array<char, 64UL * 1024> block;
  const auto length = static_cast<std::int64_t>(block.size());
  int error = 0;
  for (const auto offset : {std::int64_t{0}, std::max<std::int64_t>(size - length, 0)}) {
    if (pread(descriptor, block.data(), block.size(), offset) < 0) error = errno;
  }
  close(descriptor);
  return error;
}

void fail(TagAnswer& answer, TagAnswer::Outcome outcome, int error, std::string_view reason) {
  answer.outcome = outcome;
  answer.error = error;
  answer.reason = sendable(reason);
  if (answer.reason.empty()) answer.reason = "it cannot be understood";
}

TagAnswer read(const TagOrder& order) {
  using Outcome = TagAnswer::Outcome;
  TagAnswer answer;
  answer.ticket = order.ticket;
  const auto before = look_at(order.path);
  if (!before) {
    const int error = errno;
    fail(answer, Outcome::kUnreadable, error, std::strerror(error));
    return answer;
  }
  answer.before = answer.after = stamp_of(before);
  // To open some of the others would be to wait for somebody at their other end.
  if (!S_ISREG(before->stx_mode)) {
    fail(answer, Outcome::kDamaged, 0, "it is no regular file");
    return answer;
  }
  try {
    answer.file = read_media_file(order.path, order.kind);
    make_sendable(answer.file);
    answer.outcome = Outcome::kRead;
  } catch (const ReadError& error) {
    const int refusal = refusal_of(order.path, answer.before.size);
    const bool is_refused = refusal != 0;
    fail(answer, is_refused ? Outcome::kUnreadable : Outcome::kDamaged, refusal,
         is_refused ? std::strerror(refusal) : error.what());
  }
  answer.after = stamp_of(look_at(order.path));
  return answer;
}

void write_all(std::string_view bytes) {
  while (!bytes.empty()) {
    const auto written = write(kWorkerChannel, bytes.data(), bytes.size());
    if (written < 0 && errno == EINTR) continue;
    if (written < 0) _exit(0);  // The parent is gone.
    bytes.remove_prefix(static_cast<std::size_t>(written));
  }
}

/// Each answer goes out before the next file is begun: the oldest order that has none is the file
/// that a dead worker died of.
void serve(std::chrono::seconds processor_time) {
  std::string received;
  std::string out;
  std::array<char, 64UL * 1024> block;
  for (;;) {
    const auto length = ::read(kWorkerChannel, block.data(), block.size());
    if (length < 0 && errno == EINTR) continue;
    if (length <= 0) return;
    received.append(block.data(), static_cast<std::size_t>(length));
    std::string_view rest = received;
    while (const auto message = take_message(rest)) {
      limit_processor_time(processor_time);
      out.clear();
      put_answer(out, read(read_order(*message)));
      write_all(out);
    }
    received.erase(0, received.size() - rest.size());
  }
}

template <class Number>
Number number_of(const std::string& word) {
  Number out = 0;
  std::from_chars(word.data(), word.data() + word.size(), out);
  return out;
}

}  // namespace

bool is_tag_worker(const std::vector<std::string>& words) {
  return words.size() == kWords && words[0] == kWorkerWord;
}

void run_tag_worker(const std::vector<std::string>& words) {
  try {
    set_code_page(words[3]);
    decode_legacy("\xE9");  // What it takes is loaded while nothing is refused yet.
    limit_process(number_of<std::uint64_t>(words[1]));
    std::string hello;
    put_text(hello, enter_sandbox());
    write_all(hello);
    serve(std::chrono::seconds(number_of<int>(words[2])));
  } catch (const std::exception&) {
    _exit(1);
  }
  _exit(0);
}

}  // namespace mediidx::tool
