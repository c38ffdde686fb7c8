// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Many rows as one part of a statement.
#ifndef MEDIIDX_TOOL_STORE_ROW_ARRAYS_H_
#define MEDIIDX_TOOL_STORE_ROW_ARRAYS_H_

#include <concepts>
#include <cstddef>
#include <initializer_list>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace mediidx::tool {

/// Rows held as an array for each column, which the server reads far faster than a list of rows.
class RowArrays {
 public:
  /// The types of the columns: integer and bigint of numbers, text of texts.
  explicit RowArrays(std::initializer_list<const char*> types);

  /// Appends one row: a number, a text or an optional one for each column.
  template <class... Values>
  void add(const Values&... values) {
    std::size_t column = 0;
    (append(columns_[column++].elements, values), ...);
  }

  /// The set of rows: "unnest('{1,2}'::integer[], '{"a","b"}'::text[])".
  std::string unnest() const;

 private:
  struct Column {
    const char* type;
    std::string elements;
  };

  static void append(std::string& elements, std::string_view text);
  static void append(std::string& elements, std::integral auto number) {
    (elements += std::to_string(number)) += ',';
  }
  template <class Value>
  static void append(std::string& elements, const std::optional<Value>& value) {
    if (value) return append(elements, *value);
    elements += "NULL,";
  }

  std::vector<Column> columns_;
};

}  // namespace mediidx::tool

#endif
