// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Stands before the platform's statement calls: writes down what the library sends, and passes it
// on.
#include <dlfcn.h>
#include <tavodb.h>
#include <unistd.h>

#include <cstdlib>
#include <fstream>
#include <set>
#include <stdexcept>

#include "database.h"

namespace mediidx::test {
namespace {

std::vector<std::string>& statements() {
  static std::vector<std::string> recorded;
  return recorded;
}

/// One file a process; a text that it holds already is not written again. Texts end with a NUL
/// byte.
void keep(const std::string& sql) {
  static const char* folder = std::getenv("MEDIIDX_JOURNAL");
  static std::set<std::string> kept;
  if (!folder || !kept.insert(sql).second) return;
  static std::ofstream out(std::string(folder) + "/" + std::to_string(getpid()) + ".statements",
                           std::ios::binary | std::ios::app);
  out << sql << '\0' << std::flush;
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
  if (sql) {
    mediidx::test::statements().emplace_back(sql);
    mediidx::test::keep(sql);
  }
  return call(conn, sql, result);
}

TAVODB_EXPORT int TAVODBSelectLimit(tavodb_connection* conn, const char* sql, uint32_t limit,
                                    uint32_t offset, tavodb_result** result) {
  static const auto call =
      mediidx::test::next_definition<decltype(&TAVODBSelectLimit)>("TAVODBSelectLimit");
  if (sql) {
    mediidx::test::statements().emplace_back(sql);
    mediidx::test::keep(sql);
  }
  return call(conn, sql, limit, offset, result);
}
}
