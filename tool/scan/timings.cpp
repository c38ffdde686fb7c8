// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/timings.h"

namespace mediidx::tool {

const char* name_of(Phase phase) {
  constexpr std::array<const char*, kPhases> kNames{
      "start", "look",    "known", "compare", "plan",   "removals", "folders",
      "tags",  "library", "note",  "commit",  "settle", "other"};
  return kNames[static_cast<std::size_t>(phase)];
}

void Timings::change_to(Phase phase) {
  const auto now = Clock::now();
  spent_[static_cast<std::size_t>(current_)] += now - since_;
  current_ = phase;
  since_ = now;
}

Timings::Seconds Timings::seconds() {
  change_to(current_);
  Seconds out{};
  for (std::size_t i = 0; i < kPhases; ++i) {
    out[i] = std::chrono::duration<double>(spent_[i]).count();
  }
  return out;
}

}  // namespace mediidx::tool
