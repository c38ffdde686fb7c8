// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Rows whose volume went away: marked offline, marked online again, or purged.
#include "database/escape.h"
#include "database/session.h"
#include "database/table_types.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

constexpr int kNoConnectionToSet = 500;
constexpr int kNotSet = 501;
constexpr int kNoConnectionToPurge = 502;
constexpr int kNotPurged = 503;

void set_online(const char* path, bool prefix_match, bool online) {
  auto* conn = connect({LogShape::kParens, kNoConnectionToSet});
  if (!conn) return;
  const bool everything = !path || !*path;
  OwnedText pattern;
  if (!everything) {
    pattern = escape_pattern(TAVODBDatabaseTypeGet(conn), path);
    if (!pattern) return;
  }
  const char* before = everything ? "" : " where path like '";
  const char* wildcard = !everything && prefix_match ? "%" : "";
  const char* after = everything ? "" : "'";
  for (const auto& table : kTableTypes) {
    if (!table.has_online_state) continue;
    const OwnedFormat sql(TLIBCStrGetEx("UPDATE %s set fs_online = %s%s%s%s%s", table.name,
                                        online ? "'t'" : "'f'", before,
                                        everything ? "" : pattern.get(), wildcard, after));
    execute(conn, sql.get(), {LogShape::kParens, kNotSet});
  }
}

void drop_offline(const char* share) {
  auto* conn = connect({LogShape::kParens, kNoConnectionToPurge});
  if (!conn) return;
  const bool everything = !share || !*share;
  OwnedText pattern;
  if (!everything) {
    pattern = escape_pattern(share);
    if (!pattern) return;
  }
  const char* conjunction = everything ? "" : "AND ";
  const char* before = everything ? "" : " path LIKE '/volume%/";
  const char* after = everything ? "" : "/%'";
  for (const auto& table : kTableTypes) {
    if (!table.has_online_state) continue;
    const OwnedFormat sql(TLIBCStrGetEx("DELETE FROM %s WHERE fs_online = false %s%s%s%s",
                                        table.name, conjunction, before,
                                        everything ? "" : pattern.get(), after));
    execute(conn, sql.get(), {LogShape::kParens, kNotPurged});
  }
}

}  // namespace
}  // namespace mediidx

extern "C" void MediaInfoDBSetOnline(const char* path, int prefixMatch, int online) {
  mediidx::no_throw(mediidx::kDatabaseLog, 0, [&] {
    mediidx::set_online(path, prefixMatch != 0, online != 0);
    return 0;
  });
}

extern "C" void MediaInfoDBUUIDDropOffline(const char* shareName) {
  mediidx::no_throw(mediidx::kDatabaseLog, 0, [&] {
    mediidx::drop_offline(shareName);
    return 0;
  });
}
