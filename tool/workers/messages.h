// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What a worker and its parent say to each other: messages of a length, four bytes in the
/// machine's own order, and so many bytes. The first of a worker is a text, its sandbox; each
/// further one answers the oldest order. What a worker sends is not to be trusted: a file may have
/// taken it over.
#ifndef MEDIIDX_TOOL_WORKERS_MESSAGES_H_
#define MEDIIDX_TOOL_WORKERS_MESSAGES_H_

#include <cstddef>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

#include "workers/tag_answer.h"

namespace mediidx::tool {

/// A text of a file, in bytes; far more than a record holds.
inline constexpr std::size_t kLongestText = 64UL * 1024;
inline constexpr std::size_t kLongestMessage = 32 * kLongestText;

/// The bytes make no sense.
struct MessageError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// Takes the first message off the bytes; empty when it is not whole yet. Throws MessageError for
/// one that is too long.
std::optional<std::string_view> take_message(std::string_view& bytes);

/* Each appends one message. */

void put_text(std::string& out, std::string_view text);
void put_order(std::string& out, const TagOrder& order);
void put_answer(std::string& out, const TagAnswer& answer);

TagOrder read_order(std::string_view message);
/// The answer to this order, its path and kind among it. Throws MessageError for any other, and for
/// what no reader gives: texts that are not as clean_text leaves them, numbers that are no numbers.
TagAnswer read_answer(std::string_view message, const TagOrder& order);

/// Makes a file fit for an answer: long texts are cut, and impossible numbers unknown.
void make_sendable(MediaFile& file);
std::string sendable(std::string_view text);

}  // namespace mediidx::tool

#endif
