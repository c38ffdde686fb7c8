// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Switches that make a chosen call of the platform, or an allocation, fail. The test program's own
/// definitions stand before the platform's and pass every other call on.
#ifndef MEDIIDX_TESTS_DATABASE_FAULTS_H_
#define MEDIIDX_TESTS_DATABASE_FAULTS_H_

#include <cstddef>
#include <string>

namespace mediidx::test {

/// While it lives, the nth call (from 1) of a platform function fails: null, or -1. With 0 none
/// does, and the calls are only counted. One at a time for each function.
class Failing {
 public:
  explicit Failing(std::string function, int nth = 1);
  ~Failing();
  Failing(const Failing&) = delete;
  Failing& operator=(const Failing&) = delete;
  /// Calls since it was made.
  int calls() const;

 private:
  std::string function_;
};

/// What the last TAVODBConnect was given; "<null>" for null.
struct ConnectArguments {
  std::string host;
  std::string user;
  std::string password;
  std::string database;
  bool operator==(const ConnectArguments&) const = default;
};
const ConnectArguments& last_connect();

// The sanitizers bring an allocator of their own, which cannot be stood before.
#if defined(__has_feature)
#if __has_feature(address_sanitizer)
#define MEDIIDX_SANITIZED_ALLOCATOR 1
#endif
#elif defined(__SANITIZE_ADDRESS__)
#define MEDIIDX_SANITIZED_ALLOCATOR 1
#endif
#ifndef MEDIIDX_SANITIZED_ALLOCATOR
#define MEDIIDX_ALLOCATIONS_CAN_FAIL 1

enum class Allocator { kMalloc, kCalloc, kRealloc };

/// While it lives, the nth allocation (from 1) of exactly this many bytes by this function fails.
class FailingAllocation {
 public:
  FailingAllocation(Allocator allocator, std::size_t bytes, int nth = 1);
  ~FailingAllocation();
  FailingAllocation(const FailingAllocation&) = delete;
  FailingAllocation& operator=(const FailingAllocation&) = delete;
};
#endif

}  // namespace mediidx::test

#endif
