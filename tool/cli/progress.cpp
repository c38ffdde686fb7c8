// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/progress.h"

#include <json/writer.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdio>

#include "text/table.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr auto kBetweenDraws = std::chrono::milliseconds(100);
constexpr auto kBetweenObjects = std::chrono::seconds(1);
constexpr auto kBetweenLines = std::chrono::seconds(30);
constexpr std::size_t kBarWidth = 24;
constexpr const char* kClearLine = "\r\x1B[K";
// Sooner, a rate is a guess.
constexpr double kFirstSeconds = 1;
constexpr std::size_t kFirstFiles = 10;

std::string clock_text(double seconds) {
  const auto whole = static_cast<long>(seconds + 0.5);
  std::array<char, 64> text;
  if (whole < 3600) {
    std::snprintf(text.data(), text.size(), "%ld:%02ld", whole / 60, whole % 60);
  } else {
    std::snprintf(text.data(), text.size(), "%ld:%02ld:%02ld", whole / 3600, whole / 60 % 60,
                  whole % 60);
  }
  return text.data();
}

std::string rate_text(const ProgressState& state) {
  const auto rate = state.rate();
  if (!rate) return "?/s";
  std::array<char, 32> text;
  std::snprintf(text.data(), text.size(), "%.*f/s", *rate < 10 ? 1 : 0, *rate);
  return text.data();
}

std::string remaining_text(const ProgressState& state) {
  const auto remaining = state.remaining();
  return (remaining ? clock_text(*remaining) : "?") + " left";
}

}  // namespace

std::optional<double> ProgressState::rate() const {
  if (seconds < kFirstSeconds || done < kFirstFiles) return std::nullopt;
  return static_cast<double>(done) / seconds;
}

std::optional<double> ProgressState::remaining() const {
  const auto per_second = rate();
  if (!per_second || total < done) return std::nullopt;
  return static_cast<double>(total - done) / *per_second;
}

std::string progress_line(const ProgressState& state, const std::string& name, int width) {
  const auto share = [&state](std::size_t of) {
    return state.total == 0 ? of : std::min(state.done, state.total) * of / state.total;
  };
  const auto full = share(kBarWidth);
  std::array<char, 64> counts;
  std::snprintf(counts.data(), counts.size(), "%3zu%%  %zu/%zu  ", share(100), state.done,
                state.total);
  const auto line = "[" + std::string(full, '#') + std::string(kBarWidth - full, ' ') + "] " +
                    counts.data() + rate_text(state) + "  " + remaining_text(state) + "  " +
                    escape_for_display(name);
  return cut_to_width(line, width, /*keep_end=*/false);
}

std::string progress_words(const ProgressState& state) {
  return std::to_string(state.done) + " of " + std::to_string(state.total) + " files, " +
         rate_text(state) + ", " + remaining_text(state);
}

std::string progress_json(const ProgressState& state, const std::string& path) {
  Json::Value object;
  object["done"] = Json::UInt64{state.done};
  object["total"] = state.total > 0 ? Json::Value(Json::UInt64{state.total}) : Json::Value();
  const auto rate = state.rate();
  const auto remaining = state.remaining();
  object["rate"] = rate ? Json::Value(*rate) : Json::Value();
  object["remaining"] = remaining ? Json::Value(*remaining) : Json::Value();
  object["path"] = path;
  Json::StreamWriterBuilder builder;
  builder["indentation"] = "";
  return Json::writeString(builder, object);
}

Progress::Progress(Style style)
    : as_json_(style == Style::kJson),
      on_terminal_(!as_json_ && isatty(STDERR_FILENO) == 1),
      next_(on_terminal_ || as_json_ ? Clock::now() : Clock::now() + kBetweenLines) {}

Progress::Progress(std::size_t total) : Progress(Style::kForPeople) { start(total); }

Progress::~Progress() { clear(); }

void Progress::clear() {
  if (on_terminal_) std::fputs(kClearLine, stderr);
}

bool Progress::is_due() {
  const auto now = Clock::now();
  if (now < next_) return false;
  next_ = now + (on_terminal_ ? Clock::duration(kBetweenDraws)
                 : as_json_   ? Clock::duration(kBetweenObjects)
                              : Clock::duration(kBetweenLines));
  state_.seconds = std::chrono::duration<double>(now - begin_).count();
  return true;
}

void Progress::look(std::size_t files, std::size_t folders) {
  if (!is_due()) return;
  if (as_json_) {
    std::fprintf(stderr, "{\"looking\": {\"files\": %zu, \"folders\": %zu}}\n", files, folders);
  } else {
    std::fprintf(stderr, "%slooking: %zu files in %zu folders%s",
                 on_terminal_ ? kClearLine : "mediidx: ", files, folders, on_terminal_ ? "" : "\n");
  }
}

void Progress::start(std::size_t total) {
  state_ = {};
  state_.total = total;
  begin_ = Clock::now();
  if (on_terminal_ || as_json_) next_ = begin_;
}

void Progress::step(const std::string& path) {
  if (is_due()) tell(path);
  ++state_.done;
}

void Progress::answer() {
  state_.seconds = std::chrono::duration<double>(Clock::now() - begin_).count();
  clear();
  std::fprintf(stderr, "mediidx: %s\n", progress_words(state_).c_str());
}

void Progress::tell(const std::string& path) {
  if (as_json_) {
    std::fprintf(stderr, "%s\n", progress_json(state_, path).c_str());
  } else if (on_terminal_) {
    const auto name = path.substr(path.rfind('/') + 1);
    const auto line = progress_line(state_, name, terminal_width(STDERR_FILENO) - 1);
    std::fprintf(stderr, "%s%s", kClearLine, line.c_str());
  } else {
    std::fprintf(stderr, "mediidx: %s\n", progress_words(state_).c_str());
  }
}

}  // namespace mediidx::tool
