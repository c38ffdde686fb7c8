// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

#include <charconv>
#include <csignal>
#include <optional>
#include <string_view>

#include "border.h"
#include "whole_file.h"

namespace {

namespace platform = mediidx::platform;

/// A process id in decimal, white space after it allowed and nothing else.
std::optional<pid_t> parse_pid(std::string_view text) {
  const auto end = text.find_last_not_of(" \t\r\n\v\f");
  if (end == std::string_view::npos) return std::nullopt;
  text = text.substr(0, end + 1);
  pid_t pid = 0;
  const auto read = std::from_chars(text.data(), text.data() + text.size(), pid);
  if (read.ec != std::errc() || read.ptr != text.data() + text.size()) return std::nullopt;
  // 0 and negative ids are whole groups of processes, 1 is init.
  return pid > 1 ? std::optional(pid) : std::nullopt;
}

}  // namespace

extern "C" int TLIBCProcSignalByPidFile(const char* pidFile, int signal) {
  constexpr std::size_t kLongest = 256;
  if (!pidFile) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "pid_file.cpp", 1);
  return platform::no_throw(-1, "pid_file.cpp", 2, [&] {
    const auto text = platform::read_whole_file(pidFile, kLongest);
    if (!text) return platform::failed(-1, TAVO_ERR_OPEN_FAILED, "pid_file.cpp", 3);
    const auto pid = parse_pid(*text);
    if (!pid) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "pid_file.cpp", 4);
    return kill(*pid, signal) == 0 ? 0 : -1;
  });
}
