// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// A worker that has been taken over: the path of an order says what it does. Any other file it
// reads as it should.
#include <sys/socket.h>
#include <unistd.h>

#include <csignal>
#include <string>

#include "workers/messages.h"
#include "workers/worker_main.h"

namespace {

using namespace mediidx::tool;

void send_all(const std::string& bytes) {
  static_cast<void>(!write(kWorkerChannel, bytes.data(), bytes.size()));
}

TagAnswer answer_to(const TagOrder& order) {
  TagAnswer answer;
  answer.ticket = order.ticket;
  answer.outcome = TagAnswer::Outcome::kRead;
  answer.file.title = "title of " + order.path;
  return answer;
}

void misbehave(const TagOrder& order) {
  auto answer = answer_to(order);
  std::string out;
  if (order.path == "/other ticket") answer.ticket = order.ticket + 1;
  if (order.path == "/ends") _exit(7);
  if (order.path == "/aborts") std::raise(SIGABRT);
  if (order.path == "/closes") {
    shutdown(kWorkerChannel, SHUT_RDWR);
    pause();
  }
  if (order.path == "/endless") out = "\xFF\xFF\xFF\x7F" + std::string(100'000, 'x');
  if (order.path == "/garbage") out = std::string("\x08\0\0\0garbage!", 12);
  if (order.path == "/half") out = std::string("\0\0\x10\0half", 8);
  if (out.empty()) put_answer(out, answer);
  // An answer to an order that was never given.
  if (order.path == "/twice") out += out;
  send_all(out);
}

}  // namespace

int main() {
  std::string hello;
  put_text(hello, "none");
  send_all(hello);
  std::string received;
  char block[65536];
  for (ssize_t length; (length = read(kWorkerChannel, block, sizeof(block))) > 0;) {
    received.append(block, static_cast<std::size_t>(length));
    std::string_view rest = received;
    while (const auto message = take_message(rest)) misbehave(read_order(*message));
    received.erase(0, received.size() - rest.size());
  }
  pause();
}
