// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/many_batch.h"

#include <tavodbbulk.h>

#include "database/session.h"

namespace mediidx::many {
namespace {

constexpr int kNotExecuted = 700;

// A batch names its rows, and an index finds each. The planner, left to itself, reads whole tables
// where it takes them for small, as it does until a new library is analysed. Within the caller's
// transaction this holds until that ends.
constexpr const char* kUseIndexes =
    "SELECT set_config('enable_seqscan', 'off', true), set_config('enable_hashjoin', 'off', true), "
    "set_config('enable_mergejoin', 'off', true)";
constexpr const char* kReserveIds =
    "SELECT nextval(pg_get_serial_sequence('track', 'id')) AS id "
    "FROM generate_series(1, $1::integer)";

[[noreturn]] void give_up(tavodb_connection* conn, const char* sql) {
  kDatabaseLog.parens(kNotExecuted, "Failed to exec [%s] (%s)", sql, TAVODBErrorGet(conn));
  throw GivenUp("a statement failed");
}

}  // namespace

void ArrayText::add(std::string_view text) {
  if (!empty()) text_ += ',';
  text_ += '"';
  for (const char c : text) {
    if (c == '"' || c == '\\') text_ += '\\';
    text_ += c;
  }
  text_ += '"';
}

void ArrayText::add(const Text& text) {
  if (text) return add(std::string_view(*text));
  if (!empty()) text_ += ',';
  text_ += "NULL";
}

const char* ArrayText::value() {
  finished_ = text_ + '}';
  return finished_.c_str();
}

void CopyRows::append(std::string_view value) {
  for (const char c : value) {
    switch (c) {
      case '\\':
        text_ += "\\\\";
        break;
      case '\n':
        text_ += "\\n";
        break;
      case '\r':
        text_ += "\\r";
        break;
      case '\t':
        text_ += "\\t";
        break;
      default:
        text_ += c;
    }
  }
  text_ += '\t';
}

void CopyRows::append(const Text& value) {
  if (value) return append(std::string_view(*value));
  append(std::nullopt);
}

Batch::Batch() : conn_(MediaDBConnGet()), is_part_(TAVODBInTransaction(conn_) == 1) {
  if (!conn_) throw GivenUp("no connection");
  run(is_part_ ? "SAVEPOINT mediidx_batch" : "BEGIN", {});
  open_ = true;
  try {
    run(kUseIndexes, {});
  } catch (...) {
    undo();
    throw;
  }
}

Batch::~Batch() {
  if (open_) undo();
}

// A connection that was lost has nothing left to undo.
void Batch::undo() {
  constexpr const char* kUndoPart =
      "ROLLBACK TO SAVEPOINT mediidx_batch; RELEASE SAVEPOINT mediidx_batch";
  TAVODBExecute(conn_, is_part_ ? kUndoPart : "ROLLBACK", nullptr);
}

void Batch::run(const char* sql, std::initializer_list<const char*> values) { select(sql, values); }

OwnedResult Batch::select(const char* sql, std::initializer_list<const char*> values) {
  OwnedResult rows;
  if (TAVODBExecuteParams(conn_, sql, static_cast<int>(values.size()), values.begin(), out(rows)) ==
      -1) {
    give_up(conn_, sql);
  }
  return rows;
}

void Batch::copy(const CopyRows& rows) {
  if (rows.empty()) return;
  const auto sql = rows.statement();
  if (TAVODBCopy(conn_, sql.c_str(), rows.text().data(), rows.text().size()) == -1) {
    give_up(conn_, sql.c_str());
  }
}

void Batch::commit() {
  run(is_part_ ? "RELEASE SAVEPOINT mediidx_batch" : "COMMIT", {});
  open_ = false;
}

std::vector<int> Batch::reserve_track_ids(std::size_t count) {
  std::vector<int> ids;
  ids.reserve(count);
  const auto rows = select(kReserveIds, {std::to_string(count).c_str()});
  for_each_row(rows, [&](auto field) {
    const std::string_view text(field("id"));
    int id = 0;
    // The column is an integer: the sequence ends before it does.
    std::from_chars(text.data(), text.data() + text.size(), id);
    ids.push_back(id);
  });
  return ids;
}

}  // namespace mediidx::many
