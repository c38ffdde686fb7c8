// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// One transaction whose statements take whole sets of values, and the texts that carry them.
#ifndef MEDIIDX_DATABASE_MANY_BATCH_H_
#define MEDIIDX_DATABASE_MANY_BATCH_H_

#include <charconv>
#include <concepts>
#include <cstdint>
#include <initializer_list>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "support/owned.h"

namespace mediidx::many {

/// Why a batch is given up. What the database refused is in the log.
class GivenUp : public std::runtime_error {
  using std::runtime_error::runtime_error;
};

// In the statements of batches, a path lies between itself and itself, bytewise: only the radix
// tree of paths finds it by that. "=" may be looked up in the trigrams of a table's paths instead,
// where each look-up reads all entries that are not merged yet.

/// SQL null, or a text.
using Text = std::optional<std::string>;

/// Texts as one value of a statement, to be cast to text[].
class ArrayText {
 public:
  ArrayText() = default;
  template <class Texts>
  explicit ArrayText(const Texts& texts) {
    for (const auto& text : texts) add(text);
  }
  void add(std::string_view text);
  void add(const char* text) { add(std::string_view(text)); }
  void add(const std::string& text) { add(std::string_view(text)); }
  void add(const Text& text);
  /// The finished value, for as long as nothing is added.
  const char* value();
  bool empty() const { return text_.size() == 1; }

 private:
  std::string text_ = "{";
  std::string finished_;
};

/// Rows of one table in COPY's text format.
class CopyRows {
 public:
  /// `target`: the table and its columns, "video(path, title)".
  explicit CopyRows(const char* target) : target_(target) {}

  /// Appends one row: a value for each column.
  template <class... Values>
  void add(const Values&... values) {
    (append(values), ...);
    text_.back() = '\n';
  }
  bool empty() const { return text_.empty(); }
  std::string statement() const { return "COPY " + std::string(target_) + " FROM STDIN"; }
  const std::string& text() const { return text_; }

 private:
  void append(std::string_view value);
  void append(const char* value) { append(std::string_view(value)); }
  void append(const std::string& value) { append(std::string_view(value)); }
  void append(const Text& value);
  void append(std::nullopt_t) { text_ += "\\N\t"; }
  template <std::integral Number>
  void append(Number value) {
    char digits[24];
    const auto end = std::to_chars(digits, digits + sizeof digits, value).ptr;
    text_.append(digits, end) += '\t';
  }

  const char* target_;
  std::string text_;
};

/// A transaction on the shared connection, or a part of the caller's that is open there; undone
/// unless it is committed. Failures are logged, and thrown as GivenUp.
class Batch {
 public:
  Batch();
  ~Batch();
  Batch(const Batch&) = delete;
  Batch& operator=(const Batch&) = delete;

  void run(const char* sql, std::initializer_list<const char*> values);
  OwnedResult select(const char* sql, std::initializer_list<const char*> values);
  /// Without rows nothing is sent. Rows that a later record of the batch replaces are copied too,
  /// before the deletes: the server says of every record whether it takes it.
  void copy(const CopyRows& rows);
  void commit();

  /// Takes this many ids of new tracks, by rising order.
  std::vector<int> reserve_track_ids(std::size_t count);

 private:
  void undo();

  tavodb_connection* conn_;
  bool is_part_;  ///< Of the caller's transaction.
  bool open_ = false;
};

/// Calls `body` with a function that gives a column's text in each row, null for SQL null.
template <class Body>
void for_each_row(const OwnedResult& rows, Body body) {
  std::uint32_t row = 0;
  while (TAVODBFetchRow(rows.get(), &row) != -1) {
    body([&](const char* column) { return TAVODBFetchField(rows.get(), row, column); });
  }
}

inline Text text_from(const char* field) { return field ? Text(field) : std::nullopt; }

}  // namespace mediidx::many

#endif
