// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Songs: their rows in the music table and in the catalogue.
#include <set>
#include <string>

#include "database/catalogue.h"
#include "database/many_kinds.h"
#include "database/many_tracks.h"
#include "database/media_save.h"
#include "database/record.h"
#include "mediidx/database.h"

namespace mediidx::many {
namespace {

// Of albums that files leave, and that may recover then, the rows of these files count, and of all
// others whether their artists differ: of a huge album, a few rows tell that. Of the other albums,
// whether they are collapsed, and whom they follow.
constexpr const char* kSelectAlbums =
    "WITH losing AS (SELECT unnest($3::text[]) AS name "
    "UNION SELECT album FROM track JOIN album_track ON album_track.track = track.id "
    "WHERE path = ANY($1::text[]) AND is_virtual = 'FALSE'), "
    "growing AS (SELECT unnest($2::text[]) AS name EXCEPT SELECT name FROM losing), "
    "lost AS (SELECT album, from_album_artist, artist, "
    "CASE WHEN from_album_artist = 'TRUE' AND album_artist <> '' THEN 'tagged' "
    "ELSE album_artist END AS album_artist, "
    "CASE WHEN path = ANY($1::text[]) THEN path END AS file, is_virtual = 'FALSE' AS leaves "
    "FROM losing JOIN album_track ON album = name "
    "LEFT JOIN track ON track.id = album_track.track "
    "LEFT JOIN artist_track ON artist_track.track = album_track.track) "
    "SELECT album, album_artist, from_album_artist, artist, file, leaves, true AS counts "
    "FROM lost WHERE file IS NOT NULL "
    "UNION ALL SELECT album, album_artist, from_album_artist, unnest(ARRAY[min(artist), "
    "max(artist)] || CASE WHEN bool_or(artist IS NULL) THEN ARRAY[NULL::text] END), "
    "NULL, false, true FROM lost WHERE file IS NULL "
    "GROUP BY album, album_artist, from_album_artist "
    "UNION ALL SELECT name, '', 'TRUE', NULL, NULL, false, true FROM growing "
    "WHERE EXISTS (SELECT 1 FROM album_track "
    "WHERE album = name AND album_artist = '' AND from_album_artist = 'TRUE') "
    "UNION ALL SELECT DISTINCT name, album_artist, 'FALSE', NULL, NULL, false, true FROM growing "
    "JOIN album_track ON album = name AND from_album_artist = 'FALSE'";
constexpr const char* kSelectPathsWithVirtual =
    "SELECT DISTINCT path FROM track "
    "WHERE path = ANY($1::text[]) AND is_virtual = 'TRUE'";
constexpr const char* kDeleteTracks =
    "DELETE FROM track "
    "WHERE path = ANY($1::text[]) AND is_virtual = 'FALSE'";
constexpr const char* kDeleteMusic =
    "DELETE FROM music USING unnest($1::text[]) AS given(path) "
    "WHERE music.path ~>=~ given.path AND music.path ~<=~ given.path";
constexpr const char* kPropertiesToVirtual =
    "UPDATE track "
    "SET channel = actual.channel, frequency = actual.frequency, bitrate = actual.bitrate, "
    "container = actual.container, codec = actual.codec "
    "FROM track AS actual "
    "WHERE actual.path = ANY($1::text[]) AND actual.is_virtual = 'FALSE' "
    "AND track.path = actual.path AND track.is_virtual = 'TRUE'";

/// What was found out about a song before anything is written.
struct Song {
  std::int64_t userid;
  std::optional<std::vector<catalogue::Rating>> ratings;
  std::size_t album = 0;  ///< Its row in the replayed albums.
};

std::vector<Song> look_at(std::span<File> files) {
  std::vector<Song> songs;
  songs.reserve(files.size());
  for (auto& file : files) {
    const auto userid = owner_of(file.info->path);
    trim_texts(*file.info);
    songs.push_back({userid, catalogue::read_ratings(*file.info, false)});
    if (songs.back().ratings) continue;
    catalogue::log_ratings_not_inserted();
    log_song_not_related();
    file.outcome = Outcome::kPart;
  }
  return songs;
}

Albums replay(const OwnedResult& rows, std::span<const File> files, std::span<Song> songs) {
  Albums albums;
  load_albums(rows, albums);
  for (std::size_t i = 0; i < files.size(); ++i) {
    const auto& info = *files[i].info;
    albums.leave(info.path);
    songs[i].album = albums.add(info.album, info.artist, info.album_artist, info.path);
  }
  return albums;
}

struct SongRows {
  void copy(Batch& batch) const {
    tracks.copy(batch);
    batch.copy(music);
  }
  TrackTables tracks;
  CopyRows music{
      "music(path, filesize, title, album, artist, album_artist, composer, comment, year, genre, "
      "channel, frequency, bitrate, duration, track, disc, covercount, date, mdate, fs_uuid)"};
};

void add_music_row(CopyRows& music, const __tag_TAVO_MEDIA_INFO& info) {
  music.add(info.path, info.filesize, info.title, info.album, info.artist, info.album_artist,
            info.composer, info.comment, info.year, info.genre, info.channel, info.frequency,
            info.bitrate, whole_seconds(info.duration), info.track, info.disc, info.covercount,
            date_or_epoch(info.date), date_or_epoch(info.mdate), info.fs_uuid);
}

}  // namespace

void save_songs(std::span<File> files) {
  auto songs = look_at(files);
  const auto last = last_of_each_path(files);
  ArrayText paths;
  std::set<std::string_view> names;
  std::set<std::string_view> losing;  // by what a later file replaces
  for (const auto& [path, file] : last) paths.add(path);
  for (const auto& file : files) {
    names.insert(file.info->album);
    if (last.at(file.info->path) != &file) losing.insert(file.info->album);
  }

  Batch batch;
  const auto ids = batch.reserve_track_ids(files.size());
  std::set<std::string, std::less<>> with_virtual;
  for_each_row(batch.select(kSelectPathsWithVirtual, {paths.value()}),
               [&](auto field) { with_virtual.insert(field("path")); });
  const auto albums = replay(batch.select(kSelectAlbums, {paths.value(), ArrayText(names).value(),
                                                          ArrayText(losing).value()}),
                             files, songs);

  SongRows rows;
  SongRows replaced;
  for (std::size_t i = 0; i < files.size(); ++i) {
    const auto& info = *files[i].info;
    const auto& song = songs[i];
    auto& into = last.at(info.path) == &files[i] ? rows : replaced;
    into.tracks.add_song({ids[i], info, song.userid, albums.added(song.album), song.ratings},
                         with_virtual.contains(info.path), files[i].gains);
    // Songs of a personal library live in the catalogue only.
    if (song.userid == 0 && song.ratings) add_music_row(into.music, info);
  }

  replaced.copy(batch);
  batch.run(kDeleteTracks, {paths.value()});
  batch.run(kDeleteMusic, {paths.value()});
  update_albums(batch, albums);
  rows.copy(batch);
  batch.run(kPropertiesToVirtual, {ArrayText(with_virtual).value()});
  batch.commit();
  for (std::size_t i = 0; i < files.size(); ++i) {
    files[i].info->id = static_cast<std::uint32_t>(ids[i]);
  }
  TAVOIndexMusicTableDirtySet(1);
}

}  // namespace mediidx::many
