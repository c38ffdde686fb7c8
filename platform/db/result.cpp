// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cctype>

#include "border.h"
#include "connection.h"

namespace {

std::string folded(const char *name) {
  std::string text(name);
  std::ranges::transform(text, text.begin(), [](char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
  });
  return text;
}

} // namespace

tavodb_result::tavodb_result(tavodb::OwnedPgResult result)
    : pg(std::move(result)) {
  const int count = PQnfields(pg.get());
  // emplace keeps the first of several columns with one name.
  for (int i = 0; i < count; ++i)
    columns_.emplace(folded(PQfname(pg.get(), i)), i);
}

int tavodb_result::column(const char *name) const {
  const auto found = columns_.find(folded(name));
  return found == columns_.end() ? -1 : found->second;
}

extern "C" int TAVODBNumRows(tavodb_result *result) {
  return result ? PQntuples(result->pg.get()) : 0;
}

extern "C" int TAVODBFetchRow(tavodb_result *result, uint32_t *row) {
  if (!result || !row ||
      result->next >= static_cast<uint32_t>(TAVODBNumRows(result)))
    return -1;
  *row = ++result->next;
  return 0;
}

extern "C" const char *TAVODBFetchField(tavodb_result *result, uint32_t row,
                                        const char *column) {
  if (!result || !column || row == 0 ||
      row > static_cast<uint32_t>(TAVODBNumRows(result))) {
    return nullptr;
  }
  return tavodb::guarded(
      static_cast<const char *>(nullptr), [&]() -> const char * {
        const int number = result->column(column);
        const int index = static_cast<int>(row - 1);
        if (number < 0 || PQgetisnull(result->pg.get(), index, number))
          return nullptr;
        return PQgetvalue(result->pg.get(), index, number);
      });
}

extern "C" int TAVODBSetRowCursor(tavodb_result *result, uint32_t rowNumber) {
  if (!result || rowNumber >= static_cast<uint32_t>(TAVODBNumRows(result)))
    return -1;
  result->next = rowNumber;
  return 0;
}

extern "C" void TAVODBFreeResult(tavodb_result *result) { delete result; }
