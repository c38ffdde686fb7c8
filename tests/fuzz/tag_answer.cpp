// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "fuzz.h"
#include "workers/messages.h"

/// What a worker sends, as its parent reads it.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  const tool::TagOrder order{7, "/music/a.mp3", tool::Kind::kMusic};
  auto rest = fuzz::text(data, size);
  try {
    while (const auto message = tool::take_message(rest)) {
      const auto answer = tool::read_answer(*message, order);
      fuzz::check(answer.ticket == order.ticket);
      fuzz::check(answer.outcome != tool::TagAnswer::Outcome::kLost);
      // What is read is all that was sent, and fit to be sent again.
      std::string again;
      tool::put_answer(again, answer);
      fuzz::check(std::string_view(again).substr(sizeof(std::uint32_t)) == *message);
    }
  } catch (const tool::MessageError&) {
  }
  return 0;
}
