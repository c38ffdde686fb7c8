/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// Calls of libtavodb for many rows at once, which the appliance's own does not have.
///
/// They follow the conventions of tavodb.h.
#ifndef TAVODBBULK_H_
#define TAVODBBULK_H_

#include <tavodb.h>

#ifdef __cplusplus
extern "C" {
#endif

/// Runs one statement whose values stand apart from it, as "$1" and so on: `count` texts, null for
/// SQL null. An array is a text too ('{"a","b"}'), and cast in the statement. `*result` (which may
/// be a null pointer) is set as by TAVODBExecute.
TAVODB_EXPORT int TAVODBExecuteParams(struct tavodb_connection* conn, const char* sql, int count,
                                      const char* const* values, struct tavodb_result** result);
/// Runs one "COPY … FROM STDIN" with its rows: `length` bytes of COPY's text format. All rows are
/// written, or none.
TAVODB_EXPORT int TAVODBCopy(struct tavodb_connection* conn, const char* sql, const char* rows,
                             size_t length);
/// 1 while the connection is within a transaction that somebody began, also one that has failed;
/// 0 otherwise.
TAVODB_EXPORT int TAVODBInTransaction(struct tavodb_connection* conn);

#ifdef __cplusplus
}
#endif

#endif
