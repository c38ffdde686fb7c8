// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A text of several SQL statements, one by one.
#ifndef TAVODB_STATEMENT_SPLITTER_H_
#define TAVODB_STATEMENT_SPLITTER_H_

#include <optional>
#include <string_view>

namespace tavodb {

/// Walks the statements of a text that outlives it. They are split at ";"
/// outside of literals, quoted names and comments; those that hold nothing but
/// white space and comments are passed over.
class StatementSplitter {
public:
  explicit StatementSplitter(std::string_view text) : rest_(text) {}

  /// The next statement, without its ";"; empty at the end.
  std::optional<std::string_view> next();

private:
  std::string_view rest_;
};

} // namespace tavodb

#endif
