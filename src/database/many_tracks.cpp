// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/many_tracks.h"

#include <tavocore.h>

#include <new>

#include "database/catalogue_text.h"
#include "database/record.h"
#include "database/track_genre.h"
#include "support/sort_key.h"

namespace mediidx::many {
namespace {

using catalogue::decimal_text;
using catalogue::text_flag;

constexpr const char* kUpdateAlbums =
    "UPDATE album_track "
    "SET album_artist = changed.artist, album_artist_sort = changed.sort, "
    "album_artist_search = changed.search, from_album_artist = changed.flag "
    "FROM unnest($1::text[], $2::text[], $3::text[], $4::text[], $5::text[], $6::text[]) "
    "AS changed(album, old_flag, artist, sort, search, flag) "
    "WHERE album_track.album = changed.album "
    "AND album_track.from_album_artist = changed.old_flag";

catalogue::AggregatedGenre aggregated_genre(const char* genres) {
  auto all = catalogue::aggregate_genres(genres);
  if (!all) throw std::bad_alloc();
  return *std::move(all);
}

/// The keys of a name; those of SQL null are null.
struct Keys {
  explicit Keys(const Text& name) {
    if (!name) return;
    const NameKeys keys(*name);
    sort = keys.sort;
    search = keys.search;
  }
  Text sort;
  Text search;
};

/// Rows that follow their artist have their album artist from nowhere else.
constexpr const char* from_album_artist(bool follows) { return text_flag(!follows); }

}  // namespace

void TrackTables::add_song(const Track& track, bool has_virtual,
                           const std::optional<std::array<float, 4>>& gains) {
  const auto& info = track.info;
  const NameKeys title(info.title);
  const auto genre = aggregated_genre(info.genre);
  tracks_.add(track.id, track.userid, info.path, info.title, title.sort, title.search, genre.text,
              genre.sort, genre.search, info.filesize, info.year, info.frequency, info.channel,
              info.bitrate, decimal_text(info.duration).data(), info.comment, info.track, info.disc,
              info.container_type, info.video_codec, text_flag(false), text_flag(has_virtual),
              info.covercount, date_or_epoch(info.date), date_or_epoch(info.mdate));
  add_side_rows(track);
  if (!gains || !track.ratings) return;
  gains_.add(track.id, decimal_text((*gains)[0]).data(), decimal_text((*gains)[1]).data(),
             decimal_text((*gains)[2]).data(), decimal_text((*gains)[3]).data());
}

void TrackTables::add_virtual(const Track& track, const __tag_TAVO_MEDIA_INFO& cue_sheet,
                              const AudioProperties& audio) {
  const auto& info = track.info;
  const NameKeys title(info.title);
  const auto genre = aggregated_genre(info.genre);
  constexpr auto kNone = std::nullopt;
  tracks_.add(track.id, track.userid, info.path, info.title, title.sort, title.search, genre.text,
              genre.sort, genre.search, kNone, info.year, audio.frequency, audio.channel,
              audio.bitrate, decimal_text(info.duration).data(),
              std::string(info.comment) + cue_sheet.path, info.track, kNone, audio.container,
              audio.codec, text_flag(true), text_flag(false), kNone, date_or_epoch(cue_sheet.date),
              kNone);
  virtual_infos_.add(track.id, info.comment, cue_sheet.path);
  add_side_rows(track);
}

void TrackTables::add_side_rows(const Track& track) {
  const auto& info = track.info;
  add_genres(track);
  const NameKeys composer(info.composer);
  composers_.add(track.id, info.composer, composer.sort, composer.search);
  const NameKeys artist(info.artist);
  artists_.add(track.id, info.artist, artist.sort, artist.search, text_flag(*info.album_artist));
  add_album(track);
  if (!track.ratings) return;
  for (const auto& rating : *track.ratings) ratings_.add(rating.userid, track.id, rating.star);
}

void TrackTables::add_genres(const Track& track) {
  const auto add = [&](const char* genre) {
    const NameKeys keys(genre);
    genres_.add(track.id, genre, keys.sort, keys.search);
  };
  catalogue::GenreTokens tokens(track.info.genre);
  if (!tokens) throw std::bad_alloc();
  char* token = tokens.next();
  if (!token) return add(track.info.genre);
  for (; token; token = tokens.next()) add(StringTrim(token));
}

void TrackTables::add_album(const Track& track) {
  const NameKeys album(track.info.album);
  const Keys artist(track.album.album_artist);
  albums_.add(track.id, track.info.album, album.sort, album.search, track.album.album_artist,
              artist.sort, artist.search, from_album_artist(track.album.follows));
}

void TrackTables::copy(Batch& batch) const {
  for (const auto* rows : {&tracks_, &genres_, &composers_, &artists_, &albums_, &virtual_infos_,
                           &ratings_, &gains_}) {
    batch.copy(*rows);
  }
}

void update_albums(Batch& batch, const Albums& albums) {
  ArrayText names;
  ArrayText old_flags;
  ArrayText artists;
  ArrayText sorts;
  ArrayText searches;
  ArrayText flags;
  for (const auto& change : albums.changes()) {
    const Keys keys(change.album_artist);
    names.add(change.album);
    old_flags.add(from_album_artist(change.followed));
    artists.add(change.album_artist);
    sorts.add(keys.sort);
    searches.add(keys.search);
    flags.add(from_album_artist(change.follows));
  }
  batch.run(kUpdateAlbums, {names.value(), old_flags.value(), artists.value(), sorts.value(),
                            searches.value(), flags.value()});
}

void load_albums(const OwnedResult& rows, Albums& albums) {
  for_each_row(rows, [&](auto field) {
    const auto is_true = [&](const char* column) {
      const char* value = field(column);
      return value && *value == 't';
    };
    const Text flag = text_from(field("from_album_artist"));
    // No rule looks at a row without one.
    if (flag != text_flag(true) && flag != text_flag(false)) return;
    const char* file = field("file");
    albums.load(field("album"), {text_from(field("artist")), text_from(field("album_artist")),
                                 flag == from_album_artist(true), file ? file : "",
                                 is_true("leaves"), is_true("counts")});
  });
}

}  // namespace mediidx::many
