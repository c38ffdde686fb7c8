// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A real PostgreSQL for tests: one server a test program, a fresh "mediaserver" database a test.
#ifndef MEDIIDX_TESTS_SUPPORT_DATABASE_H_
#define MEDIIDX_TESTS_SUPPORT_DATABASE_H_

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "log_recorder.h"
#include "scratch.h"

namespace mediidx::test {

using Row = std::vector<std::string>;

/// The server of this test program: made and started at the first use, stopped at the end; PGHOST
/// is set to it.
class TestServer {
 public:
  static TestServer& get();
  const std::filesystem::path& socket_folder() const;
  /// Gives an empty "mediaserver" with the schema, made anew where a test changed more than rows;
  /// sessions on it are ended.
  void fresh_database();
  /// `rows_at` this server.
  std::vector<Row> rows(const std::string& sql);
  void stop();
  /// Ends it at once, as a loss of power does to it: sessions and what they did not commit are
  /// gone.
  void crash();
  void start();

 private:
  TestServer();
  ~TestServer();
  struct Parts;
  Parts* parts_;
};

/// Runs a statement on "mediaserver" of the server whose socket is in this folder, over a
/// connection of its own. SQL null reads as "<null>". Throws std::runtime_error with the server's
/// message.
std::vector<Row> rows_at(const std::filesystem::path& socket_folder, const std::string& sql);

/// Statements that the library sent through TAVODBExecute and TAVODBSelectLimit since the last
/// clear, failed ones included. They are also kept for the checks of every statement's plan.
const std::vector<std::string>& sent_statements();
void clear_sent_statements();

/// A test on a fresh database, with a root and an empty log; nothing is indexed until a share is.
class DatabaseTest : public testing::Test {
 protected:
  DatabaseTest();
  ~DatabaseTest() override;

  std::vector<Row> rows(const std::string& sql) { return TestServer::get().rows(sql); }
  /// The one value of a statement.
  std::string value(const std::string& sql);
  long count(const std::string& table, const std::string& where = "true");
  /// Ends every session on "mediaserver", as a server that went away does, and waits for it.
  void cut_connections();

  ScratchRoot root;
};

/// A quoted SQL literal.
std::string quoted(const std::string& text);

}  // namespace mediidx::test

#endif
