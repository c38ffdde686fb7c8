// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "text/table.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <algorithm>
#include <numeric>

#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr int kUsualWidth = 80;
constexpr int kGap = 2;
constexpr int kNarrowest = 4;

std::vector<int> natural_widths(const std::vector<Column>& columns,
                                const std::vector<TableRow>& rows) {
  std::vector<int> widths;
  for (std::size_t c = 0; c < columns.size(); ++c) {
    int width = display_width(columns[c].title);
    for (const auto& row : rows) width = std::max(width, display_width(row[c]));
    widths.push_back(width);
  }
  return widths;
}

/// Takes columns off the widest texts, one by one, until the line fits.
void shrink(std::vector<int>& widths, const std::vector<Column>& columns, int line) {
  int excess = std::accumulate(widths.begin(), widths.end(), 0) +
               kGap * (static_cast<int>(widths.size()) - 1) - line;
  for (; excess > 0; --excess) {
    int* widest = nullptr;
    for (std::size_t c = 0; c < columns.size(); ++c) {
      if (columns[c].is_number || widths[c] <= kNarrowest) continue;
      if (!widest || widths[c] > *widest) widest = &widths[c];
    }
    if (!widest) return;
    --*widest;
  }
}

std::string format_line(const TableRow& row, const std::vector<Column>& columns,
                        const std::vector<int>& widths) {
  std::string line;
  for (std::size_t c = 0; c < columns.size(); ++c) {
    const auto text = cut_to_width(row[c], widths[c], columns[c].is_path);
    const std::string padding(static_cast<std::size_t>(widths[c] - display_width(text)), ' ');
    if (c > 0) line.append(kGap, ' ');
    line += columns[c].is_number ? padding + text : text + padding;
  }
  line.erase(line.find_last_not_of(' ') + 1);
  return line + "\n";
}

TableRow escape_row(const TableRow& row) {
  TableRow out;
  for (const auto& text : row) out.push_back(escape_for_display(text));
  return out;
}

}  // namespace

int terminal_width(int descriptor) {
  if (!isatty(descriptor)) return 0;
  winsize size{};
  return ioctl(descriptor, TIOCGWINSZ, &size) == 0 && size.ws_col > 0 ? size.ws_col : kUsualWidth;
}

std::string format_table(const std::vector<Column>& columns, const std::vector<TableRow>& rows,
                         int width) {
  std::vector<TableRow> shown;
  for (const auto& row : rows) shown.push_back(escape_row(row));
  auto widths = natural_widths(columns, shown);
  shrink(widths, columns, width);
  TableRow titles;
  for (const auto& column : columns) titles.push_back(column.title);
  std::string out = format_line(titles, columns, widths);
  for (const auto& row : shown) out += format_line(row, columns, widths);
  return out;
}

std::string format_lines(const std::vector<TableRow>& rows) {
  std::string out;
  for (const auto& row : rows) {
    std::string line;
    for (const auto& text : row) {
      if (&text != &row.front()) line += '\t';
      line += escape_for_display(text);
    }
    out += line + "\n";
  }
  return out;
}

}  // namespace mediidx::tool
