// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "result.h"

#include <algorithm>
#include <string>

#include "border.h"

namespace mediidx::platform {
namespace {

bool is_capital(char c) { return c >= 'A' && c <= 'Z'; }

/// What the server makes of a name without quotes.
std::string folded(std::string_view name) {
  std::string text(name);
  for (char& c : text) {
    if (is_capital(c)) c = static_cast<char>(c - 'A' + 'a');
  }
  return text;
}

}  // namespace

Result::Result(OwnedRows rows) : rows_(std::move(rows)) {}

std::uint32_t Result::next() { return next_ < size() ? static_cast<std::uint32_t>(++next_) : 0; }

bool Result::set_next(std::uint32_t row) {
  if (row >= static_cast<std::uint32_t>(size())) return false;
  next_ = static_cast<int>(row);
  return true;
}

void Result::number_columns() {
  const int count = PQnfields(rows_.get());
  columns_.reserve(static_cast<std::size_t>(count));
  // Of several columns of one name the first keeps its place.
  for (int column = 0; column < count; ++column) {
    columns_.try_emplace(PQfname(rows_.get(), column), column);
  }
}

std::optional<int> Result::find(std::string_view column) {
  if (columns_.empty()) number_columns();
  auto found = columns_.find(column);
  if (found == columns_.end() && std::ranges::any_of(column, is_capital)) {
    found = columns_.find(folded(column));
  }
  return found == columns_.end() ? std::nullopt : std::optional(found->second);
}

const char* Result::field(std::uint32_t cursor, std::string_view column) {
  if (cursor == 0 || cursor > static_cast<std::uint32_t>(size())) return nullptr;
  const auto number = find(column);
  const int row = static_cast<int>(cursor - 1);
  if (!number || PQgetisnull(rows_.get(), row, *number)) return nullptr;
  return PQgetvalue(rows_.get(), row, *number);
}

}  // namespace mediidx::platform

extern "C" int TAVODBNumRows(tavodb_result* result) { return result ? result->size() : -1; }

extern "C" int TAVODBFetchRow(tavodb_result* result, uint32_t* row) {
  if (!result || !row) return -1;
  const auto cursor = result->next();
  if (cursor == 0) return -1;
  *row = cursor;
  return 0;
}

extern "C" const char* TAVODBFetchField(tavodb_result* result, uint32_t row, const char* column) {
  return mediidx::platform::no_throw<const char*>(
      nullptr, [&] { return result && column ? result->field(row, column) : nullptr; });
}

extern "C" int TAVODBSetRowCursor(tavodb_result* result, uint32_t rowNumber) {
  return result && result->set_next(rowNumber) ? 0 : -1;
}

extern "C" void TAVODBFreeResult(tavodb_result* result) { delete result; }
