// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// How the catalogue's statements are filled, run and reported.
#ifndef MEDIIDX_DATABASE_CATALOGUE_CONNECTION_H_
#define MEDIIDX_DATABASE_CATALOGUE_CONNECTION_H_

#include <tavodb.h>

#include <optional>
#include <type_traits>

#include "database/catalogue_lines.h"
#include "mediidx/record.h"
#include "support/owned.h"
#include "support/statement.h"

namespace mediidx::catalogue {

using Record = __tag_TAVO_MEDIA_INFO;

/// Logs "module:line message"; false, for the caller to return.
bool failed(Line line, const char* message);

/// A caller's open connection. Statements are filled for its database type; one that fails is
/// logged with its text and the connection's error.
class Connection {
 public:
  explicit Connection(tavodb_connection* handle) : handle_(handle) {}

  template <class... Values>
  OwnedText fill(std::type_identity_t<Template<Values...>> statement, Values... values) const {
    return mediidx::fill(TAVODBDatabaseTypeGet(handle_), statement, values...);
  }

  /// False on failure. A text that could not be filled (null) fails like any other.
  bool run(Line line, const OwnedText& sql) const;
  /// The rows, or null on failure.
  OwnedResult select(Line line, const OwnedText& sql) const;
  /// The number of rows that a SELECT finds; empty on failure.
  std::optional<int> count(Line line, const OwnedText& sql) const;

  const char* error() const { return TAVODBErrorGet(handle_); }
  /// Runs without logging a failure, for the one caller that words it in its own way.
  bool run_unlogged(const OwnedText& sql) const;

 private:
  void log_failure(Line line, const OwnedText& sql) const;

  tavodb_connection* handle_;
};

}  // namespace mediidx::catalogue

#endif
