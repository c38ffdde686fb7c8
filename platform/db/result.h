// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The rows that a statement returned.
#ifndef TAVODB_RESULT_H_
#define TAVODB_RESULT_H_

#include <libpq-fe.h>
#include <tavodb.h>

#include <memory>
#include <optional>
#include <string_view>
#include <unordered_map>

namespace mediidx::platform {

struct ClearRows {
  void operator()(PGresult* rows) const noexcept { PQclear(rows); }
};
using OwnedRows = std::unique_ptr<PGresult, ClearRows>;

/// Rows, the place of each column and the row to be fetched next.
class Result {
 public:
  explicit Result(OwnedRows rows);

  int size() const { return PQntuples(rows_.get()); }
  /// Moves to the next row; its cursor (the row's number plus one), or 0 behind the last.
  std::uint32_t next();
  /// False when there is no row of this number.
  bool set_next(std::uint32_t row);
  /// A field of the row that a cursor stands for; null when there is no such row or column, and
  /// for SQL null. A name that no column has stands for the one that the server makes of it, as in
  /// a statement: "resolutionX" for resolutionx.
  const char* field(std::uint32_t cursor, std::string_view column);

 private:
  /// At the first look-up: most results of a write are only counted.
  void number_columns();
  std::optional<int> find(std::string_view column);

  OwnedRows rows_;
  std::unordered_map<std::string_view, int> columns_;  ///< By the names in `rows_`.
  int next_ = 0;
};

}  // namespace mediidx::platform

struct tavodb_result : mediidx::platform::Result {
  using Result::Result;
};

#endif
