// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A real server for the database client: a "mediaserver" database without tables.
#ifndef MEDIIDX_TESTS_PLATFORM_DB_DB_SERVER_H_
#define MEDIIDX_TESTS_PLATFORM_DB_DB_SERVER_H_

#include <gtest/gtest.h>
#include <postgres_server.h>
#include <tavodb.h>

#include <filesystem>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace mediidx::test {

/// The server of this program: made and started at the first use, stopped at the end.
class DbServer {
 public:
  static DbServer& get();
  ~DbServer();
  std::string host() const { return server_.socket_folder(); }
  void start();
  void stop() { server_.stop(); }
  /// Runs a statement on a connection of its own, past the library under test, and returns its
  /// rows, SQL null as "<null>". Throws std::runtime_error with the server's message.
  std::vector<std::vector<std::string>> rows(const std::string& sql) const;
  /// The one value of such a statement.
  std::string value(const std::string& sql) const;

 private:
  DbServer();
  std::filesystem::path folder_;
  tool::PostgresServer server_;
};

/// Sets environment variables while it lives.
class Environment {
 public:
  ~Environment();
  void set(const std::string& name, const std::optional<std::string>& value);

 private:
  std::map<std::string, std::optional<std::string>> before_;
};

struct CloseConnection {
  void operator()(tavodb_connection* conn) const { TAVODBClose(conn); }
};
struct FreeResult {
  void operator()(tavodb_result* result) const { TAVODBFreeResult(result); }
};
using OwnedConnection = std::unique_ptr<tavodb_connection, CloseConnection>;
using OwnedRowSet = std::unique_ptr<tavodb_result, FreeResult>;

/// A test with a connection to a database without tables, in an environment without settings.
class DbTest : public testing::Test {
 protected:
  DbTest();

  OwnedConnection connect() const;
  /// Runs a text that is to succeed; its rows, if the last statement returned some.
  OwnedRowSet run(const std::string& sql) { return run(conn.get(), sql); }
  static OwnedRowSet run(tavodb_connection* conn, const std::string& sql);
  /// The first column of all rows of a text.
  std::vector<std::string> column(const std::string& sql, const char* name = "value");
  std::string value(const std::string& sql) { return column(sql).at(0); }
  /// Whether a text runs.
  bool runs(const std::string& sql) {
    return TAVODBExecute(conn.get(), sql.c_str(), nullptr) != -1;
  }
  std::string error() const { return TAVODBErrorGet(conn.get()); }
  /// The session of `conn` on the server.
  std::string session() { return value("SELECT pg_backend_pid() AS value"); }
  /// Ends sessions on the server and waits until they are gone.
  void terminate(const std::string& session);

  Environment environment;
  OwnedConnection conn;
};

/// A filled template as a string; throws when it cannot be filled.
template <class... Values>
std::string filled(const char* sql, Values... values) {
  char* text = TAVODBEscapeStringEX3(TAVODB_TYPE_POSTGRESQL, sql, values...);
  const std::unique_ptr<char, void (*)(void*)> owner(text, std::free);
  return std::string(text);
}

}  // namespace mediidx::test

#endif
