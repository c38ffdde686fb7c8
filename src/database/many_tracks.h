// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The rows of new tracks in the catalogue's tables, ready to be copied.
#ifndef MEDIIDX_DATABASE_MANY_TRACKS_H_
#define MEDIIDX_DATABASE_MANY_TRACKS_H_

#include <array>
#include <cstdint>
#include <optional>
#include <vector>

#include "database/many_albums.h"
#include "database/many_batch.h"
#include "database/side_rating.h"
#include "mediidx/record.h"

namespace mediidx::many {

/// What a virtual track has of its audio file, when that is in the index.
struct AudioProperties {
  Text channel;
  Text frequency;
  Text bitrate;
  Text container;
  Text codec;
};

/// A new track, and what was found out about it.
struct Track {
  int id;
  const __tag_TAVO_MEDIA_INFO& info;
  std::int64_t userid;
  const Albums::Row& album;
  /// Empty for a track whose ratings cannot be read: it has everything but these.
  const std::optional<std::vector<catalogue::Rating>>& ratings;
};

class TrackTables {
 public:
  void add_song(const Track& track, bool has_virtual,
                const std::optional<std::array<float, 4>>& gains);
  void add_virtual(const Track& track, const __tag_TAVO_MEDIA_INFO& cue_sheet,
                   const AudioProperties& audio);
  void copy(Batch& batch) const;

 private:
  void add_side_rows(const Track& track);
  void add_genres(const Track& track);
  void add_album(const Track& track);

  CopyRows tracks_{
      "track(id, userid, path, title, title_sort, title_search, agg_genre, agg_genre_sort, "
      "agg_genre_search, filesize, year, frequency, channel, bitrate, duration, comment, track, "
      "disc, container, codec, is_virtual, has_virtual, covercount, date, mdate)"};
  CopyRows genres_{"genre_track(track, genre, genre_sort, genre_search)"};
  CopyRows composers_{"composer_track(track, composer, composer_sort, composer_search)"};
  CopyRows artists_{"artist_track(track, artist, artist_sort, artist_search, has_album_artist)"};
  CopyRows albums_{
      "album_track(track, album, album_sort, album_search, album_artist, album_artist_sort, "
      "album_artist_search, from_album_artist)"};
  CopyRows virtual_infos_{"virtual_info_track(track, audio_offset, cue_sheet_path)"};
  CopyRows ratings_{"rating_track(userid, track, star)"};
  CopyRows gains_{
      "replaygain_track(track, rg_track_gain, rg_track_peak, rg_album_gain, rg_album_peak)"};
};

/// Writes what became of rows that albums had before.
void update_albums(Batch& batch, const Albums& albums);

/// Loads rows of a query that names them album, album_artist, from_album_artist, artist, file,
/// leaves and counts.
void load_albums(const OwnedResult& rows, Albums& albums);

}  // namespace mediidx::many

#endif
