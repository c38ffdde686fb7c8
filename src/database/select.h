// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The clauses that every SELECT of the per-type tables is put together from.
#ifndef MEDIIDX_DATABASE_SELECT_H_
#define MEDIIDX_DATABASE_SELECT_H_

#include <optional>

#include "database/session.h"

namespace mediidx {

/// A WHERE clause: its keyword and its condition, both empty when there is none.
struct Condition {
  OwnedText escaped;  ///< What `text` may point into.
  const char* keyword = "";
  const char* text = "";
};

/// Makes a condition of a text, which may be null and otherwise outlives it; the values in it are
/// escaped on demand. Nothing on failure.
std::optional<Condition> make_condition(tavodb_connection* conn, const char* where, bool escape);

/// A clause that is left out without text.
struct Clause {
  OwnedFormat formatted;
  const char* text() const { return formatted ? formatted.get() : ""; }
};

/// "GROUP BY" and "ORDER BY" clauses of texts that may be null; nothing, and logged, on failure.
std::optional<Clause> make_group_clause(const char* columns);
std::optional<Clause> make_order_clause(const char* columns);

/// True, or a message, for a type that can be selected.
bool check_selectable(MEDIA_TABLE_TYPE type);

}  // namespace mediidx

#endif
