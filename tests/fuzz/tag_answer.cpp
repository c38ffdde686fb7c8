// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "fuzz.h"
#include "workers/messages.h"

namespace {

using namespace mediidx;

/// What is read is all that was sent.
template <class Put, class Value>
void check_sent_again(Put put, const Value& value, std::string_view message) {
  std::string again;
  put(again, value);
  fuzz::check(std::string_view(again).substr(sizeof(std::uint32_t)) == message);
}

void read_as_order(std::string_view message) try {
  check_sent_again(tool::put_order, tool::read_order(message), message);
} catch (const tool::MessageError&) {
}

void read_as_answer(std::string_view message) try {
  const tool::TagOrder order{7, "/music/a.mp3", tool::Kind::kMusic};
  auto answer = tool::read_answer(message, order);
  fuzz::check(answer.ticket == order.ticket);
  fuzz::check(answer.outcome != tool::TagAnswer::Outcome::kLost);
  check_sent_again(tool::put_answer, answer, message);
  tool::make_sendable(answer.file);  // as it is already
  check_sent_again(tool::put_answer, answer, message);
} catch (const tool::MessageError&) {
}

}  // namespace

/// What a worker sends as its parent reads it, and the other way round.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const auto input = fuzz::text(data, size);
  auto rest = input;
  try {
    while (const auto message = tool::take_message(rest)) {
      read_as_order(*message);
      read_as_answer(*message);
    }
  } catch (const tool::MessageError&) {
  }
  const auto sent = tool::sendable(input);
  fuzz::check(sent.size() <= tool::kLongestText && tool::sendable(sent) == sent);
  return 0;
}
