// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/row_output.h"

#include <json/writer.h>
#include <unistd.h>

#include <array>
#include <charconv>
#include <cmath>
#include <cstdio>

#include "cli/output.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

Json::Value json_value(const Rows& rows, const RowColumn& column) {
  const auto text = rows.text(column.name);
  if (column.type == ValueType::kNumber) return Json::Int64{std::llround(number_of(text))};
  if (column.type == ValueType::kSeconds) return number_of(text);
  if (column.type == ValueType::kYesNo) return text == "t";
  return text;
}

bool is_number(ValueType type) { return type == ValueType::kNumber || type == ValueType::kSeconds; }

void print_json(Rows rows, std::span<const RowColumn> columns) {
  JsonList out;
  while (rows.next()) out.add(json_object(rows, columns));
  out.finish();
}

void print_table(Rows rows, std::span<const RowColumn> columns) {
  std::vector<Column> titles;
  for (const auto& column : columns) {
    if (!column.title) continue;
    titles.push_back({column.title, is_number(column.type), column.type == ValueType::kPath});
  }
  std::vector<TableRow> lines;
  while (rows.next()) {
    TableRow line;
    for (const auto& column : columns) {
      if (column.title) line.push_back(cell_text(rows, column));
    }
    lines.push_back(std::move(line));
  }
  put_table(titles, lines);
}

}  // namespace

double number_of(const std::string& text) {
  double value = 0;
  std::from_chars(text.data(), text.data() + text.size(), value);
  return std::isfinite(value) ? value : 0;
}

std::string clock_text(double seconds) {
  const auto whole = static_cast<long>(seconds);
  std::array<char, 48> text;
  if (whole < 3600) {
    std::snprintf(text.data(), text.size(), "%ld:%02ld", whole / 60, whole % 60);
  } else {
    std::snprintf(text.data(), text.size(), "%ld:%02ld:%02ld", whole / 3600, whole / 60 % 60,
                  whole % 60);
  }
  return text.data();
}

std::string cell_text(const Rows& rows, const RowColumn& column) {
  auto text = rows.text(column.name);
  switch (column.type) {
    case ValueType::kNumber:
      return text == "0" ? "" : text;
    case ValueType::kSeconds:
      return text.empty() ? "" : clock_text(number_of(text));
    case ValueType::kYesNo:
      return text.empty() ? "" : text == "t" ? "yes" : "no";
    case ValueType::kText:
    case ValueType::kPath:
      break;
  }
  return text;
}

Json::Value json_object(const Rows& rows, std::span<const RowColumn> columns) {
  Json::Value object(Json::objectValue);
  for (const auto& column : columns) object[column.name] = json_value(rows, column);
  return object;
}

void print_rows(Rows rows, std::span<const RowColumn> columns, bool json) {
  if (json) {
    print_json(std::move(rows), columns);
  } else {
    print_table(std::move(rows), columns);
  }
}

void put_table(const std::vector<Column>& columns, const std::vector<TableRow>& rows) {
  const int width = terminal_width(STDOUT_FILENO);
  put(width > 0 ? format_table(columns, rows, width) : format_lines(rows));
}

bool is_on_terminal() { return terminal_width(STDOUT_FILENO) > 0; }

void put_json(const Json::Value& value) {
  Json::StreamWriterBuilder builder;
  builder["indentation"] = "";
  builder["emitUTF8"] = true;
  put(Json::writeString(builder, value) + "\n");
}

Json::Value json_text(const std::string& text) { return is_utf8(text) ? text : clean_text(text); }

}  // namespace mediidx::tool
