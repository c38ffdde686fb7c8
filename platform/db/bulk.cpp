// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavodbbulk.h>

#include <span>
#include <string_view>

#include "border.h"
#include "connection.h"

namespace mediidx::platform {
namespace {

int refused(Connection& conn, std::string_view reason) {
  conn.set_affected_rows(-1);
  conn.set_error(reason);
  return -1;
}

int run_with_values(Connection& conn, const char* sql, std::span<const char* const> values,
                    tavodb_result** result) {
  auto rows = conn.run(sql, values);
  if (!rows) return -1;
  if (result && PQresultStatus(rows.get()) == PGRES_TUPLES_OK) {
    *result = new tavodb_result(std::move(rows));
  }
  return 0;
}

}  // namespace
}  // namespace mediidx::platform

using namespace mediidx::platform;

extern "C" int TAVODBExecuteParams(tavodb_connection* conn, const char* sql, int count,
                                   const char* const* values, tavodb_result** result) {
  if (result) *result = nullptr;
  if (!conn) return -1;
  return no_throw(-1, [&] {
    if (!sql) return refused(*conn, "no statement");
    if (count < 0 || (count > 0 && !values)) return refused(*conn, "no values");
    return run_with_values(*conn, sql, {values, static_cast<std::size_t>(count)}, result);
  });
}

extern "C" int TAVODBCopy(tavodb_connection* conn, const char* sql, const char* rows,
                          size_t length) {
  if (!conn) return -1;
  return no_throw(-1, [&] {
    if (!sql) return refused(*conn, "no statement");
    if (length > 0 && !rows) return refused(*conn, "no rows");
    return conn->copy(sql, {rows, length}) ? 0 : -1;
  });
}

extern "C" int TAVODBInTransaction(tavodb_connection* conn) {
  return conn && conn->in_transaction() ? 1 : 0;
}
