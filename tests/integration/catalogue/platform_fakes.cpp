// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "platform_fakes.h"

#include <dlfcn.h>
#include <tavocore.h>
#include <tavodb.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

namespace mediidx::test {

PlatformFakes& platform_fakes() {
  static PlatformFakes fakes;
  return fakes;
}

namespace {

template <class Call>
Call next_definition(const char* name) {
  return reinterpret_cast<Call>(dlsym(RTLD_NEXT, name));
}

/// Read by strdup, which runs before any object of this program is made.
bool strdup_fails() {
  static bool asking = false;
  if (asking) return false;
  asking = true;
  const bool fails = platform_fakes().strdup_fails;
  asking = false;
  return fails;
}

}  // namespace
}  // namespace mediidx::test

extern "C" {

TAVODB_EXPORT int TAVODBDatabaseTypeGet(tavodb_connection* conn) {
  static const auto call =
      mediidx::test::next_definition<decltype(&TAVODBDatabaseTypeGet)>("TAVODBDatabaseTypeGet");
  const auto& fake = mediidx::test::platform_fakes().database_type;
  return fake ? fake() : call(conn);
}

TAVODB_EXPORT const char* TAVODBFetchField(tavodb_result* result, uint32_t row,
                                           const char* column) {
  static const auto call =
      mediidx::test::next_definition<decltype(&TAVODBFetchField)>("TAVODBFetchField");
  const auto& fake = mediidx::test::platform_fakes().field;
  const char* real = call(result, row, column);
  return fake ? fake(column, real) : real;
}

TAVOCORE_EXPORT TLIBSZHASH* TLIBCSzHashAlloc(int size) {
  static const auto call =
      mediidx::test::next_definition<decltype(&TLIBCSzHashAlloc)>("TLIBCSzHashAlloc");
  return mediidx::test::platform_fakes().hash_alloc_fails ? nullptr : call(size);
}

__attribute__((visibility("default"))) char* strdup(const char* text) noexcept {
  if (mediidx::test::strdup_fails()) {
    errno = ENOMEM;
    return nullptr;
  }
  const auto size = std::strlen(text) + 1;
  auto* copy = static_cast<char*>(std::malloc(size));
  return copy ? static_cast<char*>(std::memcpy(copy, text, size)) : nullptr;
}
}
