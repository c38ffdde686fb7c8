// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The system log of a test program: its own syslog stands before the C library's.
#ifndef MEDIIDX_TESTS_SUPPORT_LOG_RECORDER_H_
#define MEDIIDX_TESTS_SUPPORT_LOG_RECORDER_H_

#include <ostream>
#include <string>
#include <vector>

namespace mediidx::test {

struct LogLine {
  int priority;
  std::string text;
  bool operator==(const LogLine&) const = default;
};
std::ostream& operator<<(std::ostream& out, const LogLine& line);

/// What was logged since the last clear_log (every test of a fixture of ours begins with one).
const std::vector<LogLine>& logged();
void clear_log();
/// The logged texts without their "module:line " or "module (line) " beginnings.
std::vector<std::string> logged_messages();
/// True when some line's text contains `part`.
bool was_logged(const std::string& part);

}  // namespace mediidx::test

#endif
