// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the operations on the shared connection have in common: connecting, handles, running a
/// statement, and the messages when one of these fails.
#ifndef MEDIIDX_DATABASE_SESSION_H_
#define MEDIIDX_DATABASE_SESSION_H_

#include "mediidx/database.h"
#include "support/log.h"
#include "support/owned.h"

namespace mediidx {

using OwnedHandle = Owned<MEDIA_DB_HANDLE, MediaInfoDBClose>;

/// The database type that the per-type tables pass to a template instead of asking the connection.
inline constexpr int kDatabaseType = TAVODB_TYPE_POSTGRESQL;

/// How a failure is logged: its message's shape and line, and what ends the sentence.
struct Message {
  LogShape shape;
  int line;
  const char* stop = "";
};

/// The shared connection; null, and logged, when there is none to be had.
tavodb_connection* connect(const Message& failure);

/// A handle on the shared connection, without a result yet; null, and logged, on failure.
OwnedHandle open_handle();

/// Runs a text of one or more statements, null among them (which fails); a failure is logged with
/// the text and the database's reason. `result` may be null when the rows are of no interest.
bool execute(tavodb_connection* conn, const char* sql, const Message& failure,
             OwnedResult* result = nullptr);

/// Logs that a formatted text could not be built, with the platform's error.
void log_format_failure(int line);
/// The same for a condition.
void log_condition_failure(int line);

constexpr const char* text_or(const char* text, const char* fallback) {
  return text && *text ? text : fallback;
}

/// A text for a log line, which may be null.
constexpr const char* shown(const char* text) { return text ? text : "(null)"; }

}  // namespace mediidx

#endif
