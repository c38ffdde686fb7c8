// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Random choices that one seed repeats on every machine.
#ifndef MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_DICE_H_
#define MEDIIDX_TESTS_INTEGRATION_TOOL_SCAN_DICE_H_

#include <cstddef>
#include <cstdint>
#include <random>

namespace mediidx::test {

class Dice {
 public:
  explicit Dice(std::uint64_t seed) : random_(seed) {}

  /// 0 to count - 1.
  std::size_t below(std::size_t count) { return static_cast<std::size_t>(random_() % count); }
  bool chance(std::size_t percent) { return below(100) < percent; }
  template <class List>
  const auto& one_of(const List& list) {
    return list[below(std::size(list))];
  }

 private:
  std::mt19937_64 random_;
};

}  // namespace mediidx::test

#endif
