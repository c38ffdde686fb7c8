// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Where the time of a scan goes.
#ifndef MEDIIDX_TOOL_SCAN_TIMINGS_H_
#define MEDIIDX_TOOL_SCAN_TIMINGS_H_

#include <array>
#include <chrono>
#include <cstddef>

namespace mediidx::tool {

enum class Phase {
  kStart,     ///< Until the scan begins: the database.
  kLook,      ///< Folders are walked.
  kKnown,     ///< What is known of them is fetched.
  kCompare,   ///< Both are compared.
  kPlan,      ///< What is to be done is written down, completed and fetched.
  kRemovals,  ///< Rows are removed.
  kFolders,   ///< Folders are saved.
  kTags,      ///< Tags are waited for.
  kLibrary,   ///< Files are saved.
  kNote,      ///< What is known of them is written down.
  kCommit,
  kSettle,  ///< It is found out what removals have left behind; mending it counts above.
  kOther,
};
inline constexpr std::size_t kPhases = static_cast<std::size_t>(Phase::kOther) + 1;
const char* name_of(Phase phase);

/// Every moment counts for one phase.
class Timings {
 public:
  using Seconds = std::array<double, kPhases>;

  /// From now on the time is that of a phase; with the object's end again of the one before.
  class Part {
   public:
    Part(Timings& timings, Phase phase) : timings_(timings), before_(timings.current_) {
      timings_.change_to(phase);
    }
    ~Part() { timings_.change_to(before_); }
    Part(const Part&) = delete;
    Part& operator=(const Part&) = delete;

   private:
    Timings& timings_;
    Phase before_;
  };

  Seconds seconds();

 private:
  using Clock = std::chrono::steady_clock;

  void change_to(Phase phase);

  Phase current_ = Phase::kOther;
  Clock::time_point since_ = Clock::now();
  std::array<Clock::duration, kPhases> spent_{};
};

}  // namespace mediidx::tool

#endif
