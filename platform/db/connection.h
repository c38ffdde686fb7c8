// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The connection and result types behind the handles.
#ifndef TAVODB_CONNECTION_H_
#define TAVODB_CONNECTION_H_

#include <libpq-fe.h>

#include <memory>
#include <string>
#include <unordered_map>

#include "tavodb.h"

namespace tavodb {

struct ClearResult {
  void operator()(PGresult *result) const { PQclear(result); }
};
using OwnedPgResult = std::unique_ptr<PGresult, ClearResult>;

struct FinishConnection {
  void operator()(PGconn *conn) const { PQfinish(conn); }
};
using OwnedPgConnection = std::unique_ptr<PGconn, FinishConnection>;

} // namespace tavodb

/// A connection. `affected` and `error` are those of the last statement.
struct tavodb_connection {
  tavodb::OwnedPgConnection pg;
  int affected = 0;
  std::string error;

  /// Re-establishes a connection that is found dead, once; false when there is
  /// none to be had.
  bool make_alive();
  /// Runs one statement; its rows, or a null pointer on failure.
  tavodb::OwnedPgResult run(const std::string &statement);
  /// The session settings that every caller relies on, whatever the environment
  /// says.
  bool set_up_session();

private:
  bool is_dead();
};

/// The rows of a SELECT, and where the walk over them stands.
struct tavodb_result {
  explicit tavodb_result(tavodb::OwnedPgResult result);

  /// The number of a column; -1 when there is none of this name. Like names in
  /// statements, names are told apart without regard to the case of ASCII
  /// letters.
  int column(const char *name) const;

  tavodb::OwnedPgResult pg;
  uint32_t next = 0;

private:
  std::unordered_map<std::string, int> columns_;
};

#endif
