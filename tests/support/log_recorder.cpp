// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "log_recorder.h"

#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <regex>

namespace mediidx::test {
namespace {

std::vector<LogLine>& lines() {
  static std::vector<LogLine> recorded;
  return recorded;
}

void record(int priority, const char* format, va_list arguments) {
  char* text = nullptr;
  if (vasprintf(&text, format, arguments) < 0) return;
  lines().push_back({priority, text});
  std::free(text);
}

}  // namespace

std::ostream& operator<<(std::ostream& out, const LogLine& line) {
  return out << '<' << line.priority << "> " << line.text;
}

const std::vector<LogLine>& logged() { return lines(); }
void clear_log() { lines().clear(); }

std::vector<std::string> logged_messages() {
  static const std::regex beginning(R"(^mediidx\w*(:\d+ | ?\(\d+\) ?))");
  std::vector<std::string> messages;
  for (const auto& line : lines()) {
    messages.push_back(
        std::regex_replace(line.text, beginning, "", std::regex_constants::format_first_only));
  }
  return messages;
}

bool was_logged(const std::string& part) {
  for (const auto& line : lines()) {
    if (line.text.find(part) != std::string::npos) return true;
  }
  return false;
}

}  // namespace mediidx::test

// The four names by which a build, fortified or not, reaches the system log.
extern "C" {
__attribute__((visibility("default"))) void vsyslog(int priority, const char* format,
                                                    va_list arguments) {
  mediidx::test::record(priority, format, arguments);
}
__attribute__((visibility("default"))) void __vsyslog_chk(int priority, int, const char* format,
                                                          va_list arguments) {
  mediidx::test::record(priority, format, arguments);
}
__attribute__((visibility("default"))) void syslog(int priority, const char* format, ...) {
  va_list arguments;
  va_start(arguments, format);
  mediidx::test::record(priority, format, arguments);
  va_end(arguments);
}
__attribute__((visibility("default"))) void __syslog_chk(int priority, int, const char* format,
                                                         ...) {
  va_list arguments;
  va_start(arguments, format);
  mediidx::test::record(priority, format, arguments);
  va_end(arguments);
}
}
