// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A database with 100,000 songs, and what the planner makes of a statement on it.
#ifndef MEDIIDX_TESTS_INTEGRATION_SCHEMA_BIG_LIBRARY_H_
#define MEDIIDX_TESTS_INTEGRATION_SCHEMA_BIG_LIBRARY_H_

#include <map>
#include <set>
#include <string>
#include <vector>

namespace mediidx::test {

/// How a plan reads a table.
struct Scan {
  std::string node;      ///< Such as "Seq Scan".
  std::string relation;  ///< The table.
  std::string index;     ///< Empty without one.
  bool has_condition;    ///< The index is searched, not read as a whole.
  double rows;           ///< Expected, each time that it runs.
};

class BigLibrary {
 public:
  /// The only one: made at its first use, which replaces the database "mediaserver".
  static BigLibrary& get();

  /// How the statement reads its tables. Throws std::runtime_error when the server refuses it.
  std::vector<Scan> scans(const std::string& statement) const;
  /// What is wrong with the way in which a statement that names few rows reads tables of more than
  /// 1,000 rows: one line per table that it reads as a whole, or for more than 2 % of its rows.
  std::vector<std::string> wide_scans(const std::string& statement) const;
  /// The tables and their numbers of rows.
  const std::map<std::string, double>& tables() const { return tables_; }

 private:
  BigLibrary();
  std::map<std::string, double> tables_;
  std::set<std::string> partial_indexes_;
};

}  // namespace mediidx::test

#endif
