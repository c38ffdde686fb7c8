// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "twin_test.h"

#include <dlfcn.h>
#include <tavodbbulk.h>
#include <tavosdk.h>

#include <algorithm>
#include <cstring>
#include <stdexcept>
#include <utility>

#include "log_recorder.h"
#include "mediidx/database.h"

namespace mediidx::test {
namespace {

constexpr const char* kTwin = "mediaserver_twin";

/// The database that every connection of the library goes to.
const char* g_database = nullptr;

template <class Call>
Call next_definition(const char* name) {
  auto* found = dlsym(RTLD_NEXT, name);
  if (!found) throw std::runtime_error(std::string("no ") + name + " behind the test's own");
  return reinterpret_cast<Call>(found);
}

/// Notes a statement; false when it is to fail.
bool passes(const char* sql) {
  auto& calls = platform_calls();
  ++calls.statements;
  return !calls.before_statement || calls.before_statement(sql);
}

// A track is known by its whole row, as far as its side rows are concerned.
constexpr const char* kContent = R"(
  WITH named AS (SELECT id, (to_jsonb(t) - 'id')::text AS name FROM track AS t)
  SELECT 'track ' || name AS line FROM named
  UNION ALL SELECT 'music ' || (to_jsonb(t) - 'id')::text FROM music t
  UNION ALL SELECT 'video ' || (to_jsonb(t) - 'id')::text FROM video t
  UNION ALL SELECT 'photo ' || (to_jsonb(t) - 'id')::text FROM photo t
  UNION ALL SELECT 'playlist ' || (to_jsonb(t) - 'id')::text FROM playlist t
  UNION ALL SELECT 'personal_playlist ' || (to_jsonb(t) - 'id')::text FROM personal_playlist t
  UNION ALL SELECT 'directory ' || (to_jsonb(t) - 'id')::text FROM directory t
  UNION ALL SELECT 'personal_directory ' || (to_jsonb(t) - 'id')::text FROM personal_directory t
  UNION ALL SELECT 'virtual_music ' || (to_jsonb(t) - 'id')::text FROM virtual_music t
  UNION ALL SELECT 'genre ' || (to_jsonb(s) - 'track')::text || name
    FROM genre_track s LEFT JOIN named ON named.id = s.track
  UNION ALL SELECT 'composer ' || (to_jsonb(s) - 'track')::text || name
    FROM composer_track s LEFT JOIN named ON named.id = s.track
  UNION ALL SELECT 'artist ' || (to_jsonb(s) - 'track')::text || name
    FROM artist_track s LEFT JOIN named ON named.id = s.track
  UNION ALL SELECT 'album ' || (to_jsonb(s) - 'track')::text || name
    FROM album_track s LEFT JOIN named ON named.id = s.track
  UNION ALL SELECT 'virtual_info ' || (to_jsonb(s) - 'track')::text || name
    FROM virtual_info_track s LEFT JOIN named ON named.id = s.track
  UNION ALL SELECT 'rating ' || (to_jsonb(s) - 'track')::text || name
    FROM rating_track s LEFT JOIN named ON named.id = s.track
  UNION ALL SELECT 'replaygain ' || (to_jsonb(s) - 'track')::text || name
    FROM replaygain_track s LEFT JOIN named ON named.id = s.track
  ORDER BY 1)";
constexpr const char* kEmpty =
    "DELETE FROM track; DELETE FROM music; DELETE FROM video; DELETE FROM photo; "
    "DELETE FROM playlist; DELETE FROM personal_playlist; DELETE FROM directory; "
    "DELETE FROM personal_directory; DELETE FROM virtual_music";

std::vector<std::string> sorted_log() {
  std::vector<std::string> lines;
  for (const auto& line : logged()) lines.push_back(line.text);
  std::ranges::sort(lines);
  return lines;
}

/// The bytes of records but for their ids, which only the database knows.
void expect_same_records(std::vector<Info> together, std::vector<Info> one_by_one) {
  for (std::size_t i = 0; i < together.size(); ++i) {
    EXPECT_EQ(together[i].id == 0, one_by_one[i].id == 0) << "record " << i;
    together[i].id = one_by_one[i].id = 0;
    // Records are zero-filled, what is between their fields too.
    EXPECT_EQ(std::memcmp(&together[i], &one_by_one[i], sizeof(Info)),  // NOLINT(bugprone-*)
              0)
        << "record " << i;
  }
}

}  // namespace

PlatformCalls& platform_calls() {
  static PlatformCalls calls;
  return calls;
}

Info record(std::string_view path) {
  Info info{};
  set(info.path, path);
  return info;
}

DIR_INFO_REC folder_record(std::string_view path) {
  DIR_INFO_REC folder{};
  set(folder.path, path);
  return folder;
}

TwinTest::TwinTest() {
  platform_calls() = {};
  g_database = nullptr;
  static const bool kMade = [&] {
    rows(std::string("CREATE DATABASE ") + kTwin + " TEMPLATE mediaserver_template");
    return true;
  }();
  if (kMade) select(Side::kOneByOne, kEmpty);
  use(Side::kTogether);
  root.make_folder("tmp");
  root.make_folder("volume1/other");
  root.add_user("ann", 1026, root.at("homes/ann"));
  root.index_everything("media", root.at("volume1/media"));
  clear_log();
}

TwinTest::~TwinTest() {
  for (const auto side : {Side::kOneByOne, Side::kTogether}) {
    use(side);
    MediaDBConnClose();
  }
  platform_calls() = {};
}

void TwinTest::use(Side side) {
  connections_[static_cast<std::size_t>(side_)] = gpDBConnect;
  side_ = side;
  gpDBConnect = connections_[static_cast<std::size_t>(side)];
  g_database = side == Side::kOneByOne ? kTwin : nullptr;
}

std::vector<std::string> TwinTest::select(Side side, const char* sql) {
  use(side);
  tavodb_result* rows = nullptr;
  if (TAVODBExecute(MediaDBConnGet(), sql, &rows) == -1) {
    throw std::runtime_error(TAVODBErrorGet(gpDBConnect));
  }
  std::vector<std::string> lines;
  std::uint32_t row = 0;
  while (TAVODBFetchRow(rows, &row) == 0) {
    const char* line = TAVODBFetchField(rows, row, "line");
    lines.emplace_back(line ? line : "<a side row without its track>");
  }
  TAVODBFreeResult(rows);
  return lines;
}

std::vector<std::string> TwinTest::content(Side side) { return select(side, kContent); }

void TwinTest::empty_both() {
  for (const auto side : {Side::kTogether, Side::kOneByOne}) select(side, kEmpty);
}

Given TwinTest::run_both(std::size_t count, const std::function<int(int*)>& together,
                         const std::function<int(std::size_t)>& one) {
  use(Side::kOneByOne);
  clear_log();
  Given expected;
  for (std::size_t i = 0; i < count; ++i) expected.results.push_back(one(i));
  expected.log = sorted_log();

  use(Side::kTogether);
  clear_log();
  Given given;
  given.results.assign(count, 77);
  given.result = together(given.results.data());
  given.log = sorted_log();

  const bool any_failed = std::ranges::find(expected.results, -1) != expected.results.end();
  EXPECT_EQ(given.results, expected.results);
  EXPECT_EQ(given.result, any_failed ? -1 : 0);
  if (!fell_back(given)) {
    EXPECT_EQ(given.log, expected.log);
  }
  return given;
}

Given TwinTest::add_to_both(std::vector<Info>& records, MEDIA_TABLE_TYPE type) {
  auto copies = records;
  auto given = run_both(
      records.size(),
      [&](int* results) {
        return TAVOMediaIndexAddMany(records.data(), static_cast<unsigned>(records.size()), type,
                                     results);
      },
      [&](std::size_t i) { return TAVOMediaIndexAdd(&copies[i], type); });
  expect_same_records(records, copies);
  return given;
}

Given TwinTest::add_to_both(const Json::Value& array, MEDIA_TABLE_TYPE type) {
  return run_both(
      array.size(), [&](int* results) { return TAVOMediaIndexAddMany_Json(array, type, results); },
      [&](std::size_t i) {
        return TAVOMediaIndexAdd_Json(array[static_cast<Json::ArrayIndex>(i)], type);
      });
}

Given TwinTest::add_to_both(const std::vector<DIR_INFO_REC>& folders) {
  return run_both(
      folders.size(),
      [&](int* results) {
        return TAVOMediaIndexDirAddMany(folders.data(), static_cast<unsigned>(folders.size()),
                                        results);
      },
      [&](std::size_t i) { return TAVOMediaIndexDirAdd(&folders[i]); });
}

void TwinTest::expect_same_content() {
  const auto expected = content(Side::kOneByOne);
  const auto given = content(Side::kTogether);
  std::vector<std::string> missing;
  std::vector<std::string> unexpected;
  std::ranges::set_difference(expected, given, std::back_inserter(missing));
  std::ranges::set_difference(given, expected, std::back_inserter(unexpected));
  EXPECT_THAT(missing, testing::IsEmpty());
  EXPECT_THAT(unexpected, testing::IsEmpty());
}

bool TwinTest::fell_back(const Given& given) {
  return std::ranges::any_of(given.log, [](const std::string& line) {
    return line.find("Nothing is saved together") != line.npos ||
           line.find("Unexpected failure") != line.npos;
  });
}

}  // namespace mediidx::test

using mediidx::test::next_definition;
using mediidx::test::passes;

extern "C" {

TAVODB_EXPORT tavodb_connection* TAVODBConnect(const char* host, const char* user,
                                               const char* password, const char* database) {
  static const auto call = next_definition<decltype(&TAVODBConnect)>("TAVODBConnect");
  ++mediidx::test::platform_calls().connects;
  return call(host, user, password,
              mediidx::test::g_database ? mediidx::test::g_database : database);
}

TAVODB_EXPORT int TAVODBExecuteParams(tavodb_connection* conn, const char* sql, int count,
                                      const char* const* values, tavodb_result** result) {
  static const auto call = next_definition<decltype(&TAVODBExecuteParams)>("TAVODBExecuteParams");
  return passes(sql) ? call(conn, sql, count, values, result) : -1;
}

TAVOSDK_EXPORT int IndexIsPathRemoteMount(const char* path) {
  static const auto call =
      next_definition<decltype(&IndexIsPathRemoteMount)>("IndexIsPathRemoteMount");
  return std::string_view(path).ends_with("/remote.mp3") ? 1 : call(path);
}

TAVODB_EXPORT int TAVODBCopy(tavodb_connection* conn, const char* sql, const char* rows,
                             size_t length) {
  static const auto call = next_definition<decltype(&TAVODBCopy)>("TAVODBCopy");
  return passes(sql) ? call(conn, sql, rows, length) : -1;
}
}
