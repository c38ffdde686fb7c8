// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <border.h>
#include <tavosdk.h>
#include <utf8.h>

#include <chrono>
#include <memory>
#include <vector>

#include "homes.h"

namespace platform = mediidx::platform;

namespace {

using Clock = std::chrono::steady_clock;

struct HomeCache {
  unsigned generation = 0;  ///< Of the users that the homes were taken from.
  Clock::time_point resolved_at;
  std::vector<platform::Home> homes;
};

/// The homes as of now: taken anew when the users were, and every few seconds because links can be
/// led elsewhere. The check is made several times for each file.
const std::vector<platform::Home>& current_homes() {
  constexpr std::chrono::seconds kTrusted{5};
  static auto& cache = *new HomeCache;
  const auto& users = platform::all_users();
  const auto generation = platform::all_users_generation();
  if (cache.generation == generation && Clock::now() - cache.resolved_at < kTrusted) {
    return cache.homes;
  }
  cache.homes = platform::homes_of(users);
  cache.generation = generation;
  cache.resolved_at = Clock::now();
  return cache.homes;
}

std::unique_ptr<TAVOHOMECHECK> to_record(const platform::Home& home) {
  auto record = std::make_unique<TAVOHOMECHECK>();
  const bool fits = platform::copy_whole(record->user, home.user) &&
                    platform::copy_whole(record->home, home.folder);
  return fits ? std::move(record) : nullptr;
}

}  // namespace

extern "C" int TAVOServiceHomePathCheck(const char* path, [[maybe_unused]] int flagA,
                                        [[maybe_unused]] int flagB, TAVOHOMECHECK** result) {
  if (!path || !result) {
    return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "home_check.cpp", 1);
  }
  *result = nullptr;
  return platform::no_throw(-1, "home_check.cpp", 2, [&] {
    const platform::Home* home = platform::find_home(current_homes(), path);
    if (!home) return 0;
    auto record = to_record(*home);
    if (!record) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "home_check.cpp", 3);
    *result = record.release();
    return 1;
  });
}

extern "C" void TAVOHomeCheckResultFree(TAVOHOMECHECK* result) { delete result; }
