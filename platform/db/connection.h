// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// One session with the server, taken up again when it is found dead.
#ifndef TAVODB_CONNECTION_H_
#define TAVODB_CONNECTION_H_

#include <libpq-fe.h>
#include <tavodb.h>

#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "result.h"

namespace mediidx::platform {

struct FinishConnection {
  void operator()(PGconn* conn) const noexcept { PQfinish(conn); }
};

class Connection {
 public:
  /// Connects and settles the session; null values are libpq's own. Throws std::runtime_error with
  /// the reason.
  Connection(const char* host, const char* user, const char* password, const char* database);
  Connection(const Connection&) = delete;
  Connection& operator=(const Connection&) = delete;

  /// Sends one statement, once. Null, with the reason in error(), when it failed or could not be
  /// sent. Before it is sent, a session found dead is taken up again; but not within a transaction,
  /// whose earlier statements are lost: this one fails and the next starts afresh.
  OwnedRows run(const std::string& statement);
  /// The same with values for "$1" and so on, null for SQL null.
  OwnedRows run(const std::string& statement, std::span<const char* const> values);
  /// The same for "COPY … FROM STDIN" and its rows; false when it failed.
  bool copy(const std::string& statement, std::string_view rows);

  /// As the last statement left it.
  bool in_transaction() const { return in_transaction_; }
  /// Rows that the last statement touched or returned; -1 when it failed.
  int affected_rows() const { return affected_rows_; }
  void set_affected_rows(int count) { affected_rows_ = count; }
  /// The reason of the last failure.
  const std::string& error() const { return error_; }
  void set_error(std::string_view message);

 private:
  bool is_alive();
  bool make_alive();
  bool settle();
  OwnedRows take(PGresult* answer);
  static void receive_notice(void* connection, const PGresult* notice);

  std::unique_ptr<PGconn, FinishConnection> conn_;
  std::string error_;
  int affected_rows_ = 0;
  bool was_dismissed_ = false;  ///< The server said that it ends the session.
  bool in_transaction_ = false;
};

}  // namespace mediidx::platform

struct tavodb_connection : mediidx::platform::Connection {
  using Connection::Connection;
};

#endif
