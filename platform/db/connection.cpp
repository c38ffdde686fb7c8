// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "connection.h"

#include <poll.h>

#include <algorithm>
#include <charconv>
#include <cstring>
#include <limits>

#include "border.h"

namespace {

// In one round trip; by statement, as poolers refuse start-up options.
constexpr const char *kSessionSettings =
    "SET client_encoding TO 'UTF8'; SET datestyle TO 'ISO'; SET timezone TO "
    "'UTC'; "
    "SET standard_conforming_strings TO on";

/// Warnings of the server are nobody's to print.
void ignore_notice(void *, const PGresult *) {}

int rows_from(const char *text) {
  long long rows = 0;
  std::from_chars(text, text + std::strlen(text), rows);
  return static_cast<int>(
      std::min<long long>(rows, std::numeric_limits<int>::max()));
}

} // namespace

bool tavodb_connection::is_dead() {
  if (PQstatus(pg.get()) != CONNECTION_OK)
    return true;
  // A server that went away has left its farewell, or an end of file, on the
  // socket: libpq's status alone notices nothing until the next statement is
  // lost.
  pollfd socket{PQsocket(pg.get()), POLLIN, 0};
  if (poll(&socket, 1, 0) <= 0)
    return false;
  if (!PQconsumeInput(pg.get()))
    return true;
  while (PGnotify *note = PQnotifies(pg.get()))
    PQfreemem(note);
  return PQstatus(pg.get()) != CONNECTION_OK;
}

bool tavodb_connection::make_alive() {
  if (!is_dead())
    return true;
  PQreset(pg.get());
  if (PQstatus(pg.get()) == CONNECTION_OK)
    return set_up_session();
  error = PQerrorMessage(pg.get());
  return false;
}

bool tavodb_connection::set_up_session() {
  PQsetNoticeReceiver(pg.get(), ignore_notice, nullptr);
  const tavodb::OwnedPgResult result(PQexec(pg.get(), kSessionSettings));
  if (PQresultStatus(result.get()) == PGRES_COMMAND_OK)
    return true;
  error = PQerrorMessage(pg.get());
  return false;
}

tavodb::OwnedPgResult tavodb_connection::run(const std::string &statement) {
  if (!make_alive())
    return nullptr;
  tavodb::OwnedPgResult result(PQexec(pg.get(), statement.c_str()));
  switch (PQresultStatus(result.get())) {
  case PGRES_TUPLES_OK:
    affected = PQntuples(result.get());
    return result;
  case PGRES_COMMAND_OK:
  case PGRES_EMPTY_QUERY:
    affected = rows_from(PQcmdTuples(result.get()));
    return result;
  default:
    error = PQerrorMessage(pg.get());
    return nullptr;
  }
}

extern "C" tavodb_connection *TAVODBConnect(const char *host, const char *user,
                                            const char *password,
                                            const char *database) {
  return tavodb::guarded(
      static_cast<tavodb_connection *>(nullptr), [&]() -> tavodb_connection * {
        auto conn = std::make_unique<tavodb_connection>();
        const char *names[] = {"host", "user", "password", "dbname", nullptr};
        const char *values[] = {host, user, password, database, nullptr};
        conn->pg.reset(PQconnectdbParams(names, values, 0));
        if (PQstatus(conn->pg.get()) != CONNECTION_OK ||
            !conn->set_up_session())
          return nullptr;
        return conn.release();
      });
}

extern "C" void TAVODBClose(tavodb_connection *conn) { delete conn; }

extern "C" const char *TAVODBErrorGet(tavodb_connection *conn) {
  return conn ? conn->error.c_str() : "";
}

extern "C" int TAVODBDatabaseTypeGet(tavodb_connection *) {
  return TAVODB_TYPE_POSTGRESQL;
}

extern "C" int TAVODBAffectedRows(tavodb_connection *conn, tavodb_result *) {
  return conn ? conn->affected : -1;
}
