// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Opening and closing a SELECT over one table.
#include <cstdlib>

#include "database/select.h"
#include "database/session.h"
#include "database/table_types.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

constexpr int kNoStatement = 220;
constexpr int kNotSelected = 221;

struct Query {
  MEDIA_TABLE_TYPE type;
  const char* columns;
  const char* where;
  const char* group_by;
  const char* order_by;
  std::uint32_t skipped;  ///< Rows before the first that is returned.
  std::uint32_t most;     ///< Rows returned at most; 0 for all.
  bool escape_where;
};

OwnedFormat select_statement(tavodb_connection* conn, const Query& query) {
  const auto condition = make_condition(conn, query.where, query.escape_where);
  if (!condition) return nullptr;
  const auto group = make_group_clause(query.group_by);
  if (!group) return nullptr;
  const auto order = make_order_clause(query.order_by);
  if (!order || !check_selectable(query.type)) return nullptr;
  OwnedFormat statement(TLIBCStrGet("SELECT %s FROM %s %s %s %s %s", text_or(query.columns, "*"),
                                    table_name(query.type), condition->keyword, condition->text,
                                    group->text(), order->text()));
  if (!statement) log_format_failure(kNoStatement);
  return statement;
}

OwnedHandle open(const Query& query) {
  auto handle = open_handle();
  if (!handle) return nullptr;
  const auto statement = select_statement(handle->conn, query);
  if (!statement) return nullptr;
  if (TAVODBSelectLimit(handle->conn, statement.get(), query.most, query.skipped,
                        &handle->result) == -1) {
    kDatabaseLog.parens(kNotSelected, "Failed to exec [%s] (%s)", statement.get(),
                        TAVODBErrorGet(handle->conn));
    return nullptr;
  }
  handle->rowCount = static_cast<std::uint32_t>(TAVODBNumRows(handle->result));
  handle->tableType = query.type;
  return handle;
}

}  // namespace
}  // namespace mediidx

extern "C" MEDIA_DB_HANDLE* MediaInfoDBOpenEx(MEDIA_TABLE_TYPE tableType, const char* columns,
                                              const char* where, const char* groupBy,
                                              const char* orderBy, uint32_t rangeA, uint32_t rangeB,
                                              int escapeWhere) {
  using mediidx::OwnedHandle;
  return mediidx::no_throw(mediidx::kDatabaseLog, OwnedHandle(),
                           [&] {
                             return mediidx::open({tableType, columns, where, groupBy, orderBy,
                                                   rangeA, rangeB, escapeWhere == 1});
                           })
      .release();
}

extern "C" MEDIA_DB_HANDLE* MediaInfoDBOpen(MEDIA_TABLE_TYPE tableType, const char* columns,
                                            const char* where, const char* groupBy,
                                            const char* orderBy, uint32_t rangeA, uint32_t rangeB,
                                            int escapeWhere) {
  return MediaInfoDBOpenEx(tableType, columns, where, groupBy, orderBy, rangeA, rangeB,
                           escapeWhere);
}

extern "C" void MediaInfoDBClose(MEDIA_DB_HANDLE* handle) {
  if (!handle) return;
  if (handle->result) TAVODBFreeResult(handle->result);
  std::free(handle);
}
