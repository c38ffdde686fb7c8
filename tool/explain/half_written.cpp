// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "explain/half_written.h"

#include <array>
#include <charconv>

namespace mediidx::tool {
namespace {

/// One question to the database. It answers with id, path, cue_sheet and detail, and with start and
/// is_virtual where they matter.
struct Question {
  Fault fault;
  const char* name;
  const char* text;
  const char* sql;
};

// A virtual track's comment is its start, which holds no slash, and its cue sheet's path behind it.
constexpr std::array kQuestions{
    Question{
        Fault::kTrackWithoutSideRows, "track_without_side_rows",
        "a track without all of its side rows",
        "SELECT t.id, t.path, "
        "CASE WHEN t.is_virtual = 'TRUE' THEN substring(t.comment FROM '/.*') END AS cue_sheet, "
        "concat_ws(', ', "
        "CASE WHEN g.track IS NULL THEN 'genre_track' END, "
        "CASE WHEN c.track IS NULL THEN 'composer_track' END, "
        "CASE WHEN a.track IS NULL THEN 'artist_track' END, "
        "CASE WHEN b.track IS NULL THEN 'album_track' END) AS detail, t.is_virtual "
        "FROM track t "
        "LEFT JOIN (SELECT DISTINCT track FROM genre_track) g ON g.track = t.id "
        "LEFT JOIN (SELECT DISTINCT track FROM composer_track) c ON c.track = t.id "
        "LEFT JOIN (SELECT DISTINCT track FROM artist_track) a ON a.track = t.id "
        "LEFT JOIN (SELECT DISTINCT track FROM album_track) b ON b.track = t.id "
        "WHERE g.track IS NULL OR c.track IS NULL OR a.track IS NULL OR b.track IS NULL "
        "ORDER BY t.path, t.id"},
    Question{Fault::kTrackWithoutMusicRow, "track_without_music_row",
             "a track without its row in music",
             "SELECT t.id, t.path, '' AS cue_sheet, 'music' AS detail "
             "FROM track t "
             "WHERE t.userid = 0 AND t.is_virtual = 'FALSE' "
             "AND NOT EXISTS (SELECT 1 FROM music m WHERE m.path = t.path) "
             "ORDER BY t.path, t.id"},
    Question{Fault::kMusicRowWithoutTrack, "music_row_without_track",
             "a row in music without its track",
             "SELECT m.id, m.path, '' AS cue_sheet, 'track' AS detail "
             "FROM music m "
             "WHERE NOT EXISTS "
             "(SELECT 1 FROM track t WHERE t.path = m.path AND t.is_virtual = 'FALSE') "
             "ORDER BY m.path, m.id"},
    Question{
        Fault::kFileTwice, "file_twice", "an audio file with rows of several saves",
        "SELECT min(id) AS id, path, '' AS cue_sheet, string_agg(DISTINCT kind, ', ') AS detail "
        "FROM (SELECT 'track' AS kind, min(id) AS id, path FROM track "
        "WHERE is_virtual = 'FALSE' GROUP BY path HAVING count(*) > 1 "
        "UNION ALL SELECT 'music', min(id), path FROM music "
        "GROUP BY path HAVING count(*) > 1) AS twice "
        "GROUP BY path ORDER BY path"},
    Question{Fault::kVirtualTrackWithoutOrigin, "virtual_track_without_origin",
             "a virtual track that does not know its cue sheet",
             "SELECT t.id, t.path, substring(t.comment FROM '/.*') AS cue_sheet, "
             "'virtual_info_track' AS detail, "
             "substring(t.comment FROM '^[^/]*') AS start, t.is_virtual "
             "FROM track t "
             "WHERE t.is_virtual = 'TRUE' "
             "AND NOT EXISTS (SELECT 1 FROM virtual_info_track v WHERE v.track = t.id) "
             "ORDER BY t.path, t.id"},
    Question{Fault::kVirtualTrackWithoutSheet, "virtual_track_without_sheet",
             "a virtual track whose cue sheet is not in the index",
             "SELECT t.id, t.path, v.cue_sheet_path AS cue_sheet, "
             "'playlist or personal_playlist' AS detail "
             "FROM track t JOIN virtual_info_track v ON v.track = t.id "
             "WHERE NOT EXISTS (SELECT 1 FROM playlist p WHERE p.path = v.cue_sheet_path) "
             "AND NOT EXISTS (SELECT 1 FROM personal_playlist p WHERE p.path = v.cue_sheet_path) "
             "ORDER BY v.cue_sheet_path, t.id"},
    Question{Fault::kVirtualTrackWithoutMusicRow, "virtual_track_without_music_row",
             "a virtual track without its row in virtual_music",
             "SELECT t.id, t.path, substring(t.comment FROM '/.*') AS cue_sheet, "
             "'virtual_music' AS detail "
             "FROM track t "
             "WHERE t.userid = 0 AND t.is_virtual = 'TRUE' "
             "AND NOT EXISTS "
             "(SELECT 1 FROM virtual_music m WHERE m.path = t.path AND m.track = t.track) "
             "ORDER BY t.path, t.id"},
    Question{Fault::kVirtualMusicRowWithoutTrack, "virtual_music_row_without_track",
             "a row in virtual_music without its track",
             "SELECT m.id, m.path, substring(m.comment FROM '/.*') AS cue_sheet, "
             "'track' AS detail "
             "FROM virtual_music m "
             "WHERE NOT EXISTS (SELECT 1 FROM track t "
             "WHERE t.path = m.path AND t.track = m.track AND t.is_virtual = 'TRUE') "
             "ORDER BY m.path, m.id"},
    Question{Fault::kHasVirtualNotSet, "has_virtual_not_set",
             "an audio file that does not say that it has virtual tracks",
             "SELECT t.id, t.path, '' AS cue_sheet, 'has_virtual' AS detail "
             "FROM track t "
             "WHERE t.is_virtual = 'FALSE' AND t.has_virtual IS DISTINCT FROM 'TRUE' "
             "AND EXISTS (SELECT 1 FROM track v WHERE v.path = t.path AND v.is_virtual = 'TRUE') "
             "ORDER BY t.path, t.id"},
    Question{Fault::kSideRowWithoutTrack, "side_row_without_track",
             "side rows of a track that is gone",
             "SELECT s.track AS id, '' AS path, '' AS cue_sheet, "
             "string_agg(DISTINCT s.kind, ', ') AS detail "
             "FROM (SELECT 'genre_track' AS kind, track FROM genre_track "
             "UNION ALL SELECT 'composer_track', track FROM composer_track "
             "UNION ALL SELECT 'artist_track', track FROM artist_track "
             "UNION ALL SELECT 'album_track', track FROM album_track "
             "UNION ALL SELECT 'virtual_info_track', track FROM virtual_info_track "
             "UNION ALL SELECT 'rating_track', track FROM rating_track "
             "UNION ALL SELECT 'replaygain_track', track FROM replaygain_track) AS s "
             "WHERE NOT EXISTS (SELECT 1 FROM track t WHERE t.id = s.track) "
             "GROUP BY s.track ORDER BY s.track"},
};

constexpr bool stand_in_order() {
  for (std::size_t i = 0; i < kQuestions.size(); ++i) {
    if (kQuestions[i].fault != static_cast<Fault>(i)) return false;
  }
  return true;
}
static_assert(stand_in_order());

const Question& question_of(Fault fault) { return kQuestions.at(static_cast<std::size_t>(fault)); }

unsigned id_in(const Rows& rows) {
  const auto text = rows.text("id");
  unsigned id = 0;
  std::from_chars(text.data(), text.data() + text.size(), id);
  return id;
}

}  // namespace

const char* name_of(Fault fault) { return question_of(fault).name; }
const char* text_of(Fault fault) { return question_of(fault).text; }

std::vector<HalfWritten> find_half_written(Database& database) {
  std::vector<HalfWritten> out;
  for (const auto& question : kQuestions) {
    for (auto rows = database.query(question.sql); rows.next();) {
      out.push_back({question.fault, id_in(rows), rows.text("path"), rows.text("cue_sheet"),
                     rows.text("detail"), rows.text("start"), rows.text("is_virtual") == "TRUE"});
    }
  }
  return out;
}

}  // namespace mediidx::tool
