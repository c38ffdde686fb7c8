// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Standard output: data only. Messages go to standard error.
#ifndef MEDIIDX_TOOL_CLI_OUTPUT_H_
#define MEDIIDX_TOOL_CLI_OUTPUT_H_

#include <json/value.h>

#include <string>
#include <string_view>

namespace mediidx::tool {

/// Writes to standard output. Throws OutputClosed when the reader is gone, std::runtime_error when
/// the text cannot be written.
void put(std::string_view text);
/// Writes what is still held back; throws likewise.
void flush_output();

/// The reader of standard output has had enough, as `head` does: no failure of ours.
struct OutputClosed {};

/// A message on standard error: "mediidx: …".
void complain(const std::string& message);

/// Writes objects as one JSON array, an object a line.
class JsonList {
 public:
  void add(const Json::Value& object);
  void finish();

 private:
  bool is_empty_ = true;
};

}  // namespace mediidx::tool

#endif
