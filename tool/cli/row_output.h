// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Rows on standard output: a table on a terminal, lines with tabs elsewhere, JSON for programs.
#ifndef MEDIIDX_TOOL_CLI_ROW_OUTPUT_H_
#define MEDIIDX_TOOL_CLI_ROW_OUTPUT_H_

#include <json/value.h>

#include <span>
#include <string>
#include <vector>

#include "store/database.h"
#include "text/table.h"

namespace mediidx::tool {

enum class ValueType { kText, kPath, kNumber, kSeconds, kYesNo };

/// A column of a query: its name, also in JSON, and its title in a table (null: in JSON only).
struct RowColumn {
  const char* name;
  const char* title;
  ValueType type;
};

/// Prints every row that is left. JSON is an array of objects.
void print_rows(Rows rows, std::span<const RowColumn> columns, bool json);

/// The columns of the current row as a JSON object.
Json::Value json_object(const Rows& rows, std::span<const RowColumn> columns);
/// One value of the current row, as people read it; 0 and null are empty.
std::string cell_text(const Rows& rows, const RowColumn& column);

/// Prints a table where standard output is a terminal, else format_lines.
void put_table(const std::vector<Column>& columns, const std::vector<TableRow>& rows);
/// True where put_table prints a table.
bool is_on_terminal();
/// Prints one JSON value on a line.
void put_json(const Json::Value& value);

/// A text as JSON can hold it: what is no UTF-8 is replaced.
Json::Value json_text(const std::string& text);
/// A number in a text; 0 for none.
double number_of(const std::string& text);
/// "3:05", "1:02:03"
std::string clock_text(double seconds);

}  // namespace mediidx::tool

#endif
