// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/catalogue.h"

#include "database/album_artist.h"
#include "database/album_artist_recovery.h"
#include "database/side_rating.h"
#include "database/side_rows.h"
#include "database/track_row.h"

namespace mediidx::catalogue {
namespace {

constexpr Template<int, int, int, int> kDeleteSideRows =
    "DELETE FROM album_track "
    "WHERE track = @TAVO:INT; "
    "DELETE FROM artist_track "
    "WHERE track = @TAVO:INT; "
    "DELETE FROM genre_track "
    "WHERE track = @TAVO:INT; "
    "DELETE FROM composer_track "
    "WHERE track = @TAVO:INT; ";

/// Makes both sides of a file with virtual tracks agree, whichever of them came second.
bool join_counterparts(const Connection& conn, const Record& info, bool is_virtual) {
  const auto counterparts = count_counterparts(conn, info, is_virtual);
  if (!counterparts) {
    return failed(kFindCounterpartsFailedLine, "Failed to find records with the same path");
  }
  if (*counterparts == 0) return true;
  if (!mark_actual_row(conn, info)) {
    return failed(kHasVirtualFailedLine,
                  "Failed to update has_virtual column of corresponding actual record");
  }
  return copy_audio_properties(conn, info, is_virtual) ||
         failed(kPropertiesFailedLine,
                "Failed to update music properties of corresponding virtual records");
}

/// The rows that an update writes anew.
bool insert_tag_rows(const Connection& conn, const Record& info, int track_id) {
  if (!insert_genre_rows(conn, info, track_id)) {
    return failed(kInsertGenreFailedLine, "Failed to insert data into genre_track table");
  }
  if (!insert_composer_row(conn, info, track_id)) {
    return failed(kInsertComposerFailedLine, "Failed to insert data into composer_track table");
  }
  if (!insert_artist_row(conn, info, track_id)) {
    return failed(kInsertArtistFailedLine, "Failed to insert data into artist_track table");
  }
  return insert_album_of_track(conn, info, track_id);
}

}  // namespace

void log_ratings_not_inserted() {
  failed(kInsertRatingFailedLine, "Failed to insert rating data into rating_track table");
}

bool insert_track(const Connection& conn, Record& info, const Record* cue_sheet,
                  std::int64_t userid) {
  const bool is_virtual = cue_sheet != nullptr;
  if (!insert_track_row(conn, info, cue_sheet, userid)) {
    return failed(kInsertTrackFailedLine, "Failed to insert data into track table");
  }
  const auto track_id = find_inserted_track_id(conn, info, is_virtual);
  if (!track_id) return failed(kFindIdFailedLine, "Failed to find inserted track id");
  if (!join_counterparts(conn, info, is_virtual)) return false;
  if (!insert_tag_rows(conn, info, *track_id)) return false;
  if (cue_sheet && !insert_virtual_info_row(conn, info, *cue_sheet, *track_id)) {
    return failed(kInsertVirtualInfoFailedLine,
                  "Failed to insert data into virtual_info_track table");
  }
  if (insert_rating_rows(conn, info, *track_id, is_virtual)) return true;
  log_ratings_not_inserted();
  return false;
}

bool update_track(const Connection& conn, const Record& info) {
  if (!update_track_row(conn, info)) {
    return failed(kUpdateTrackFailedLine, "Failed to update data in track table");
  }
  if (!delete_side_rows(conn, info)) {
    return failed(kDeleteRelatedFailedLine, "Failed to delete records in track related tables");
  }
  return insert_tag_rows(conn, info, static_cast<int>(info.id));
}

bool delete_side_rows(const Connection& conn, const Record& info) {
  if (!recover_album_artists(conn, info.path, Leaving::kAudioFile)) {
    return failed(kRecoverAlbumFailedLine, "Failed to update album_track table");
  }
  const int id = static_cast<int>(info.id);
  // Filled for PostgreSQL whatever the connection says it is.
  return conn.run(kSideRowsDeleteLine,
                  fill(TAVODB_TYPE_POSTGRESQL, kDeleteSideRows, id, id, id, id));
}

}  // namespace mediidx::catalogue
