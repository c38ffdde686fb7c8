// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/output.h"

#include <json/writer.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <stdexcept>

namespace mediidx::tool {
namespace {

[[noreturn]] void fail() {
  if (errno == EPIPE) throw OutputClosed();
  throw std::runtime_error(std::string("standard output: ") + std::strerror(errno));
}

}  // namespace

void put(std::string_view text) {
  if (std::fwrite(text.data(), 1, text.size(), stdout) != text.size()) fail();
}

void flush_output() {
  if (std::fflush(stdout) != 0) fail();
}

void complain(const std::string& message) {
  std::fprintf(stderr, "mediidx: %s\n", message.c_str());
}

void JsonList::add(const Json::Value& object) {
  static const auto kBuilder = [] {
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    builder["emitUTF8"] = true;
    return builder;
  }();
  put(is_empty_ ? "[\n" : ",\n");
  put(Json::writeString(kBuilder, object));
  is_empty_ = false;
}

void JsonList::finish() { put(is_empty_ ? "[]\n" : "\n]\n"); }

}  // namespace mediidx::tool
