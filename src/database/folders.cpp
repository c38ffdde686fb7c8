// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Folder rows, of everyone's folders and of personal libraries.
#include "database/record.h"
#include "database/session.h"
#include "mediidx/catalogue.h"
#include "support/no_throw.h"
#include "support/statement.h"

namespace mediidx {
namespace {

using Text = const char*;
using Long = std::int64_t;

constexpr Template<Text, Text, Text, Text, Text> kInsert{
    "INSERT INTO directory(path, title, date, mdate, fs_uuid) "
    "VALUES('@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR')"};
constexpr Template<Text, Text, Text, Text, Text> kUpdate{
    "UPDATE directory "
    "SET title = '@TAVO:VAR', date = '@TAVO:VAR', mdate = '@TAVO:VAR', fs_uuid = '@TAVO:VAR' "
    "WHERE path = '@TAVO:VAR'"};
constexpr Template<Long, Text, Text, Text, Text, Text> kInsertPersonal{
    "INSERT INTO personal_directory (userid, path, title, date, mdate, fs_uuid, updated) "
    "VALUES(@TAVO:LLINT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', "
    "'1')"};
constexpr Template<Long, Text, Text, Text, Text, Text> kUpdatePersonal{
    "UPDATE personal_directory "
    "SET userid = @TAVO:LLINT, title = '@TAVO:VAR', date = '@TAVO:VAR', mdate = '@TAVO:VAR', "
    "fs_uuid = '@TAVO:VAR', updated = '1' "
    "WHERE path = '@TAVO:VAR'"};

constexpr int kBadParameter = 480;
constexpr int kNoConnection = 481;
constexpr int kNoCondition = 482;
constexpr int kNotExecuted = 483;

OwnedText personal_statement(tavodb_connection* conn, const DIR_INFO_REC& dir, Long userid) {
  const char* date = date_or_epoch(dir.date);
  const char* mdate = date_or_epoch(dir.mdate);
  if (MediaDBFindPersonalDirWithSamePath(conn, dir.path) > 0) {
    return fill(kDatabaseType, kUpdatePersonal, userid, dir.title, date, mdate, dir.fs_uuid,
                dir.path);
  }
  return fill(kDatabaseType, kInsertPersonal, userid, dir.path, dir.title, date, mdate,
              dir.fs_uuid);
}

/// True when there is a row of this path; the count escapes the path within the condition.
bool is_stored(const char* condition) {
  return MediaInfoDBGetCount(MEDIA_TABLE_DIRECTORY, "*", condition, "", 1) > 0;
}

OwnedText shared_statement(const DIR_INFO_REC& dir, const char* condition) {
  const char* date = date_or_epoch(dir.date);
  const char* mdate = date_or_epoch(dir.mdate);
  if (is_stored(condition)) {
    return fill(kDatabaseType, kUpdate, dir.title, date, mdate, dir.fs_uuid, dir.path);
  }
  return fill(kDatabaseType, kInsert, dir.path, dir.title, date, mdate, dir.fs_uuid);
}

int save(const DIR_INFO_REC& dir) {
  const auto userid = owner_of(dir.path);
  auto* conn = connect({LogShape::kParens, kNoConnection});
  if (!conn) return -1;
  OwnedText sql;
  if (userid != 0) {
    sql = personal_statement(conn, dir, userid);
  } else {
    const OwnedFormat condition(TLIBCStrGet(" path='%s' ", dir.path));
    if (!condition) {
      log_format_failure(kNoCondition);
      return -1;
    }
    sql = shared_statement(dir, condition.get());
  }
  return execute(conn, sql.get(), {LogShape::kParens, kNotExecuted}) ? 0 : -1;
}

}  // namespace
}  // namespace mediidx

extern "C" int DirInfoDBSave(const DIR_INFO_REC* dirInfo) {
  using mediidx::kDatabaseLog;
  return mediidx::no_throw(kDatabaseLog, -1, [&] {
    if (!dirInfo) {
      kDatabaseLog.parens(mediidx::kBadParameter, "Bad parameter");
      return -1;
    }
    return mediidx::save(*dirInfo);
  });
}
