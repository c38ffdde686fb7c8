// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "store/database.h"

#include <charconv>
#include <cstdlib>
#include <stdexcept>

#include "mediidx/database.h"
#include "store/schema_text.h"

namespace mediidx::tool {
namespace {

constexpr const char* kServerVariables[] = {"PGHOST", "PGHOSTADDR", "PGPORT", "PGSERVICE",
                                            "PGDATABASE"};

constexpr const char* kDatabaseName = "mediaserver";
constexpr const char* kRole = "postgres";

constexpr const char* kSelectDatabase =
    "SELECT datname FROM pg_catalog.pg_database WHERE datname = 'mediaserver'";

constexpr const char* kCreateDatabase =
    "CREATE DATABASE mediaserver "
    "ENCODING 'UTF8' LC_COLLATE 'C' LC_CTYPE 'C.UTF-8' TEMPLATE template0";

constexpr const char* kSelectVersionTable =
    "SELECT 1 AS found WHERE to_regclass('mediidx.schema_version') IS NOT NULL";

constexpr const char* kSelectVersion =
    "SELECT coalesce(max(version), 0) AS version FROM mediidx.schema_version";

// Two commands at once: the second waits, and finds everything there. Any number will do.
constexpr const char* kLockSchema = "SELECT pg_advisory_lock(6334280)";
constexpr const char* kUnlockSchema = "SELECT pg_advisory_unlock(6334280)";

struct CloseConnection {
  void operator()(tavodb_connection* conn) const { TAVODBClose(conn); }
};
using OwnedConnection = std::unique_ptr<tavodb_connection, CloseConnection>;

std::string trimmed(std::string text) {
  text.erase(text.find_last_not_of(" \n\r\t") + 1);
  return text;
}

std::string error_of(tavodb_connection* conn) { return trimmed(TAVODBErrorGet(conn)); }

Rows query_on(tavodb_connection* conn, const std::string& sql) {
  tavodb_result* result = nullptr;
  if (TAVODBExecute(conn, sql.c_str(), &result) < 0) throw std::runtime_error(error_of(conn));
  return Rows(result);
}

/// A connection to a database that every server has.
OwnedConnection connect_to_server() {
  for (const char* name : {"postgres", "template1"}) {
    if (OwnedConnection conn{TAVODBConnect(nullptr, kRole, nullptr, name)}) return conn;
  }
  const auto reason = error_of(nullptr);
  throw std::runtime_error("no connection to the database server as the role postgres" +
                           (reason.empty() ? "" : ": " + reason));
}

}  // namespace

bool has_configured_server() {
  for (const char* name : kServerVariables) {
    if (std::getenv(name)) return true;
  }
  return false;
}

bool Rows::next() { return result_ && TAVODBFetchRow(result_.get(), &row_) == 0; }

std::string Rows::text(const char* column) const {
  const char* value = TAVODBFetchField(result_.get(), row_, column);
  return value ? value : "";
}

std::int64_t Rows::number(const char* column) const {
  const char* value = TAVODBFetchField(result_.get(), row_, column);
  return value ? std::strtoll(value, nullptr, 10) : 0;
}

bool Rows::is_null(const char* column) const {
  return TAVODBFetchField(result_.get(), row_, column) == nullptr;
}

std::string schema_statements(std::string_view schema) {
  std::string out;
  while (!schema.empty()) {
    const auto end = schema.find('\n');
    const auto line = schema.substr(0, end);
    const auto first = line.find_first_not_of(' ');
    const bool is_comment = first == std::string_view::npos || line.substr(first).starts_with("--");
    if (!is_comment) out += std::string(line) + "\n";
    schema.remove_prefix(end == std::string_view::npos ? schema.size() : end + 1);
  }
  return out;
}

Database::Database(const DataFolder& folder) : folder_(folder.path()) {
  try {
    if (!has_configured_server()) start_server();
    connect();
    if (version() < kSchemaVersion) apply_schema();
    if (version() > kSchemaVersion) {
      throw std::runtime_error("the database was made by a newer mediidx");
    }
  } catch (const std::exception& error) {
    MediaDBConnClose();
    throw NoDatabase(error.what());
  }
}

void Database::start_server() {
  server_ = std::make_unique<PrivateServer>(folder_);
  setenv("PGHOST", server_->socket_folder().c_str(), 1);
}

bool Database::reconnect() {
  MediaDBConnClose();
  try {
    if (server_) {
      server_.reset();
      start_server();
    }
    return answers();
  } catch (const std::runtime_error&) {
    return false;
  }
}

Database::~Database() { MediaDBConnClose(); }

void Database::connect() {
  // The library's connection goes to "mediaserver", and cannot tell why it fails.
  if (const OwnedConnection conn{TAVODBConnect(nullptr, kRole, nullptr, kDatabaseName)}; !conn) {
    make_database();
  }
  if (!MediaDBConnGet()) throw std::runtime_error("no connection to the database mediaserver");
}

void Database::make_database() {
  const auto conn = connect_to_server();
  if (query_on(conn.get(), kSelectDatabase).next()) return;
  if (TAVODBExecute(conn.get(), kCreateDatabase, nullptr) >= 0) return;
  const auto reason = error_of(conn.get());
  // Another command may have been quicker.
  if (query_on(conn.get(), kSelectDatabase).next()) return;
  throw std::runtime_error("the database mediaserver could not be created: " + reason);
}

void Database::apply_schema() {
  run(kLockSchema);
  if (version() < kSchemaVersion) {
    try {
      run(schema_statements(kSchemaText));
    } catch (const std::runtime_error& error) {
      throw std::runtime_error(std::string("the tables could not be made: ") + error.what());
    }
    was_changed_ = true;
  }
  run(kUnlockSchema);
}

int Database::version() {
  if (!query(kSelectVersionTable).next()) return 0;
  auto rows = query(kSelectVersion);
  if (!rows.next()) return 0;
  const auto text = rows.text("version");
  int version = 0;
  std::from_chars(text.data(), text.data() + text.size(), version);
  return version;
}

Rows Database::query(const std::string& sql) {
  auto* conn = MediaDBConnGet();
  if (!conn) throw std::runtime_error("no connection to the database mediaserver");
  return query_on(conn, sql);
}

int Database::run(const std::string& sql) {
  query(sql);
  return TAVODBAffectedRows(gpDBConnect, nullptr);
}

bool Database::answers() {
  try {
    return query("SELECT 1 AS one").next();
  } catch (const std::runtime_error&) {
    return false;
  }
}

std::string Database::last_error() const { return gpDBConnect ? error_of(gpDBConnect) : ""; }

std::string Database::where() const {
  if (server_) return "mediaserver on the private server at " + server_->socket_folder().string();
  const char* host = std::getenv("PGHOST");
  return std::string("mediaserver on ") + (host ? host : "the server that the environment names");
}

}  // namespace mediidx::tool
