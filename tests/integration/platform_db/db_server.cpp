// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "db_server.h"

#include <libpq-fe.h>
#include <unistd.h>

#include <cstdlib>
#include <stdexcept>

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

/// A folder short enough for a socket.
fs::path server_folder() {
  std::string name = "/tmp/mediidx-db-XXXXXX";
  if (!mkdtemp(name.data())) throw std::runtime_error("no temporary folder");
  return name;
}

using OwnedConn = std::unique_ptr<PGconn, decltype(&PQfinish)>;
using OwnedRows = std::unique_ptr<PGresult, decltype(&PQclear)>;

/// Past PQexec, which the program watches.
OwnedRows execute(const std::string& host, const char* database, const std::string& sql) {
  const char* names[] = {"host", "port", "user", "dbname", "client_encoding", "options", nullptr};
  const char* values[] = {host.c_str(),      "5432", "postgres", database, "UTF8",
                          "-c timezone=UTC", nullptr};
  const OwnedConn conn(PQconnectdbParams(names, values, 0), PQfinish);
  if (PQstatus(conn.get()) != CONNECTION_OK) throw std::runtime_error(PQerrorMessage(conn.get()));
  PQsetNoticeProcessor(conn.get(), [](void*, const char*) {}, nullptr);
  OwnedRows rows(PQexecParams(conn.get(), sql.c_str(), 0, nullptr, nullptr, nullptr, nullptr, 0),
                 PQclear);
  const auto status = PQresultStatus(rows.get());
  if (status != PGRES_TUPLES_OK && status != PGRES_COMMAND_OK) {
    throw std::runtime_error(std::string(PQerrorMessage(conn.get())) + " in: " + sql);
  }
  return rows;
}

}  // namespace

DbServer& DbServer::get() {
  static DbServer server;
  return server;
}

DbServer::DbServer() : folder_(server_folder()), server_(folder_) {
  server_.create(true);
  start();
  execute(host(), "postgres", "CREATE DATABASE mediaserver");
  execute(host(), "postgres", "CREATE DATABASE another");
}

DbServer::~DbServer() {
  server_.stop();
  std::error_code ignored;
  fs::remove_all(folder_, ignored);
}

void DbServer::start() { server_.start({"fsync=off", "autovacuum=off", "shared_buffers=16MB"}); }

std::vector<std::vector<std::string>> DbServer::rows(const std::string& sql) const {
  const auto result = execute(host(), "mediaserver", sql);
  std::vector<std::vector<std::string>> rows;
  for (int r = 0; r < PQntuples(result.get()); ++r) {
    auto& row = rows.emplace_back();
    for (int c = 0; c < PQnfields(result.get()); ++c) {
      row.emplace_back(PQgetisnull(result.get(), r, c) ? "<null>" : PQgetvalue(result.get(), r, c));
    }
  }
  return rows;
}

std::string DbServer::value(const std::string& sql) const { return rows(sql).at(0).at(0); }

Environment::~Environment() {
  for (const auto& [name, value] : before_) {
    value ? setenv(name.c_str(), value->c_str(), 1) : unsetenv(name.c_str());
  }
}

void Environment::set(const std::string& name, const std::optional<std::string>& value) {
  const char* now = std::getenv(name.c_str());
  before_.try_emplace(name, now ? std::optional<std::string>(now) : std::nullopt);
  value ? setenv(name.c_str(), value->c_str(), 1) : unsetenv(name.c_str());
}

DbTest::DbTest() {
  for (const char* name :
       {"PGHOST", "PGHOSTADDR", "PGPORT", "PGDATABASE", "PGUSER", "PGSERVICE", "PGOPTIONS",
        "PGDATESTYLE", "PGTZ", "PGCLIENTENCODING", "PGCONNECT_TIMEOUT", "PGSSLMODE"}) {
    environment.set(name, std::nullopt);
  }
  DbServer::get().rows("DROP SCHEMA public CASCADE");
  DbServer::get().rows("CREATE SCHEMA public");
  conn = connect();
  if (!conn) throw std::runtime_error(TAVODBErrorGet(nullptr));
}

OwnedConnection DbTest::connect() const {
  return OwnedConnection(
      TAVODBConnect(DbServer::get().host().c_str(), "postgres", nullptr, "mediaserver"));
}

OwnedRowSet DbTest::run(tavodb_connection* conn, const std::string& sql) {
  tavodb_result* result = nullptr;
  if (TAVODBExecute(conn, sql.c_str(), &result) == -1) {
    throw std::runtime_error(std::string(TAVODBErrorGet(conn)) + " in: " + sql);
  }
  return OwnedRowSet(result);
}

std::vector<std::string> DbTest::column(const std::string& sql, const char* name) {
  const auto result = run(sql);
  std::vector<std::string> texts;
  std::uint32_t row = 0;
  while (TAVODBFetchRow(result.get(), &row) != -1) {
    const char* text = TAVODBFetchField(result.get(), row, name);
    texts.emplace_back(text ? text : "<null>");
  }
  return texts;
}

void DbTest::terminate(const std::string& session) {
  ASSERT_EQ(DbServer::get().value("SELECT pg_terminate_backend(" + session + ", 60000)"), "t");
}

}  // namespace mediidx::test
