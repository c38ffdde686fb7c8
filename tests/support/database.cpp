// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database.h"

#include <libpq-fe.h>
#include <signal.h>
#include <unistd.h>

#include <cstdlib>
#include <fstream>
#include <iterator>
#include <memory>
#include <stdexcept>

#include "mediidx/database.h"
#include "postgres_server.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

/// A folder short enough for a socket and open to the user that the server runs as.
fs::path server_folder() {
  std::string name = "/tmp/mediidx-pg-XXXXXX";
  if (!mkdtemp(name.data())) throw std::runtime_error("no temporary folder");
  return name;
}

/// Speed over safety: the data of a test are gone in a second anyway.
const std::vector<std::string> kSettings{
    "fsync=off",
    "synchronous_commit=off",
    "full_page_writes=off",
    "shared_buffers=64MB",
    "max_connections=40",
    "autovacuum=off",
    "jit=off",
};

struct Connection {
  explicit Connection(const fs::path& host, const char* database) {
    const char* names[] = {"host", "user", "dbname", "client_encoding", nullptr};
    const char* values[] = {host.c_str(), "postgres", database, "UTF8", nullptr};
    conn = PQconnectdbParams(names, values, 0);
    if (PQstatus(conn) != CONNECTION_OK) {
      const std::string message = PQerrorMessage(conn);
      PQfinish(conn);
      throw std::runtime_error(message);
    }
    PQsetNoticeProcessor(conn, [](void*, const char*) {}, nullptr);
  }
  ~Connection() { PQfinish(conn); }
  Connection(const Connection&) = delete;
  Connection& operator=(const Connection&) = delete;

  std::vector<Row> run(const std::string& sql) const {
    const std::unique_ptr<PGresult, decltype(&PQclear)> result(PQexec(conn, sql.c_str()), PQclear);
    const auto status = PQresultStatus(result.get());
    if (status != PGRES_TUPLES_OK && status != PGRES_COMMAND_OK) {
      throw std::runtime_error(std::string(PQerrorMessage(conn)) + " in: " + sql);
    }
    std::vector<Row> rows;
    for (int r = 0; r < PQntuples(result.get()); ++r) {
      Row row;
      for (int c = 0; c < PQnfields(result.get()); ++c) {
        row.emplace_back(PQgetisnull(result.get(), r, c) ? "<null>"
                                                         : PQgetvalue(result.get(), r, c));
      }
      rows.push_back(std::move(row));
    }
    return rows;
  }

  PGconn* conn;
};

/// Waits until they have ended.
constexpr const char* kEndSessions =
    "SELECT pg_terminate_backend(pid, 10000) FROM pg_stat_activity WHERE datname = 'mediaserver'";

/// Everything of a database but the rows of its tables, as one text.
constexpr const char* kFingerprint =
    "SELECT md5(concat("
    "(SELECT string_agg(concat(c.relname, c.relkind, a.attname, a.atttypid, a.attnotnull), ',' "
    "ORDER BY c.relname, a.attnum) FROM pg_class c JOIN pg_attribute a ON a.attrelid = c.oid "
    "WHERE c.relnamespace IN ('public'::regnamespace, 'mediidx'::regnamespace, "
    "'scan'::regnamespace)), "
    "(SELECT count(*) FROM pg_trigger), (SELECT count(*) FROM pg_rules), "
    "(SELECT count(*) FROM pg_proc), (SELECT count(*) FROM pg_constraint), "
    "(SELECT count(*) FROM pg_namespace), (SELECT count(*) FROM pg_db_role_setting), "
    "(SELECT string_agg(version::text, ',') FROM mediidx.schema_version)))";

/// Deleted rows stay on disk until a database is made anew.
constexpr long kLargestReused = 24'000'000;

constexpr const char* kDeleteRows =
    "DO $$ DECLARE name text; BEGIN "
    "FOR name IN SELECT format('%I.%I', schemaname, tablename) FROM pg_tables "
    "WHERE schemaname IN ('public', 'scan') LOOP "
    "EXECUTE 'DELETE FROM ' || name; END LOOP; END $$; "
    "SELECT setval(oid::regclass, 1, false) FROM pg_class "
    "WHERE relkind = 'S' AND relnamespace = 'public'::regnamespace";

std::string fingerprint(const Connection& database) { return database.run(kFingerprint)[0][0]; }

/// Empties the tables of a database that is still as `made`; false when it has to be made anew.
bool empty_again(const fs::path& host, const std::string& made) {
  try {
    const Connection database(host, "mediaserver");
    const auto size = database.run("SELECT pg_database_size('mediaserver')")[0][0];
    if (std::stol(size) > kLargestReused || fingerprint(database) != made) return false;
    database.run(kDeleteRows);
    return true;
  } catch (const std::runtime_error&) {
    return false;  // not there, or not as it was
  }
}

std::string read_schema() {
  std::ifstream in(MEDIIDX_SCHEMA);
  std::string text(std::istreambuf_iterator<char>(in), {});
  if (text.empty()) throw std::runtime_error("cannot read " MEDIIDX_SCHEMA);
  return text;
}

}  // namespace

struct TestServer::Parts {
  fs::path folder = server_folder();
  tool::PostgresServer server{folder};
  std::string made;  ///< The fingerprint of the template.
};

TestServer& TestServer::get() {
  static TestServer server;
  return server;
}

TestServer::TestServer() : parts_(new Parts) {
  parts_->server.create(true);
  start();
  setenv("PGHOST", socket_folder().c_str(), 1);
  unsetenv("PGPORT");
  Connection(socket_folder(), "postgres").run("CREATE DATABASE mediaserver_template");
  const Connection database(socket_folder(), "mediaserver_template");
  database.run(read_schema());
  parts_->made = fingerprint(database);
}

TestServer::~TestServer() {
  parts_->server.stop();
  std::error_code ignored;
  fs::remove_all(parts_->folder, ignored);
  delete parts_;
}

const fs::path& TestServer::socket_folder() const { return parts_->server.socket_folder(); }
void TestServer::start() { parts_->server.start(kSettings); }
void TestServer::stop() { parts_->server.stop(); }

void TestServer::crash() {
  if (const auto server = parts_->server.running()) kill(*server, SIGQUIT);
  stop();
}

void TestServer::fresh_database() {
  const Connection admin(socket_folder(), "postgres");
  admin.run(kEndSessions);
  // Deleting the few rows of a test is a fraction of making a database.
  if (empty_again(socket_folder(), parts_->made)) return;
  admin.run("DROP DATABASE IF EXISTS mediaserver WITH (FORCE)");
  admin.run("CREATE DATABASE mediaserver TEMPLATE mediaserver_template");
}

std::vector<Row> TestServer::rows(const std::string& sql) { return rows_at(socket_folder(), sql); }

std::vector<Row> rows_at(const fs::path& socket_folder, const std::string& sql) {
  return Connection(socket_folder, "mediaserver").run(sql);
}

DatabaseTest::DatabaseTest() {
  MediaDBConnClose();
  TestServer::get().fresh_database();
  clear_log();
  clear_sent_statements();
}

DatabaseTest::~DatabaseTest() { MediaDBConnClose(); }

std::string DatabaseTest::value(const std::string& sql) {
  const auto result = rows(sql);
  if (result.size() != 1 || result[0].size() != 1) {
    throw std::runtime_error(std::to_string(result.size()) + " rows, not one value: " + sql);
  }
  return result[0][0];
}

long DatabaseTest::count(const std::string& table, const std::string& where) {
  return std::stol(value("SELECT count(*) FROM " + table + " WHERE " + where));
}

void DatabaseTest::cut_connections() {
  Connection(TestServer::get().socket_folder(), "postgres").run(kEndSessions);
}

std::string quoted(const std::string& text) {
  std::string out = "'";
  for (const char c : text) {
    if (c == '\'') out += '\'';
    out += c;
  }
  return out + "'";
}

}  // namespace mediidx::test
