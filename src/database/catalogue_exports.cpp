// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The exported functions of the catalogue.
#include "database/album_artist.h"
#include "database/album_artist_recovery.h"
#include "database/catalogue.h"
#include "database/side_rating.h"
#include "database/side_rows.h"
#include "database/track_row.h"
#include "mediidx/catalogue.h"
#include "support/log.h"
#include "support/no_throw.h"

namespace {

using namespace mediidx::catalogue;

int status(bool done) { return done ? 0 : -1; }
int answer(std::optional<int> count) { return count.value_or(-1); }
Leaving leaving(int is_cue) { return is_cue ? Leaving::kCueSheet : Leaving::kAudioFile; }

/// Calls `body` with the connection when neither it nor another needed argument is missing.
template <class Body>
int call(tavodb_connection* conn, bool complete, Body body) noexcept {
  return mediidx::no_throw(mediidx::kDatabaseLog, -1, [&] {
    if (conn && complete) return body(Connection(conn));
    mediidx::kDatabaseLog.parens(kBadParametersLine, "Bad parameters.");
    return -1;
  });
}

}  // namespace

extern "C" {

int MediaDBInsertIntoTrackRelatedTables(tavodb_connection* conn, Record* info,
                                        const Record* cueInfo, int isVirtual, int64_t userid) {
  return call(conn, info && (cueInfo || !isVirtual), [&](const Connection& open) {
    return status(insert_track(open, *info, isVirtual ? cueInfo : nullptr, userid));
  });
}

int MediaDBUpdateTrackRelatedTables(tavodb_connection* conn, const Record* info) {
  return call(conn, info,
              [&](const Connection& open) { return status(update_track(open, *info)); });
}

int MediaDBDeleteRecordsInRelatedTables(tavodb_connection* conn, const Record* info) {
  return call(conn, info,
              [&](const Connection& open) { return status(delete_side_rows(open, *info)); });
}

int MediaDBUpdateAlbumTrackTable(tavodb_connection* conn, const char* path, int isCue) {
  return call(conn, path, [&](const Connection& open) {
    return status(recover_album_artists(open, path, leaving(isCue)));
  });
}

int MediaDBInsertIntoTrackTable(tavodb_connection* conn, const Record* info, const Record* cueInfo,
                                int isVirtual, int64_t userid) {
  return call(conn, info && (cueInfo || !isVirtual), [&](const Connection& open) {
    return status(insert_track_row(open, *info, isVirtual ? cueInfo : nullptr, userid));
  });
}

int MediaDBUpdateTrackTable(tavodb_connection* conn, const Record* info) {
  return call(conn, info,
              [&](const Connection& open) { return status(update_track_row(open, *info)); });
}

int MediaDBFindInsertedTrackID(tavodb_connection* conn, Record* info, int isVirtual) {
  return call(conn, info, [&](const Connection& open) {
    return answer(find_inserted_track_id(open, *info, isVirtual));
  });
}

int MediaDBFindRecordsWithSamePath(tavodb_connection* conn, const Record* info, int isVirtual) {
  return call(conn, info, [&](const Connection& open) {
    return answer(count_counterparts(open, *info, isVirtual));
  });
}

int MediaDBUpdateHasVirtualColumn(tavodb_connection* conn, const Record* info) {
  return call(conn, info,
              [&](const Connection& open) { return status(mark_actual_row(open, *info)); });
}

int MediaDBUpdateVirtualMusicProperties(tavodb_connection* conn, const Record* info,
                                        int isVirtual) {
  return call(conn, info, [&](const Connection& open) {
    return status(copy_audio_properties(open, *info, isVirtual));
  });
}

int MediaDBInsertIntoGenreTrackTable(tavodb_connection* conn, const Record* info, int trackId) {
  return call(conn, info, [&](const Connection& open) {
    return status(insert_genre_rows(open, *info, trackId));
  });
}

int MediaDBInsertOneGenreRecord(tavodb_connection* conn, const char* genre, int trackId) {
  return call(conn, genre, [&](const Connection& open) {
    return status(insert_genre_row(open, genre, trackId));
  });
}

int MediaDBInsertIntoComposerTrackTable(tavodb_connection* conn, const Record* info, int trackId) {
  return call(conn, info, [&](const Connection& open) {
    return status(insert_composer_row(open, *info, trackId));
  });
}

int MediaDBInsertIntoArtistTrackTable(tavodb_connection* conn, const Record* info, int trackId) {
  return call(conn, info, [&](const Connection& open) {
    return status(insert_artist_row(open, *info, trackId));
  });
}

int MediaDBInsertIntoAlbumTrackTable(tavodb_connection* conn, const Record* info,
                                     const char* albumArtist, int trackId, int fromAlbumArtist) {
  return call(conn, info && albumArtist, [&](const Connection& open) {
    return status(insert_album_row(open, *info, albumArtist, trackId, fromAlbumArtist));
  });
}

int MediaDBInsertIntoVirtualInfoTrackTable(tavodb_connection* conn, const Record* info,
                                           const Record* cueInfo, int trackId) {
  return call(conn, info && cueInfo, [&](const Connection& open) {
    return status(insert_virtual_info_row(open, *info, *cueInfo, trackId));
  });
}

int MediaDBInsertIntoRatingTrackTable(tavodb_connection* conn, const Record* info, int trackId,
                                      int isVirtual) {
  return call(conn, info, [&](const Connection& open) {
    return status(insert_rating_rows(open, *info, trackId, isVirtual));
  });
}

int MediaDBInsertIntoReplayGainTrackTable(tavodb_connection* conn, const float* gains,
                                          int trackId) {
  return call(conn, gains, [&](const Connection& open) {
    return status(insert_replay_gain_row(open, std::span<const float, 4>(gains, 4), trackId));
  });
}

int MediaDBFindAlbumCollapseSingleAlbumArtist(tavodb_connection* conn, const Record* info) {
  return call(conn, info, [&](const Connection& open) {
    return answer(count_rows_against_artist(open, *info));
  });
}

int MediaDBUpdateAlbumWithMultipleAlbumArtist(tavodb_connection* conn, const Record* info) {
  return call(conn, info,
              [&](const Connection& open) { return status(collapse_album(open, *info)); });
}

int MediaDBCheckRecordInMultipleAlbumArtist(tavodb_connection* conn, const char* path, int isCue) {
  return call(conn, path, [&](const Connection& open) {
    return answer(count_collapsed_rows(open, path, leaving(isCue)));
  });
}

int MediaDBCheckRecordsWithMultipleAlbumArtist(tavodb_connection* conn, const char* path,
                                               int isCue) {
  return call(conn, path, [&](const Connection& open) {
    return answer(count_remaining_artists(open, path, leaving(isCue)));
  });
}

int MediaDBRecoverToSingleAlbumArtist(tavodb_connection* conn, const char* path, int isCue) {
  return call(conn, path, [&](const Connection& open) {
    return status(recover_single_artist(open, path, leaving(isCue)));
  });
}

int MediaDBFindPersonalDirWithSamePath(tavodb_connection* conn, const char* path) {
  return call(conn, path, [&](const Connection& open) {
    return answer(count_personal_directories(open, path));
  });
}

}  // extern "C"
