// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "big_library.h"

#include <json/reader.h>

#include <fstream>
#include <iterator>
#include <sstream>
#include <stdexcept>

#include "database.h"
#include "schema_text.h"

namespace mediidx::test {
namespace {

constexpr double kBigTable = 1000;
constexpr double kFewRows = 0.02;
/// A bitmap heap scan reads what the scan of the index below it found.
const std::set<std::string> kReads{"Seq Scan", "Index Scan", "Index Only Scan",
                                   "Bitmap Index Scan"};

std::string library_text() {
  std::ifstream in(MEDIIDX_BIG_LIBRARY);
  std::string text(std::istreambuf_iterator<char>(in), {});
  if (text.empty()) throw std::runtime_error("cannot read " MEDIIDX_BIG_LIBRARY);
  return text;
}

/// Appends the scans of a plan and of the plans below it. The part of a bitmap scan that searches
/// the index does not name the table: it belongs to that of the plan above.
void collect(const Json::Value& plan, const std::string& above, std::vector<Scan>& scans) {
  const auto relation = plan.get("Relation Name", above).asString();
  const auto node = plan["Node Type"].asString();
  if (kReads.contains(node)) {
    scans.push_back({node, relation, plan.get("Index Name", "").asString(),
                     plan.isMember("Index Cond"), plan["Plan Rows"].asDouble()});
  }
  for (const auto& below : plan["Plans"]) collect(below, relation, scans);
}

}  // namespace

BigLibrary& BigLibrary::get() {
  static BigLibrary library;
  return library;
}

BigLibrary::BigLibrary() {
  auto& server = TestServer::get();
  server.fresh_database();
  server.rows(schema_text());  // a database made from a template lacks the settings of its own
  server.rows(library_text());
  server.rows("VACUUM ANALYZE");
  for (const auto& row : server.rows("SELECT relname, reltuples FROM pg_class WHERE relkind = 'r' "
                                     "AND relnamespace = 'public'::regnamespace")) {
    tables_[row[0]] = std::stod(row[1]);
  }
  for (const auto& row :
       server.rows("SELECT relname FROM pg_index JOIN pg_class ON oid = indexrelid "
                   "WHERE indpred IS NOT NULL")) {
    partial_indexes_.insert(row[0]);
  }
}

std::vector<Scan> BigLibrary::scans(const std::string& statement) const {
  std::string text;
  for (const auto& row : TestServer::get().rows("EXPLAIN (FORMAT JSON) " + statement)) {
    text += row[0] + "\n";
  }
  Json::Value plans;
  std::string errors;
  std::istringstream in(text);
  if (!Json::parseFromStream(Json::CharReaderBuilder(), in, &plans, &errors)) {
    throw std::runtime_error(errors + " in: " + text);
  }
  std::vector<Scan> scans;
  for (const auto& plan : plans) collect(plan["Plan"], "", scans);
  return scans;
}

std::vector<std::string> BigLibrary::wide_scans(const std::string& statement) const {
  std::vector<std::string> wide;
  for (const auto& scan : scans(statement)) {
    const auto table = tables_.find(scan.relation);
    if (table == tables_.end() || table->second <= kBigTable) continue;
    const bool is_whole = !scan.has_condition && !partial_indexes_.contains(scan.index);
    if (!is_whole && scan.rows <= kFewRows * table->second) continue;
    wide.push_back(scan.node + " of " + scan.relation + " " + scan.index + ", " +
                   std::to_string(static_cast<long>(scan.rows)) + " rows expected");
  }
  return wide;
}

}  // namespace mediidx::test
