// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/progress.h"

#include <unistd.h>

#include <cstdio>

#include "text/table.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr auto kBetweenDraws = std::chrono::milliseconds(100);
constexpr std::size_t kBarWidth = 24;
constexpr const char* kClearLine = "\r\x1B[K";

}  // namespace

std::string progress_line(std::size_t done, std::size_t total, const std::string& name, int width) {
  const auto share = [&](std::size_t of) { return total == 0 ? of : done * of / total; };
  const auto full = share(kBarWidth);
  auto percent = std::to_string(share(100));
  percent.insert(0, 3 - std::min<std::size_t>(percent.size(), 3), ' ');
  const auto line = "[" + std::string(full, '#') + std::string(kBarWidth - full, ' ') + "] " +
                    percent + "%  " + std::to_string(done) + "/" + std::to_string(total) + "  " +
                    escape_for_display(name);
  return cut_to_width(line, width, /*keep_end=*/false);
}

Progress::Progress(std::size_t total) : on_terminal_(isatty(STDERR_FILENO) == 1), total_(total) {}

Progress::~Progress() {
  if (on_terminal_) std::fputs(kClearLine, stderr);
}

void Progress::step(const std::string& path) {
  const auto before = done_++;
  const auto now = std::chrono::steady_clock::now();
  if (!on_terminal_ || now < next_) return;
  next_ = now + kBetweenDraws;
  const auto name = path.substr(path.rfind('/') + 1);
  const auto line = progress_line(before, total_, name, terminal_width(STDERR_FILENO) - 1);
  std::fprintf(stderr, "%s%s", kClearLine, line.c_str());
}

}  // namespace mediidx::tool
