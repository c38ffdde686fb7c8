// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <string>

#include "border.h"
#include "connection.h"
#include "statement_splitter.h"

namespace {

int execute(tavodb_connection &conn, const char *sql, tavodb_result **result) {
  conn.affected = 0;
  tavodb::StatementSplitter statements(sql);
  tavodb::OwnedPgResult last;
  while (const auto statement = statements.next()) {
    last = conn.run(std::string(*statement));
    if (!last)
      return -1;
  }
  if (result && PQresultStatus(last.get()) == PGRES_TUPLES_OK) {
    *result = new tavodb_result(std::move(last));
  }
  return 0;
}

} // namespace

extern "C" int TAVODBExecute(tavodb_connection *conn, const char *sql,
                             tavodb_result **result) {
  if (result)
    *result = nullptr;
  if (!conn)
    return -1;
  return tavodb::guarded(-1, [&] {
    conn->error.clear();
    if (sql)
      return execute(*conn, sql, result);
    conn->error = "no statement";
    return -1;
  });
}

extern "C" int TAVODBSelectLimit(tavodb_connection *conn, const char *sql,
                                 uint32_t limit, uint32_t offset,
                                 tavodb_result **result) {
  if (!sql || (limit == 0 && offset == 0))
    return TAVODBExecute(conn, sql, result);
  return tavodb::guarded(-1, [&] {
    std::string paged(sql);
    if (limit > 0)
      paged += " LIMIT " + std::to_string(limit);
    if (offset > 0)
      paged += " OFFSET " + std::to_string(offset);
    return TAVODBExecute(conn, paged.c_str(), result);
  });
}
