// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/select.h"

#include <cstdlib>
#include <cstring>

#include "database/table_types.h"

namespace mediidx {
namespace {

constexpr int kNotEscaped = 200;
constexpr int kNoClause = 201;
constexpr int kBadTableType = 202;

bool is_empty(const char* text) { return !text || !*text; }

std::optional<Clause> checked(OwnedFormat formatted) {
  if (!formatted) {
    log_format_failure(kNoClause);
    return std::nullopt;
  }
  return Clause{std::move(formatted)};
}

}  // namespace

std::optional<Condition> make_condition(tavodb_connection* conn, const char* where, bool escape) {
  Condition condition;
  if (is_empty(where)) return condition;
  condition.escaped.reset(static_cast<char*>(std::calloc(2 * std::strlen(where) + 1, 1)));
  if (!condition.escaped) return std::nullopt;
  if (escape && EscapeConditionEX(conn, where, condition.escaped.get()) == -1) {
    kDatabaseLog.parens(kNotEscaped, "Failed to escape condition.");
    return std::nullopt;
  }
  condition.keyword = "WHERE";
  condition.text = escape ? condition.escaped.get() : where;
  return condition;
}

std::optional<Clause> make_group_clause(const char* columns) {
  if (is_empty(columns)) return Clause{};
  return checked(OwnedFormat(TLIBCStrGet("GROUP BY %s", columns)));
}

std::optional<Clause> make_order_clause(const char* columns) {
  if (is_empty(columns)) return Clause{};
  return checked(OwnedFormat(TLIBCStrGet("ORDER BY %s", columns)));
}

bool check_selectable(MEDIA_TABLE_TYPE type) {
  if (is_selectable(type)) return true;
  kDatabaseLog.parens(kBadTableType, "Bad table type.");
  return false;
}

}  // namespace mediidx
