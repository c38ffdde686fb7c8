// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Platform calls that this test program puts before the platform's own, to make them fail.
#ifndef MEDIIDX_TESTS_CATALOGUE_PLATFORM_FAKES_H_
#define MEDIIDX_TESTS_CATALOGUE_PLATFORM_FAKES_H_

#include <functional>

namespace mediidx::test {

/// Without settings every call goes on to the platform.
struct PlatformFakes {
  /// Called in place of TAVODBDatabaseTypeGet.
  std::function<int()> database_type;
  /// Called in place of TAVODBFetchField, with the column and what the platform says.
  std::function<const char*(const char* column, const char* real)> field;
  bool hash_alloc_fails = false;
  bool strdup_fails = false;
};

/// The settings in force; every test begins with none.
PlatformFakes& platform_fakes();

}  // namespace mediidx::test

#endif
