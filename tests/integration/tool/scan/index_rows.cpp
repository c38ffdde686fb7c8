// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "index_rows.h"

#include <vector>

namespace mediidx::test {
namespace {

/// The library's tables, and whether their rows belong to a track.
constexpr const char* kTables =
    "SELECT c.relname, EXISTS (SELECT FROM pg_constraint k WHERE k.conrelid = c.oid AND "
    "k.contype = 'f' AND k.confrelid = 'public.track'::regclass) "
    "FROM pg_class c WHERE c.relnamespace = 'public'::regnamespace AND c.relkind = 'r'";

/// Tables with paths, and whether they know what is away.
struct PathTable {
  const char* name;
  const char* state;
};
constexpr PathTable kPathTables[] = {{"music", "fs_online"},
                                     {"video", "fs_online"},
                                     {"photo", "fs_online"},
                                     {"playlist", "fs_online"},
                                     {"directory", "fs_online"},
                                     {"track", "NULL::boolean"},
                                     {"personal_playlist", "NULL::boolean"},
                                     {"personal_directory", "NULL::boolean"}};

std::vector<Row> path_rows(const std::string& folder, const std::filesystem::path& server) {
  std::string sql;
  for (const auto& [name, state] : kPathTables) {
    if (!sql.empty()) sql += " UNION ALL ";
    sql += std::string("SELECT '") + name + "', path, " + state + " FROM " + name +
           " WHERE path = " + quoted(folder) + " OR starts_with(path, " + quoted(folder + "/") +
           ")";
  }
  return rows_at(server, sql);
}

}  // namespace

std::map<std::string, std::string> index_rows(const std::filesystem::path& server) {
  std::map<std::string, std::string> tables;
  std::string sql;
  for (const auto& table : rows_at(server, kTables)) {
    const auto& name = table[0];
    tables[name] = "";
    sql += (sql.empty() ? "SELECT '" : " UNION ALL SELECT '") + name + "', ";
    sql += table[1] == "t"
               ? "(jsonb_build_object('of', jsonb_build_array(t.userid, t.path, t.is_virtual, "
                 "t.track)) || (to_jsonb(s) - 'track'))::text FROM " +
                     name + " s LEFT JOIN track t ON t.id = s.track"
               : "(to_jsonb(t) - 'id')::text FROM " + name + " t";
  }
  for (const auto& row : rows_at(server, sql + " ORDER BY 1, 2")) tables[row[0]] += row[1] + "\n";
  return tables;
}

std::multiset<std::string> rows_below(const std::string& folder,
                                      const std::filesystem::path& server) {
  std::multiset<std::string> rows;
  for (const auto& row : path_rows(folder, server)) {
    rows.insert(row[0] + " " + row[1]);
  }
  return rows;
}

bool any_online(const std::string& folder) {
  for (const auto& row : path_rows(folder, TestServer::get().socket_folder())) {
    if (row[2] == "t") return true;
  }
  return false;
}

}  // namespace mediidx::test
