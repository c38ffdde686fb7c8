// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "database.h"
#include "schema_text.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr std::size_t kLongestPath = 4095;

class Schema : public DatabaseTest {};

TEST_F(Schema, RecordsItsVersion) {
  EXPECT_THAT(rows("SELECT version FROM mediidx.schema_version"),
              ElementsAre(Row{"1"}, Row{"2"}, Row{"3"}));
}

TEST_F(Schema, MayBeAppliedAgain) {
  rows("INSERT INTO music(path) VALUES('/volume1/a.mp3')");
  const std::string everything =
      "SELECT relname, relkind, oid FROM pg_class WHERE relnamespace IN "
      "('public'::regnamespace, 'mediidx'::regnamespace) ORDER BY oid";
  const auto before = rows(everything);
  const auto version = rows("SELECT * FROM mediidx.schema_version");

  rows(schema_text());

  EXPECT_EQ(rows(everything), before);
  EXPECT_EQ(rows("SELECT * FROM mediidx.schema_version"), version);
  EXPECT_EQ(count("music"), 1);
}

TEST_F(Schema, LetsThePlannerOrderTheLongestJoin) {
  rows(schema_text());
  EXPECT_EQ(value("SHOW join_collapse_limit"), "12");
}

TEST_F(Schema, StandsInADatabaseWhoseTrigramsKnowAllLetters) {
  EXPECT_THAT(rows("SELECT pg_encoding_to_char(encoding), datcollate, datctype FROM pg_database "
                   "WHERE datname = current_database()"),
              ElementsAre(Row{"UTF8", "C", "C.UTF-8"}));
}

TEST_F(Schema, KeepsItsOwnTableOutOfTheWay) {
  EXPECT_THAT(
      rows("SELECT tablename FROM pg_tables WHERE schemaname = 'public' ORDER BY 1"),
      ElementsAre(Row{"album_track"}, Row{"artist_track"}, Row{"composer_track"}, Row{"directory"},
                  Row{"genre_track"}, Row{"music"}, Row{"personal_directory"},
                  Row{"personal_playlist"}, Row{"photo"}, Row{"playlist"}, Row{"rating_track"},
                  Row{"replaygain_track"}, Row{"track"}, Row{"video"}, Row{"video_convert"},
                  Row{"virtual_info_track"}, Row{"virtual_music"}));
}

TEST_F(Schema, ForcesNothingButKeys) {
  EXPECT_THAT(rows("SELECT attrelid::regclass, attname FROM pg_attribute JOIN pg_class c ON "
                   "c.oid = attrelid WHERE relkind = 'r' AND relnamespace = 'public'::regnamespace "
                   "AND attnum > 0 AND attnotnull AND attname <> 'id'"),
              IsEmpty());
  EXPECT_THAT(rows("SELECT indexrelid::regclass FROM pg_index JOIN pg_class c ON c.oid = indrelid "
                   "WHERE relnamespace = 'public'::regnamespace AND indisunique "
                   "AND NOT indisprimary"),
              IsEmpty());
}

TEST_F(Schema, StoresDatesWithoutATimeZone) {
  EXPECT_THAT(rows("SELECT DISTINCT data_type FROM information_schema.columns WHERE "
                   "table_schema = 'public' AND column_name IN ('date', 'mdate', 'timetaken')"),
              ElementsAre(Row{"timestamp without time zone"}));
  rows("INSERT INTO track(path, date) VALUES('a', 'epoch')");
  EXPECT_EQ(value("SELECT date FROM track"), "1970-01-01 00:00:00");
}

TEST_F(Schema, StoresUserIdsOf64Bits) {
  EXPECT_THAT(rows("SELECT DISTINCT data_type FROM information_schema.columns WHERE "
                   "table_schema = 'public' AND column_name = 'userid'"),
              ElementsAre(Row{"bigint"}));
}

TEST_F(Schema, NumbersRowsBy32Bits) {
  EXPECT_THAT(rows("SELECT DISTINCT data_type, is_identity FROM information_schema.columns WHERE "
                   "table_schema = 'public' AND column_name IN ('id')"),
              ElementsAre(Row{"integer", "YES"}));
}

TEST_F(Schema, TakesQuotedNumbersForIntegers) {
  rows("INSERT INTO music(path, channel) VALUES('a', '5')");
  EXPECT_EQ(value("SELECT channel + 1 FROM music"), "6");
}

class UnqualifiedName : public DatabaseTest, public testing::WithParamInterface<const char*> {};
TEST_P(UnqualifiedName, StandsInOneOfTheJoinedTables) {
  EXPECT_EQ(count("information_schema.columns",
                  "table_schema = 'public' AND table_name IN ('track', 'album_track', "
                  "'artist_track', 'virtual_info_track') AND column_name = " +
                      quoted(GetParam())),
            1);
}
INSTANTIATE_TEST_SUITE_P(Names, UnqualifiedName,
                         testing::Values("id", "path", "album", "artist", "album_artist",
                                         "is_virtual", "cue_sheet_path", "from_album_artist"),
                         [](const auto& test) { return std::string(test.param); });

class ForeignKeys : public DatabaseTest {};

TEST_F(ForeignKeys, TieEverySideTableToItsTrack) {
  EXPECT_THAT(
      rows("SELECT conrelid::regclass, confrelid::regclass, confdeltype FROM pg_constraint "
           "WHERE contype = 'f' ORDER BY conrelid::regclass::text"),
      ElementsAre(Row{"album_track", "track", "c"}, Row{"artist_track", "track", "c"},
                  Row{"composer_track", "track", "c"}, Row{"genre_track", "track", "c"},
                  Row{"rating_track", "track", "c"}, Row{"replaygain_track", "track", "c"},
                  Row{"scan.file", "scan.folder", "c"}, Row{"virtual_info_track", "track", "c"}));
}

TEST_F(ForeignKeys, HaveAnIndexOfTheReferencingColumn) {
  EXPECT_THAT(
      rows("SELECT conrelid::regclass FROM pg_constraint WHERE contype = 'f' AND NOT EXISTS "
           "(SELECT 1 FROM pg_index WHERE indrelid = conrelid AND indkey[0] = conkey[1] "
           "AND indpred IS NULL AND indisvalid)"),
      IsEmpty());
}

TEST_F(ForeignKeys, LeaveNoSideRowOfADeletedTrack) {
  const std::vector<std::string> side_tables{
      "genre_track",        "composer_track", "artist_track",    "album_track",
      "virtual_info_track", "rating_track",   "replaygain_track"};
  rows("INSERT INTO track(id, path) VALUES(1, '/volume1/a.mp3'), (2, '/volume1/b.mp3')");
  for (const auto& table : side_tables)
    rows("INSERT INTO " + table + "(track) VALUES(1), (1), (2)");

  rows("DELETE FROM track WHERE path like '/volume1/a.mp3' AND is_virtual IS NULL");

  for (const auto& table : side_tables) {
    EXPECT_THAT(rows("SELECT track FROM " + table), ElementsAre(Row{"2"})) << table;
  }
}

class OnlineFlag : public DatabaseTest, public testing::WithParamInterface<const char*> {};
TEST_P(OnlineFlag, IsTrueForANewRow) {
  rows(std::string("INSERT INTO ") + GetParam() + "(path) VALUES('a')");
  EXPECT_EQ(value(std::string("SELECT fs_online FROM ") + GetParam()), "t");
}
INSTANTIATE_TEST_SUITE_P(Tables, OnlineFlag,
                         testing::Values("music", "video", "photo", "playlist", "directory"),
                         [](const auto& test) { return std::string(test.param); });

/// A path of `size` bytes that hardly compresses: latin and CJK names, no two alike.
std::string long_path(std::size_t size, unsigned seed) {
  static constexpr std::string_view kCharacters[] = {"日", "本", "の", "音", "楽", "夏", "映", "画",
                                                     "a",  "E",  "7",  "z",  "_",  "%",  "ü",  "ж"};
  std::string path = "/volume1";
  while (path.size() + 4 < size) {
    seed = seed * 1664525 + 1013904223;
    path += path.size() % 80 < 3 ? "/" : kCharacters[(seed >> 20) % std::size(kCharacters)];
  }
  return path.append(size - path.size(), 'x');
}

std::string as_pattern(const std::string& path) {
  std::string pattern;
  for (const char c : path) {
    if (c == '\\' || c == '%' || c == '_') pattern += '\\';
    pattern += c;
  }
  return pattern;
}

struct PathColumn {
  const char* table;
  const char* column;
};
class LongestPath : public DatabaseTest, public testing::WithParamInterface<PathColumn> {
 protected:
  LongestPath() {
    for (const auto& path : {path_, near_, other_}) {
      rows("INSERT INTO " + table_ + "(" + column_ + ") VALUES(" + quoted(path) + ")");
    }
  }
  /// The number of rows that an index, where there is one, finds.
  std::string found(const std::string& condition) {
    return value("SET enable_seqscan = off; SELECT count(*) FROM " + table_ + " WHERE " + column_ +
                 " " + condition);
  }

  const std::string table_ = GetParam().table;
  const std::string column_ = GetParam().column;
  const std::string path_ = long_path(kLongestPath, 1);
  const std::string near_ = path_.substr(0, kLongestPath - 1) + "y";
  const std::string other_ = long_path(kLongestPath, 2);
};
TEST_P(LongestPath, IsFound) {
  ASSERT_EQ(path_.size(), kLongestPath);
  EXPECT_EQ(found("= " + quoted(path_)), "1");
  EXPECT_EQ(found("like " + quoted(as_pattern(path_))), "1");
  EXPECT_EQ(found("like " + quoted(as_pattern(path_.substr(0, kLongestPath - 1)) + "%")), "2");
  EXPECT_EQ(found("like " + quoted("%" + as_pattern(path_.substr(2000)))), "1");
}
INSTANTIATE_TEST_SUITE_P(
    Columns, LongestPath,
    testing::Values(PathColumn{"music", "path"}, PathColumn{"video", "path"},
                    PathColumn{"photo", "path"}, PathColumn{"playlist", "path"},
                    PathColumn{"directory", "path"}, PathColumn{"personal_playlist", "path"},
                    PathColumn{"personal_directory", "path"}, PathColumn{"track", "path"},
                    PathColumn{"virtual_music", "path"}, PathColumn{"video_convert", "video_path"},
                    PathColumn{"video_convert", "convert_file_path"},
                    PathColumn{"virtual_info_track", "cue_sheet_path"}),
    [](const auto& test) { return std::string(test.param.table) + "_" + test.param.column; });

class Trigrams : public DatabaseTest {
 protected:
  Trigrams() {
    rows(
        "INSERT INTO music(path) VALUES('/volume1/音楽/東京の日本.mp3'), "
        "('/volume1/音楽/東京の夜.mp3'), ('/volume1/music/tokyo.mp3')");
    rows("DROP INDEX music_path");  // leaves the trigrams alone to find a path
  }
  std::vector<Row> found(const std::string& pattern) {
    return rows("SET enable_seqscan = off; SELECT path FROM music WHERE path LIKE " +
                quoted(pattern));
  }
};

TEST_F(Trigrams, AreMadeOfCjkLetters) {
  EXPECT_EQ(value("SELECT cardinality(show_trgm('日本'))"), "3");
}

TEST_F(Trigrams, FindTheEndOfACjkName) {
  EXPECT_THAT(found("%日本.mp3"), ElementsAre(Row{"/volume1/音楽/東京の日本.mp3"}));
}

TEST_F(Trigrams, FindAPartOfACjkName) {
  EXPECT_THAT(found("%日本%.mp3"), ElementsAre(Row{"/volume1/音楽/東京の日本.mp3"}));
}

TEST_F(Trigrams, AreReadForASuffix) {
  std::string plan;
  for (const auto& line :
       rows("SET enable_seqscan = off; EXPLAIN SELECT * FROM music WHERE path LIKE '%日本%.mp3'")) {
    plan += line[0];
  }
  EXPECT_THAT(plan, testing::HasSubstr("music_path_trigram"));
}

TEST_F(Trigrams, TakeTheLongestCommentOfAVirtualTrack) {
  const auto comment = "00:00:00" + long_path(246, 3);
  ASSERT_EQ(comment.size(), 254u);
  rows("INSERT INTO virtual_music(comment) SELECT " + quoted(comment) +
       " FROM generate_series(1, 99)");
  EXPECT_EQ(
      value("SET enable_seqscan = off; SELECT count(*) FROM virtual_music WHERE comment LIKE " +
            quoted("%" + as_pattern(comment.substr(8)))),
      "99");
}

}  // namespace
}  // namespace mediidx::test
