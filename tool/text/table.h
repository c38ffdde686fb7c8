// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Rows for people and for programs.
#ifndef MEDIIDX_TOOL_TEXT_TABLE_H_
#define MEDIIDX_TOOL_TEXT_TABLE_H_

#include <string>
#include <vector>

namespace mediidx::tool {

/// One column of a table.
struct Column {
  std::string title;
  bool is_number = false;  ///< Aligned to the right, and never cut.
  bool is_path = false;    ///< Cut at its beginning: the end of a path tells more.
};

using TableRow = std::vector<std::string>;

/// Columns of the terminal behind a file descriptor; 0 when there is none.
int terminal_width(int descriptor);

/// The table with its titles, each line at most `width` columns wide: the widest columns are cut
/// first. Control characters are escaped.
std::string format_table(const std::vector<Column>& columns, const std::vector<TableRow>& rows,
                         int width);

/// One line a row, fields separated by tabs, no titles; control characters are escaped, so that a
/// tab or a line end in a name cannot be taken for a separator.
std::string format_lines(const std::vector<TableRow>& rows);

}  // namespace mediidx::tool

#endif
