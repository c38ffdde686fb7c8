// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/session.h"

#include <cstdlib>

#include "support/no_throw.h"

tavodb_connection* gpDBConnect = nullptr;

namespace mediidx {
namespace {

constexpr const char* kRole = "postgres";
constexpr const char* kDatabase = "mediaserver";

int run(const char* sql) {
  if (!sql) {
    kDatabaseLog.parens(100, "Bad parameters.");
    return -1;
  }
  auto* conn = connect({LogShape::kParens, 101});
  if (!conn) return -1;
  OwnedResult result;
  if (!execute(conn, sql, {LogShape::kParens, 102}, &result)) return -1;
  result.reset();
  return TAVODBAffectedRows(conn, result.get());
}

}  // namespace

tavodb_connection* connect(const Message& failure) {
  auto* conn = MediaDBConnGet();
  if (!conn) {
    kDatabaseLog.error(failure.shape, failure.line, "Failed to connect to database%s",
                       failure.stop);
  }
  return conn;
}

OwnedHandle open_handle() {
  OwnedHandle handle(static_cast<MEDIA_DB_HANDLE*>(std::calloc(1, sizeof(MEDIA_DB_HANDLE))));
  if (!handle) {
    kDatabaseLog.parens(103, "Failed to malloc");
    return nullptr;
  }
  handle->conn = connect({LogShape::kParens, 104});
  return handle->conn ? std::move(handle) : nullptr;
}

bool execute(tavodb_connection* conn, const char* sql, const Message& failure,
             OwnedResult* result) {
  const int status =
      result ? TAVODBExecute(conn, sql, out(*result)) : TAVODBExecute(conn, sql, nullptr);
  if (status != -1) return true;
  kDatabaseLog.error(failure.shape, failure.line, "Failed to exec [%s] (%s)%s", shown(sql),
                     TAVODBErrorGet(conn), failure.stop);
  return false;
}

void log_format_failure(int line) {
  kDatabaseLog.parens(line, "Failed to TLIBCStrGet() [0x%04X %s:%d]",
                      static_cast<unsigned>(TLIBCErrGet()), TLIBCErrorGetFile(),
                      TLIBCErrorGetLine());
}

void log_condition_failure(int line) {
  kDatabaseLog.parens(line, "Failed to TLIBCStrGetEx()[0x%04X %s:%d]",
                      static_cast<unsigned>(TLIBCErrGet()), TLIBCErrorGetFile(),
                      TLIBCErrorGetLine());
}

}  // namespace mediidx

extern "C" tavodb_connection* MediaDBConnGet() {
  if (!gpDBConnect) {
    gpDBConnect = TAVODBConnect(nullptr, mediidx::kRole, nullptr, mediidx::kDatabase);
  }
  return gpDBConnect;
}

extern "C" void MediaDBConnClose() {
  if (!gpDBConnect) return;
  TAVODBClose(gpDBConnect);
  gpDBConnect = nullptr;
}

extern "C" int MediaDBExec(const char* sql) {
  return mediidx::no_throw(mediidx::kDatabaseLog, -1, [&] { return mediidx::run(sql); });
}
