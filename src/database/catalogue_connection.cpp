// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/catalogue_connection.h"

#include "support/log.h"

namespace mediidx::catalogue {

bool failed(Line line, const char* message) {
  kDatabaseLog.colon(line, "%s", message);
  return false;
}

bool Connection::run_unlogged(const OwnedText& sql) const {
  return TAVODBExecute(handle_, sql.get(), nullptr) != -1;
}

bool Connection::run(Line line, const OwnedText& sql) const {
  if (run_unlogged(sql)) return true;
  log_failure(line, sql);
  return false;
}

OwnedResult Connection::select(Line line, const OwnedText& sql) const {
  OwnedResult rows;
  if (TAVODBExecute(handle_, sql.get(), out(rows)) != -1) return rows;
  log_failure(line, sql);
  return nullptr;
}

std::optional<int> Connection::count(Line line, const OwnedText& sql) const {
  const auto rows = select(line, sql);
  if (!rows) return std::nullopt;
  const int count = TAVODBNumRows(rows.get());
  return count < 0 ? std::nullopt : std::optional(count);
}

void Connection::log_failure(Line line, const OwnedText& sql) const {
  kDatabaseLog.parens(line, "Failed to exec [%s] (%s)", sql ? sql.get() : "(null)", error());
}

}  // namespace mediidx::catalogue
