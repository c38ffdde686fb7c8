// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Counting rows, walking a handle into records, and the row of one path.
#include <algorithm>
#include <climits>
#include <cstdlib>
#include <cstring>

#include "database/escape.h"
#include "database/record_reader.h"
#include "database/select.h"
#include "database/session.h"
#include "database/table_types.h"
#include "mediidx/request.h"
#include "support/no_throw.h"
#include "support/statement.h"

namespace mediidx {
namespace {

using Info = __tag_TAVO_MEDIA_INFO;

constexpr Template<const char*> kPathEndsWith{"path like '%@TAVO:LVAR'"};
constexpr Template<const char*> kPathIs{"path like '@TAVO:LVAR'"};

constexpr int kBadParameter = 240;
constexpr int kNoCountStatement = 241;
constexpr int kNotCounted = 242;
constexpr int kNoPathCondition = 243;
constexpr int kNoFieldCondition = 244;
constexpr int kNoMediaInfo = 245;

int bad_parameter() {
  kDatabaseLog.parens(kBadParameter, "Bad parameter.");
  return -1;
}

OwnedFormat count_statement(tavodb_connection* conn, MEDIA_TABLE_TYPE type, const char* column,
                            const char* where, const char* group_by, bool escape_where) {
  const auto condition = make_condition(conn, where, escape_where);
  if (!condition) return nullptr;
  const auto group = make_group_clause(group_by);
  if (!group || !check_selectable(type)) return nullptr;
  OwnedFormat statement(TLIBCStrGet("SELECT COUNT(%s) as result_count FROM %s %s %s %s",
                                    text_or(column, "*"), table_name(type), condition->keyword,
                                    condition->text, group->text()));
  if (!statement) log_format_failure(kNoCountStatement);
  return statement;
}

/// The count of the first row; -1 without one, as a grouping of no rows gives.
int first_count(tavodb_result* result) {
  std::uint32_t row = 0;
  if (!result || TAVODBFetchRow(result, &row) == -1) return -1;
  const char* text = TAVODBFetchField(result, row, "result_count");
  if (!text) return -1;
  return static_cast<int>(std::min<long long>(std::strtoll(text, nullptr, 10), INT_MAX));
}

int count(MEDIA_TABLE_TYPE type, const char* column, const char* where, const char* group_by,
          bool escape_where) {
  const auto handle = open_handle();
  if (!handle) return -1;
  const auto sql = count_statement(handle->conn, type, column, where, group_by, escape_where);
  if (!sql) return -1;
  OwnedResult result;
  if (!execute(handle->conn, sql.get(), {LogShape::kParens, kNotCounted}, &result)) return -1;
  return first_count(result.get());
}

int get_next(MEDIA_DB_HANDLE* handle, Info* info) {
  if (info) std::memset(info, 0, sizeof(*info));
  if (!handle || !info) return bad_parameter();
  if (TAVODBFetchRow(handle->result, &handle->row) == -1) return -1;
  return MediaInfoDBGetRecored(handle, info);
}

int get_by_path(MEDIA_TABLE_TYPE type, const char* path, Info* info, bool suffix_match) {
  if (!path || !info) return -1;
  const auto condition = fill(kDatabaseType, suffix_match ? kPathEndsWith : kPathIs, path);
  if (!condition) {
    log_condition_failure(kNoPathCondition);
    return -1;
  }
  const OwnedHandle handle(
      MediaInfoDBOpenEx(type, nullptr, condition.get(), nullptr, nullptr, 0, 0, 0));
  return handle ? MediaInfoDBGet(handle.get(), info) : -1;
}

int get_columns_by_path(MEDIA_TABLE_TYPE type, const char* path, const char* columns, Info* info) {
  if (!path || !info) return bad_parameter();
  const auto escaped = escape_pattern(path);
  if (!escaped) return -1;
  const OwnedFormat condition(TLIBCStrGet("path like '%s'", escaped.get()));
  if (!condition) {
    log_condition_failure(kNoFieldCondition);
    return -1;
  }
  const OwnedHandle handle(
      MediaInfoDBOpenEx(type, columns, condition.get(), nullptr, nullptr, 0, 0, 0));
  if (!handle) return -1;
  if (MediaInfoDBGet(handle.get(), info) == 0) return 0;
  kDatabaseLog.parens(kNoMediaInfo, "Failed to get mediainfo.");
  return -1;
}

const char* next_path(MEDIA_DB_HANDLE* handle) {
  if (!handle) {
    bad_parameter();
    return nullptr;
  }
  if (TAVODBFetchRow(handle->result, &handle->row) == -1) return nullptr;
  const char* path = TAVODBFetchField(handle->result, handle->row, "path");
  return path ? path : "";
}

}  // namespace
}  // namespace mediidx

using mediidx::kDatabaseLog;
using mediidx::no_throw;

extern "C" int MediaInfoDBGetCount(MEDIA_TABLE_TYPE tableType, const char* column,
                                   const char* where, const char* groupBy, int escapeWhere) {
  return no_throw(kDatabaseLog, -1, [&] {
    return mediidx::count(tableType, column, where, groupBy, escapeWhere == 1);
  });
}

extern "C" int MediaInfoDBGet(MEDIA_DB_HANDLE* handle, __tag_TAVO_MEDIA_INFO* info) {
  return no_throw(kDatabaseLog, -1, [&] { return mediidx::get_next(handle, info); });
}

extern "C" int MediaInfoDBGetRecored(MEDIA_DB_HANDLE* handle, __tag_TAVO_MEDIA_INFO* info) {
  if (!handle || !info) return mediidx::bad_parameter();
  return MediaInfoDBGetRecoredData(handle->result, handle->row, info);
}

extern "C" int MediaInfoDBGetRecoredData(tavodb_result* result, uint32_t row,
                                         __tag_TAVO_MEDIA_INFO* info) {
  return no_throw(kDatabaseLog, -1, [&] {
    if (!result || !info) return mediidx::bad_parameter();
    mediidx::read_record(result, row, *info);
    return 0;
  });
}

extern "C" int MediaInfoDBGetOneEx2(MEDIA_TABLE_TYPE tableType, const char* path,
                                    __tag_TAVO_MEDIA_INFO* info, int suffixMatch) {
  return no_throw(kDatabaseLog, -1,
                  [&] { return mediidx::get_by_path(tableType, path, info, suffixMatch != 0); });
}

extern "C" int MediaInfoDBGetOneEx(MEDIA_TABLE_TYPE tableType, const char* path,
                                   __tag_TAVO_MEDIA_INFO* info, int suffixMatch) {
  return MediaInfoDBGetOneEx2(tableType, path, info, suffixMatch);
}

extern "C" int MediaInfoDBGetOne(MEDIA_TABLE_TYPE tableType, const char* path,
                                 __tag_TAVO_MEDIA_INFO* info, int suffixMatch) {
  return MediaInfoDBGetOneEx2(tableType, path, info, suffixMatch);
}

extern "C" int MediaInfoDBGetOneByField(MEDIA_TABLE_TYPE tableType, const char* path,
                                        const char* columns, __tag_TAVO_MEDIA_INFO* info) {
  return no_throw(kDatabaseLog, -1,
                  [&] { return mediidx::get_columns_by_path(tableType, path, columns, info); });
}

extern "C" const char* PlaylistDBGet(MEDIA_DB_HANDLE* handle) {
  return no_throw(kDatabaseLog, static_cast<const char*>(nullptr),
                  [&] { return mediidx::next_path(handle); });
}

// The second name of the same function.
extern "C" [[gnu::alias("MediaInfoDBGetOne")]] int TAVOMediaIndexDBGetOne(
    MEDIA_TABLE_TYPE tableType, const char* path, __tag_TAVO_MEDIA_INFO* info, int suffixMatch);
