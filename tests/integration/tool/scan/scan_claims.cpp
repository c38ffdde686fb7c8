// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan_claims.h"

namespace mediidx::test {

std::vector<std::string> false_claims(const std::filesystem::path& server) {
  constexpr const char* kFalseClaims =
      "WITH held AS (SELECT path, filesize, 0 AS kind FROM track WHERE is_virtual = 'FALSE' "
      "UNION ALL SELECT path, filesize, 1 FROM photo UNION ALL SELECT path, filesize, 2 FROM video "
      "UNION ALL SELECT path, filesize, 3 FROM playlist "
      "UNION ALL SELECT path, filesize, 3 FROM personal_playlist) "
      "SELECT f.path || '/' || x.name FROM scan.file x JOIN scan.folder f ON f.id = x.folder "
      "WHERE x.size >= 0 AND x.failure IS NULL AND NOT EXISTS (SELECT FROM held h "
      "WHERE h.path = f.path || '/' || x.name AND h.kind = least(x.kind, 3) "
      "AND h.filesize = x.size) "
      "UNION ALL SELECT f.path FROM scan.folder f WHERE f.modified IS NOT NULL AND NOT EXISTS "
      "(SELECT FROM directory d WHERE d.path = f.path) AND NOT EXISTS "
      "(SELECT FROM personal_directory d WHERE d.path = f.path) ORDER BY 1";
  std::vector<std::string> out;
  for (const auto& row : rows_at(server, kFalseClaims)) out.push_back(row[0]);
  return out;
}

}  // namespace mediidx::test
