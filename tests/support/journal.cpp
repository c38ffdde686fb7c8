// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Stands before the platform's statement calls: writes down what the library sends, and passes it
// on.
#include <dlfcn.h>
#include <errno.h>
#include <tavodb.h>

#include <cstdlib>
#include <fstream>
#include <set>
#include <stdexcept>
#include <string_view>

#include "database.h"

namespace mediidx::test {
namespace {

std::vector<std::string>& statements() {
  static std::vector<std::string> recorded;
  return recorded;
}

/// True when the code at `address` is the library's: tests call the platform themselves too.
bool is_library(const void* address) {
  Dl_info info;
  return dladdr(address, &info) != 0 && info.dli_fname &&
         std::string_view(info.dli_fname).find("libmediidx.so") != std::string_view::npos;
}

/// One file a program, begun anew by each run; a text that it holds already is not written again.
/// Texts end with a NUL byte.
void keep(const char* folder, const std::string& sql) {
  static std::set<std::string> kept;
  if (!kept.insert(sql).second) return;
  static std::ofstream out(
      std::string(folder) + "/" + program_invocation_short_name + ".statements",
      std::ios::binary | std::ios::trunc);
  out << sql << '\0' << std::flush;
}

/// While a limited SELECT runs: the platform may run it through TAVODBExecute itself.
bool g_selecting = false;

/// Notes a text that was sent. The checks of every statement are to see what the library means to
/// send: neither what a test sends itself nor what it breaks to make the server refuse it.
void note(const char* sql, int result, const void* caller) {
  static const char* folder = std::getenv("MEDIIDX_JOURNAL");
  if (folder && result != -1 && is_library(caller)) keep(folder, sql);
}

template <class Call>
Call next_definition(const char* name) {
  auto* found = dlsym(RTLD_NEXT, name);
  if (!found) throw std::runtime_error(std::string("no ") + name + " behind the test's own");
  return reinterpret_cast<Call>(found);
}

}  // namespace

const std::vector<std::string>& sent_statements() { return statements(); }
void clear_sent_statements() { statements().clear(); }

}  // namespace mediidx::test

extern "C" {

TAVODB_EXPORT int TAVODBExecute(tavodb_connection* conn, const char* sql, tavodb_result** result) {
  static const auto call =
      mediidx::test::next_definition<decltype(&TAVODBExecute)>("TAVODBExecute");
  if (!sql || mediidx::test::g_selecting) return call(conn, sql, result);
  mediidx::test::statements().emplace_back(sql);
  const int answer = call(conn, sql, result);
  mediidx::test::note(sql, answer, __builtin_return_address(0));
  return answer;
}

TAVODB_EXPORT int TAVODBSelectLimit(tavodb_connection* conn, const char* sql, uint32_t limit,
                                    uint32_t offset, tavodb_result** result) {
  static const auto call =
      mediidx::test::next_definition<decltype(&TAVODBSelectLimit)>("TAVODBSelectLimit");
  if (!sql) return call(conn, sql, limit, offset, result);
  mediidx::test::statements().emplace_back(sql);
  mediidx::test::g_selecting = true;
  const int answer = call(conn, sql, limit, offset, result);
  mediidx::test::g_selecting = false;
  mediidx::test::note(sql, answer, __builtin_return_address(0));
  return answer;
}
}
