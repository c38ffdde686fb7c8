// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavodb.h>

#include <optional>
#include <string>
#include <string_view>

#include "border.h"
#include "connection.h"
#include "statement_splitter.h"

namespace mediidx::platform {
namespace {

/// The rows of the last statement of a text, none for a text without any; nothing when one failed.
struct Outcome {
  OwnedRows rows;
};

std::optional<Outcome> run_all(Connection& conn, std::string_view text) {
  Outcome last;
  conn.set_affected_rows(0);
  while (const auto statement = next_statement(text)) {
    last.rows = conn.run(std::string(*statement));
    if (!last.rows) return std::nullopt;
  }
  return last;
}

int failed(Connection& conn, std::string_view reason) {
  conn.set_affected_rows(-1);
  conn.set_error(reason);
  return -1;
}

int run_text(Connection& conn, const char* text, tavodb_result** result) {
  if (!text) return failed(conn, "no statement");
  auto outcome = run_all(conn, text);
  if (!outcome) return -1;
  if (result && PQresultStatus(outcome->rows.get()) == PGRES_TUPLES_OK) {
    *result = new tavodb_result(std::move(outcome->rows));
  }
  return 0;
}

/// One SELECT with its limits; nothing for a text of no or several statements, which have no place
/// for them.
std::optional<std::string> limited(std::string_view text, std::uint32_t limit,
                                   std::uint32_t offset) {
  const auto select = next_statement(text);
  if (!select || next_statement(text)) return std::nullopt;
  std::string sql(*select);
  // On a line of their own: the text may end in a comment.
  if (limit != 0) sql += "\nLIMIT " + std::to_string(limit);
  if (offset != 0) sql += "\nOFFSET " + std::to_string(offset);
  return sql;
}

int select_limited(Connection& conn, const char* sql, std::uint32_t limit, std::uint32_t offset,
                   tavodb_result** result) {
  if (!sql || (limit == 0 && offset == 0)) return run_text(conn, sql, result);
  const auto text = limited(sql, limit, offset);
  if (!text) return failed(conn, "limits need a text of one SELECT");
  return run_text(conn, text->c_str(), result);
}

}  // namespace
}  // namespace mediidx::platform

using namespace mediidx::platform;

extern "C" int TAVODBExecute(tavodb_connection* conn, const char* sql, tavodb_result** result) {
  if (result) *result = nullptr;
  if (!conn) return -1;
  return no_throw(-1, [&] { return run_text(*conn, sql, result); });
}

extern "C" int TAVODBSelectLimit(tavodb_connection* conn, const char* sql, uint32_t limit,
                                 uint32_t offset, tavodb_result** result) {
  if (result) *result = nullptr;
  if (!conn) return -1;
  return no_throw(-1, [&] { return select_limited(*conn, sql, limit, offset, result); });
}

extern "C" int TAVODBAffectedRows(tavodb_connection* conn, tavodb_result*) {
  return conn ? conn->affected_rows() : -1;
}
