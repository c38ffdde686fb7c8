// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Emptying the whole database, and its vacuum.
#include "database/session.h"
#include "mediidx/request.h"
#include "support/no_throw.h"
#include "support/statement.h"

namespace mediidx {
namespace {

constexpr Template<std::int64_t> kDeleteAll{
    "DELETE FROM track WHERE userid = @TAVO:LLINT; "
    "DELETE FROM music; "
    "DELETE FROM virtual_music; "
    "DELETE FROM video; "
    "DELETE FROM playlist; "
    "DELETE FROM directory; "
    "DELETE FROM photo; "};
constexpr const char* kVacuum = "VACUUM ANALYZE";

constexpr int kNotEmptied = 520;
constexpr int kNotVacuumed = 521;

int delete_all() {
  constexpr std::int64_t kNoUser = 0;
  const auto sql = fill(kDatabaseType, kDeleteAll, kNoUser);
  if (MediaDBExec(sql.get()) != -1) return 0;
  kDatabaseLog.colon(kNotEmptied, "Failed to exec [%s].", shown(sql.get()));
  return -1;
}

int vacuum() {
  if (MediaDBExec(kVacuum) != -1) return 0;
  kDatabaseLog.parens(kNotVacuumed, "Failed to exec [%s].", kVacuum);
  return -1;
}

}  // namespace
}  // namespace mediidx

extern "C" int MediaInfoDBDeleteAll() {
  return mediidx::no_throw(mediidx::kDatabaseLog, -1, mediidx::delete_all);
}

extern "C" int MediaDBVacuum() {
  return mediidx::no_throw(mediidx::kDatabaseLog, -1, mediidx::vacuum);
}

// The second name of the same function.
extern "C" [[gnu::alias("MediaDBVacuum")]] int TAVOMediaIndexDBVacuum();
