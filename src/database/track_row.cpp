// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/track_row.h"

#include <algorithm>
#include <cstdlib>
#include <string>

#include "database/catalogue_text.h"
#include "database/track_genre.h"
#include "support/sort_key.h"

namespace mediidx::catalogue {
namespace {

using Text = const char*;
using Long = std::int64_t;

constexpr Template<Long, Text, Text, Text, Text, Text, Text, Text, Long, int, int, int, int, Text,
                   Text, int, int, Text, Text, Text, Text, int, Text, Text>
    kInsertActual =
        "INSERT INTO track(userid, path, title, title_sort, title_search, agg_genre, "
        "agg_genre_sort, agg_genre_search, filesize, year, frequency, channel, bitrate, "
        "duration, comment, track, disc, container, codec, is_virtual, has_virtual, "
        "covercount, date, mdate) "
        "VALUES(@TAVO:LLINT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', "
        "'@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', @TAVO:LLINT, @TAVO:INT, @TAVO:INT, "
        "@TAVO:INT, @TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, @TAVO:INT, '@TAVO:VAR', "
        "'@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, '@TAVO:VAR', '@TAVO:VAR')";
constexpr Template<Long, Text, Text, Text, Text, Text, Text, Text, int, Text, Text, Text, Text, int,
                   Text>
    kInsertVirtual =
        "INSERT INTO track(userid, path, title, title_sort, title_search, agg_genre, "
        "agg_genre_sort, agg_genre_search, year, duration, comment, is_virtual, has_virtual, "
        "track, date) "
        "VALUES(@TAVO:LLINT, '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', "
        "'@TAVO:VAR', '@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, '@TAVO:VAR', '@TAVO:VAR', "
        "'@TAVO:VAR', '@TAVO:VAR', @TAVO:INT, '@TAVO:VAR')";
constexpr Template<Text, Long, Text, Text, Text, Text, Text, Text, Text, int, int, int, int, Text,
                   int, int, int, Text, Text, int>
    kUpdate =
        "UPDATE track "
        "SET path = '@TAVO:VAR', filesize = @TAVO:LLINT, title = '@TAVO:VAR', "
        "title_sort = '@TAVO:VAR', title_search = '@TAVO:VAR', agg_genre = '@TAVO:VAR', "
        "agg_genre_sort = '@TAVO:VAR', agg_genre_search = '@TAVO:VAR', "
        "comment = '@TAVO:VAR', year = @TAVO:INT, channel = @TAVO:INT, "
        "frequency = @TAVO:INT, bitrate = @TAVO:INT, duration = '@TAVO:VAR', "
        "track = @TAVO:INT, disc = @TAVO:INT, covercount = @TAVO:INT, date = '@TAVO:VAR', "
        "mdate = '@TAVO:VAR' "
        "WHERE id = @TAVO:INT";
constexpr Template<Text, Text, int> kSelectInserted =
    "SELECT * FROM track "
    "WHERE path = '@TAVO:VAR' AND is_virtual = '@TAVO:VAR' "
    "AND track = @TAVO:INT";
constexpr Template<Text, Text> kSelectCounterparts =
    "SELECT * FROM track "
    "WHERE path = '@TAVO:VAR' AND is_virtual = '@TAVO:VAR'";
constexpr Template<Text> kMarkActual =
    "UPDATE track "
    "SET has_virtual = 'TRUE' "
    "WHERE path = '@TAVO:VAR' AND is_virtual = 'FALSE'";
constexpr Template<int, int, int, Text, Text, Text> kPropertiesToVirtual =
    "UPDATE track "
    "SET channel = @TAVO:INT, frequency = @TAVO:INT, bitrate = @TAVO:INT, "
    "container = '@TAVO:VAR', codec = '@TAVO:VAR' "
    "WHERE path = '@TAVO:VAR' AND is_virtual = 'TRUE'";
constexpr Template<Text, int> kPropertiesFromActual =
    "UPDATE track "
    "SET channel = tb.channel, frequency = tb.frequency, bitrate = tb.bitrate, "
    "container = tb.container, codec = tb.codec "
    "FROM (SELECT channel, frequency, bitrate, container, codec "
    "FROM track "
    "WHERE path = '@TAVO:VAR' and is_virtual = 'FALSE') AS tb "
    "WHERE id = @TAVO:INT";

constexpr const char* kNo = text_flag(false);
constexpr const char* kYes = text_flag(true);

const char* date_or_epoch(const char* date) { return *date ? date : "epoch"; }

OwnedText fill_actual(const Connection& conn, const Record& info, const AggregatedGenre& genre,
                      std::int64_t userid) {
  const NameKeys title(info.title);
  const auto duration = decimal_text(info.duration);
  return conn.fill(kInsertActual, userid, info.path, info.title, title.sort, title.search,
                   genre.text.c_str(), genre.sort.c_str(), genre.search.c_str(), info.filesize,
                   info.year, info.frequency, info.channel, info.bitrate, duration.data(),
                   info.comment, info.track, info.disc, info.container_type, info.video_codec, kNo,
                   kNo, info.covercount, date_or_epoch(info.date), date_or_epoch(info.mdate));
}

OwnedText fill_virtual(const Connection& conn, const Record& info, const Record& cue_sheet,
                       const AggregatedGenre& genre, std::int64_t userid) {
  const NameKeys title(info.title);
  const auto duration = decimal_text(info.duration);
  // The end of this comment is what a delete of the cue sheet looks for.
  const auto comment = std::string(info.comment) + cue_sheet.path;
  return conn.fill(kInsertVirtual, userid, info.path, info.title, title.sort, title.search,
                   genre.text.c_str(), genre.sort.c_str(), genre.search.c_str(), info.year,
                   duration.data(), comment.c_str(), kYes, kNo, info.track,
                   date_or_epoch(cue_sheet.date));
}

/// The id is the low half of a 64-bit number; a field that is missing counts as an empty text.
std::uint32_t id_from(const char* field) {
  return static_cast<std::uint32_t>(std::strtoll(field ? field : "", nullptr, 10));
}

}  // namespace

bool insert_track_row(const Connection& conn, const Record& info, const Record* cue_sheet,
                      std::int64_t userid) {
  const auto genre = aggregate_genres(info.genre);
  if (!genre) return false;
  if (cue_sheet) {
    return conn.run(kVirtualTrackInsertLine, fill_virtual(conn, info, *cue_sheet, *genre, userid));
  }
  return conn.run(kTrackInsertLine, fill_actual(conn, info, *genre, userid));
}

bool update_track_row(const Connection& conn, const Record& info) {
  const auto genre = aggregate_genres(info.genre);
  if (!genre) return false;
  const NameKeys title(info.title);
  const auto duration = decimal_text(info.duration);
  return conn.run(
      kTrackUpdateLine,
      conn.fill(kUpdate, info.path, info.filesize, info.title, title.sort, title.search,
                genre->text.c_str(), genre->sort.c_str(), genre->search.c_str(), info.comment,
                info.year, info.channel, info.frequency, info.bitrate, duration.data(), info.track,
                info.disc, info.covercount, date_or_epoch(info.date), date_or_epoch(info.mdate),
                static_cast<int>(info.id)));
}

std::optional<int> find_inserted_track_id(const Connection& conn, Record& info, bool is_virtual) {
  const Record& found = info;
  const auto rows = conn.select(
      kTrackIdLine, conn.fill(kSelectInserted, found.path, text_flag(is_virtual), found.track));
  // Tracks of one file with one number cannot be told apart: the first row counts.
  std::uint32_t row = 0;
  if (!rows || TAVODBFetchRow(rows.get(), &row) == -1) return std::nullopt;
  info.id = id_from(TAVODBFetchField(rows.get(), row, "id"));
  return std::max(static_cast<int>(info.id), 0);
}

std::optional<int> count_counterparts(const Connection& conn, const Record& info, bool is_virtual) {
  return conn.count(kCounterpartsLine,
                    conn.fill(kSelectCounterparts, info.path, text_flag(!is_virtual)));
}

bool mark_actual_row(const Connection& conn, const Record& info) {
  return conn.run(kHasVirtualLine, conn.fill(kMarkActual, info.path));
}

bool copy_audio_properties(const Connection& conn, const Record& info, bool is_virtual) {
  if (is_virtual) {
    return conn.run(kPropertiesFromActualLine,
                    conn.fill(kPropertiesFromActual, info.path, static_cast<int>(info.id)));
  }
  return conn.run(kPropertiesToVirtualLine,
                  conn.fill(kPropertiesToVirtual, info.channel, info.frequency, info.bitrate,
                            info.container_type, info.video_codec, info.path));
}

}  // namespace mediidx::catalogue
