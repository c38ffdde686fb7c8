/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// The PostgreSQL client layer (libtavodb).
///
/// Calls return -1 or null on failure unless said otherwise, and leave the reason to
/// TAVODBErrorGet. A connection and its results belong to one thread at a time.
#ifndef TAVODB_H_
#define TAVODB_H_

#include <stddef.h>
#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

#define TAVODB_EXPORT __attribute__((visibility("default")))

struct tavodb_connection;
struct tavodb_result;

/// The value of TAVODBDatabaseTypeGet for PostgreSQL.
enum { TAVODB_TYPE_POSTGRESQL = 1 };

/* Connection */

/// Connects. Null host and password mean libpq's own settings. Sets, by statement, client encoding
/// UTF-8, ISO dates, time zone UTC and standard-conforming strings. Null on failure.
TAVODB_EXPORT struct tavodb_connection* TAVODBConnect(const char* host, const char* user,
                                                      const char* password, const char* database);
/// Closes the connection; null is ignored.
TAVODB_EXPORT void TAVODBClose(struct tavodb_connection* conn);
/// The text of the last error, never null; valid until the next call on the connection. For a null
/// connection, why this thread's last TAVODBConnect failed.
TAVODB_EXPORT const char* TAVODBErrorGet(struct tavodb_connection* conn);
/// The kind of database, to be passed to the escaping calls.
TAVODB_EXPORT int TAVODBDatabaseTypeGet(struct tavodb_connection* conn);

/* Statements */

/// Runs the statements of a text one after another, each on its own, up to the first that fails;
/// what went before it stays. `*result` (which may be a null pointer) receives the rows of the last
/// statement, or null when it returns none. A connection found dead before a statement is sent is
/// re-established once; a statement that may have reached the server is never sent again.
TAVODB_EXPORT int TAVODBExecute(struct tavodb_connection* conn, const char* sql,
                                struct tavodb_result** result);
/// Runs one SELECT for at most `limit` rows after the first `offset`; a limit of 0 means all. With
/// both 0 the text is run as it is.
TAVODB_EXPORT int TAVODBSelectLimit(struct tavodb_connection* conn, const char* sql, uint32_t limit,
                                    uint32_t offset, struct tavodb_result** result);
/// Rows touched by the connection's last statement. `result` is not looked at and may be freed.
TAVODB_EXPORT int TAVODBAffectedRows(struct tavodb_connection* conn, struct tavodb_result* result);

/* Results */

TAVODB_EXPORT int TAVODBNumRows(struct tavodb_result* result);
/// Moves to the next row and stores its cursor (never 0) for TAVODBFetchField; -1 after the last.
TAVODB_EXPORT int TAVODBFetchRow(struct tavodb_result* result, uint32_t* row);
/// The text of a column of a fetched row, valid until the result is freed; null when the column is
/// absent or SQL null. Of several columns with one name the first counts. A name that no column has
/// is looked up in small letters too, which is how the server names a column without quotes.
TAVODB_EXPORT const char* TAVODBFetchField(struct tavodb_result* result, uint32_t row,
                                           const char* column);
/// Makes the next fetch return the row of this number, counted from 0; -1 when there is none.
TAVODB_EXPORT int TAVODBSetRowCursor(struct tavodb_result* result, uint32_t rowNumber);
/// Frees a result; null is ignored.
TAVODB_EXPORT void TAVODBFreeResult(struct tavodb_result* result);

/* Text */

/// Fills a statement template in one pass. Each placeholder takes one argument, in order:
/// "@TAVO:VAR" a string, escaped for a quoted literal; "@TAVO:LVAR" a string that matches itself in
/// a LIKE pattern within a quoted literal; "@TAVO:NEVAR" a string as it stands; "@TAVO:INT" an int;
/// "@TAVO:LLINT" a long long. Text that a value brings is never looked at again. Returns a text for
/// free(), or null: for a null template or string, an unknown placeholder, an unknown database
/// type, or without memory.
TAVODB_EXPORT char* TAVODBEscapeStringEX3(int databaseType, const char* sql, ...);
/// Escapes `length` bytes for a quoted literal. `destination` holds 2 x length + 1 bytes.
TAVODB_EXPORT int TAVODBEscapeString(char* destination, const char* source, size_t length);
/// The same for a database type, with the size of the destination; -1 when it is too small.
TAVODB_EXPORT int TAVODBEscapeStringEX2(int databaseType, char* destination, size_t size,
                                        const char* source, size_t length);
/// Makes a text that TAVODBEscapeString escaped match itself in a LIKE pattern, by a backslash
/// before each backslash, "%" and "_". A destination of 3 x length + 1 bytes always suffices; -1
/// otherwise.
TAVODB_EXPORT int TAVODBEscapeBackslash(char* destination, size_t size, const char* source);
/// The same for a database type.
TAVODB_EXPORT int TAVODBEscapeBackslashEX2(int databaseType, char* destination, size_t size,
                                           const char* source);
/// Escapes the values within a condition of the form " column='value' " so that it stays one
/// comparison with one literal, whatever the value holds: the value reaches from the first quote to
/// the last. -1 for a single quote, which ends no value; without quotes the text is copied.
/// `destination` holds 2 x length + 1 bytes.
TAVODB_EXPORT int EscapeConditionEX(struct tavodb_connection* conn, const char* condition,
                                    char* destination);

#ifdef __cplusplus
}
#endif

#endif
