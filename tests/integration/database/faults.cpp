// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "faults.h"

#include <dlfcn.h>
#include <tavocore.h>
#include <tavodb.h>

#include <array>
#include <cstdarg>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <map>
#include <stdexcept>
#include <string_view>
#include <utility>

namespace mediidx::test {
namespace {

struct Switch {
  int failing_call;
  int calls = 0;
};

std::map<std::string, Switch, std::less<>>& switches() {
  static std::map<std::string, Switch, std::less<>> all;
  return all;
}

/// Counts a call; true when it is the one that fails.
bool fails(std::string_view function) {
  const auto found = switches().find(function);
  return found != switches().end() && ++found->second.calls == found->second.failing_call;
}

/// The platform's own definition of a function of this type.
template <class Function>
Function* behind(const char* name) {
  auto* found = dlsym(RTLD_NEXT, name);
  if (!found) throw std::runtime_error(std::string("no ") + name + " behind the test's own");
  return reinterpret_cast<Function*>(found);
}

ConnectArguments g_last_connect;

std::string shown(const char* text) { return text ? text : "<null>"; }

constexpr std::size_t kMostValues = 24;
using Slots = std::array<std::intptr_t, kMostValues>;
static_assert(sizeof(std::intptr_t) == sizeof(long long), "a slot holds any value of a template");

/// The values of a template, each as wide as an argument is passed.
Slots read_values(std::string_view sql, va_list& values) {
  constexpr std::string_view kMark = "@TAVO:";
  Slots slots{};
  std::size_t used = 0;
  for (auto at = sql.find(kMark); at != sql.npos; at = sql.find(kMark, at)) {
    at += kMark.size();
    const auto kind = sql.substr(at);
    auto& slot = slots.at(used++);
    if (kind.starts_with("INT")) {
      slot = va_arg(values, int);
    } else if (kind.starts_with("LLINT")) {
      slot = static_cast<std::intptr_t>(va_arg(values, long long));
    } else {
      slot = reinterpret_cast<std::intptr_t>(va_arg(values, const char*));
    }
  }
  return slots;
}

/// Passes every slot on; those beyond the template's values are never looked at.
template <std::size_t... I>
char* pass_on(int type, const char* sql, const Slots& slots, std::index_sequence<I...>) {
  static const auto call = behind<decltype(TAVODBEscapeStringEX3)>("TAVODBEscapeStringEX3");
  return call(type, sql, slots[I]...);
}

constexpr std::size_t kMostArguments = 24;
using Arguments = std::array<const char*, kMostArguments>;

/// Those after the first unused one are never looked at.
template <std::size_t... I>
FILE* open_program(const char* program, const char* mode, const Arguments& arguments,
                   std::index_sequence<I...>) {
  static const auto call = behind<decltype(TLIBCPopen)>("TLIBCPopen");
  return call(program, mode, arguments[0], arguments[I + 1]...);
}

/// The platform's text of a format whose values are filled in already.
char* format_with(const char* function, const char* format, va_list& values) {
  char* text = nullptr;
  if (vasprintf(&text, format, values) < 0) return nullptr;
  char* made = behind<decltype(TLIBCStrGet)>(function)("%s", text);
  std::free(text);
  return made;
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
/// Plain data: allocations happen before any constructor ran.
struct AllocationSwitch {
  Allocator allocator;
  std::size_t bytes;
  int calls_left;
};
constinit AllocationSwitch g_allocation{};

bool allocation_fails(Allocator allocator, std::size_t bytes) {
  auto& chosen = g_allocation;
  if (chosen.calls_left == 0 || chosen.allocator != allocator || chosen.bytes != bytes)
    return false;
  return --chosen.calls_left == 0;
}
#endif

}  // namespace

Failing::Failing(std::string function, int nth) : function_(std::move(function)) {
  switches()[function_] = Switch{nth};
}
Failing::~Failing() { switches().erase(function_); }
int Failing::calls() const { return switches().at(function_).calls; }

const ConnectArguments& last_connect() { return g_last_connect; }

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
FailingAllocation::FailingAllocation(Allocator allocator, std::size_t bytes, int nth) {
  g_allocation = {allocator, bytes, nth};
}
FailingAllocation::~FailingAllocation() { g_allocation = {}; }
#endif

}  // namespace mediidx::test

using mediidx::test::behind;
using mediidx::test::fails;

extern "C" {

TAVODB_EXPORT tavodb_connection* TAVODBConnect(const char* host, const char* user,
                                               const char* password, const char* database) {
  using mediidx::test::shown;
  mediidx::test::g_last_connect = {shown(host), shown(user), shown(password), shown(database)};
  if (fails("TAVODBConnect")) return nullptr;
  return behind<decltype(TAVODBConnect)>("TAVODBConnect")(host, user, password, database);
}

TAVODB_EXPORT char* TAVODBEscapeStringEX3(int databaseType, const char* sql, ...) {
  if (fails("TAVODBEscapeStringEX3")) return nullptr;
  va_list values;
  va_start(values, sql);
  const auto slots = mediidx::test::read_values(sql ? sql : "", values);
  va_end(values);
  return mediidx::test::pass_on(databaseType, sql, slots,
                                std::make_index_sequence<mediidx::test::kMostValues>());
}

TAVODB_EXPORT int TAVODBEscapeString(char* destination, const char* source, size_t length) {
  if (fails("TAVODBEscapeString")) return -1;
  return behind<decltype(TAVODBEscapeString)>("TAVODBEscapeString")(destination, source, length);
}

TAVODB_EXPORT int TAVODBEscapeStringEX2(int databaseType, char* destination, size_t size,
                                        const char* source, size_t length) {
  if (fails("TAVODBEscapeStringEX2")) return -1;
  return behind<decltype(TAVODBEscapeStringEX2)>("TAVODBEscapeStringEX2")(databaseType, destination,
                                                                          size, source, length);
}

TAVODB_EXPORT int TAVODBEscapeBackslash(char* destination, size_t size, const char* source) {
  if (fails("TAVODBEscapeBackslash")) return -1;
  return behind<decltype(TAVODBEscapeBackslash)>("TAVODBEscapeBackslash")(destination, size,
                                                                          source);
}

TAVODB_EXPORT int TAVODBEscapeBackslashEX2(int databaseType, char* destination, size_t size,
                                           const char* source) {
  if (fails("TAVODBEscapeBackslashEX2")) return -1;
  return behind<decltype(TAVODBEscapeBackslashEX2)>("TAVODBEscapeBackslashEX2")(
      databaseType, destination, size, source);
}

TAVODB_EXPORT int TAVODBFetchRow(tavodb_result* result, std::uint32_t* row) {
  if (fails("TAVODBFetchRow")) return -1;
  return behind<decltype(TAVODBFetchRow)>("TAVODBFetchRow")(result, row);
}

TAVODB_EXPORT int EscapeConditionEX(tavodb_connection* conn, const char* condition,
                                    char* destination) {
  if (fails("EscapeConditionEX")) return -1;
  return behind<decltype(EscapeConditionEX)>("EscapeConditionEX")(conn, condition, destination);
}

TAVOCORE_EXPORT FILE* TLIBCPopen(const char* program, const char* mode, const char* arg1, ...) {
  if (fails("TLIBCPopen")) return nullptr;
  mediidx::test::Arguments arguments{arg1};
  va_list values;
  va_start(values, arg1);
  for (std::size_t i = 0; arguments.at(i);) arguments.at(++i) = va_arg(values, const char*);
  va_end(values);
  return mediidx::test::open_program(program, mode, arguments,
                                     std::make_index_sequence<mediidx::test::kMostArguments - 1>());
}

TAVOCORE_EXPORT char* TLIBCStrGet(const char* format, ...) {
  if (fails("TLIBCStrGet")) return nullptr;
  va_list values;
  va_start(values, format);
  char* text = mediidx::test::format_with("TLIBCStrGet", format, values);
  va_end(values);
  return text;
}

TAVOCORE_EXPORT char* TLIBCStrGetEx(const char* format, ...) {
  if (fails("TLIBCStrGetEx")) return nullptr;
  va_list values;
  va_start(values, format);
  char* text = mediidx::test::format_with("TLIBCStrGetEx", format, values);
  va_end(values);
  return text;
}

TAVOCORE_EXPORT int TLIBCSzListPush(TLIBSZLIST* list, const char* text) {
  if (fails("TLIBCSzListPush")) return -1;
  return behind<decltype(TLIBCSzListPush)>("TLIBCSzListPush")(list, text);
}

TAVOCORE_EXPORT int TLIBCSzHashSetValue(TLIBSZHASH* hash, const char* key, const char* value) {
  if (fails("TLIBCSzHashSetValue")) return -1;
  return behind<decltype(TLIBCSzHashSetValue)>("TLIBCSzHashSetValue")(hash, key, value);
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
using mediidx::test::allocation_fails;
using mediidx::test::Allocator;

// The C library's allocator under its second names.
void* __libc_malloc(std::size_t bytes);
void* __libc_calloc(std::size_t count, std::size_t bytes);
void* __libc_realloc(void* block, std::size_t bytes);

__attribute__((visibility("default"))) void* malloc(std::size_t bytes) noexcept {
  return allocation_fails(Allocator::kMalloc, bytes) ? nullptr : __libc_malloc(bytes);
}

__attribute__((visibility("default"))) void* calloc(std::size_t count, std::size_t bytes) noexcept {
  return allocation_fails(Allocator::kCalloc, count * bytes) ? nullptr
                                                             : __libc_calloc(count, bytes);
}

__attribute__((visibility("default"))) void* realloc(void* block, std::size_t bytes) noexcept {
  return allocation_fails(Allocator::kRealloc, bytes) ? nullptr : __libc_realloc(block, bytes);
}
#endif
}
