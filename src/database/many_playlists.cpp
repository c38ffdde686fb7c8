// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Playlists, and the virtual tracks of those that are cue sheets.
#include <cstdlib>
#include <iterator>
#include <set>
#include <string>
#include <utility>

#include "database/catalogue.h"
#include "database/many_kinds.h"
#include "database/many_tracks.h"
#include "database/playlist_count.h"
#include "database/record.h"
#include "database/virtual_tracks.h"
#include "mediidx/database.h"
#include "mediidx/request.h"

namespace mediidx::many {
namespace {

using Info = __tag_TAVO_MEDIA_INFO;

// Tracks of one number in one file, and tracks of two cue sheets, come out as the database happens
// to find them. Only the single save can say how.
constexpr const char* kSelectSharedTracks =
    "SELECT 1 FROM virtual_info_track AS one "
    "JOIN virtual_info_track AS other ON other.track = one.track "
    "WHERE one.cue_sheet_path = ANY($1::text[]) AND other.cue_sheet_path <> one.cue_sheet_path "
    "LIMIT 1";
constexpr const char* kSelectTracks =
    "SELECT path, is_virtual, track.track AS number, channel, frequency, bitrate, container, "
    "codec, cue_sheet_path "
    "FROM track LEFT JOIN virtual_info_track ON virtual_info_track.track = track.id "
    "WHERE path = ANY($1::text[])";
// As for songs.
constexpr const char* kSelectAlbums =
    "WITH losing AS (SELECT unnest($3::text[]) AS name "
    "UNION SELECT album FROM virtual_info_track "
    "JOIN album_track ON album_track.track = virtual_info_track.track "
    "WHERE cue_sheet_path = ANY($1::text[])), "
    "growing AS (SELECT unnest($2::text[]) AS name EXCEPT SELECT name FROM losing) "
    "SELECT DISTINCT album, album_artist, from_album_artist, artist, "
    "CASE WHEN cue_sheet_path = ANY($1::text[]) THEN cue_sheet_path END AS file, "
    "is_virtual = 'TRUE' AS leaves, cue_sheet_path IS NOT NULL OR is_virtual = 'FALSE' AS counts "
    "FROM losing JOIN album_track ON album = name "
    "LEFT JOIN track ON track.id = album_track.track "
    "LEFT JOIN artist_track ON artist_track.track = album_track.track "
    "LEFT JOIN virtual_info_track ON virtual_info_track.track = album_track.track "
    "UNION ALL SELECT name, '', 'TRUE', NULL, NULL, false, true FROM growing "
    "WHERE EXISTS (SELECT 1 FROM album_track "
    "WHERE album = name AND album_artist = '' AND from_album_artist = 'TRUE') "
    "UNION ALL SELECT DISTINCT name, album_artist, 'FALSE', NULL, NULL, false, true FROM growing "
    "JOIN album_track ON album = name AND from_album_artist = 'FALSE'";
constexpr const char* kDeleteTracks =
    "DELETE FROM track "
    "USING virtual_info_track "
    "WHERE track.id = virtual_info_track.track "
    "AND cue_sheet_path = ANY($1::text[]) AND is_virtual = 'TRUE'";
constexpr const char* kDeleteVirtualMusic =
    "DELETE FROM virtual_music "
    "USING unnest($1::text[]) AS pattern "
    "WHERE comment LIKE pattern";
constexpr const char* kDeletePersonalPlaylists =
    "DELETE FROM personal_playlist WHERE path = ANY($1::text[])";
constexpr const char* kDeletePlaylists =
    "DELETE FROM playlist USING unnest($1::text[]) AS given(path) "
    "WHERE playlist.path ~>=~ given.path AND playlist.path ~<=~ given.path";
constexpr const char* kMarkActual =
    "UPDATE track "
    "SET has_virtual = 'TRUE' "
    "WHERE path = ANY($1::text[]) AND is_virtual = 'FALSE'";

[[noreturn]] void ambiguous(const char* path) {
  throw GivenUp(std::string("tracks of one number in ") + path);
}

/// A new virtual track.
struct Cut {
  const Info* info;
  const File* sheet;
  std::string comment;
  std::int64_t userid;
  std::optional<std::vector<catalogue::Rating>> ratings;
  std::size_t album = 0;      ///< Its row in the replayed albums.
  bool comment_stays = true;  ///< No later save takes its row out of virtual_music by its end.
};

/// Tracks until the first whose ratings cannot be read, which is the last that is saved.
void look_at_tracks(File& sheet, std::vector<Cut>& cuts) {
  if (!sheet.tracks) {
    log_no_virtual_tracks();
    return;
  }
  for (auto* entry = sheet.tracks; entry; entry = entry->next) {
    auto& info = entry->info;
    Cut cut{&info, &sheet, virtual_comment(info, *sheet.info), owner_of(info.path), {}};
    trim_texts(info);
    if (TAVOMediaIndexIsIndexPath(info.path, MEDIA_TABLE_MUSIC) <= 0) continue;
    cut.ratings = catalogue::read_ratings(info, true);
    cuts.push_back(std::move(cut));
    if (cuts.back().ratings) continue;
    catalogue::log_ratings_not_inserted();
    log_virtual_track_not_related();
    sheet.outcome = Outcome::kPart;
    return;
  }
}

/// The virtual tracks that the audio files have, and what the files themselves are.
class AudioFiles {
 public:
  void load(const OwnedResult& rows) {
    for_each_row(rows, [&](auto field) {
      const char* path = field("path");
      if (text_from(field("is_virtual")) == "TRUE") {
        const char* sheet = field("cue_sheet_path");
        const char* number = field("number");
        add(path, number ? std::atoi(number) : 0, sheet ? sheet : "");
        return;
      }
      const auto is_new =
          files_
              .try_emplace(
                  path, AudioProperties{text_from(field("channel")), text_from(field("frequency")),
                                        text_from(field("bitrate")), text_from(field("container")),
                                        text_from(field("codec"))})
              .second;
      if (!is_new) ambiguous(path);
    });
  }
  void add(const std::string& path, int number, const std::string& sheet) {
    numbers_.emplace(std::pair(path, number), sheet);
    sheets_[sheet].emplace_back(path, number);
  }
  bool has(const std::string& path, int number) const { return numbers_.contains({path, number}); }
  void drop(const std::string& sheet) {
    const auto found = sheets_.find(sheet);
    if (found == sheets_.end()) return;
    for (const auto& track : found->second) {
      const auto [first, last] = numbers_.equal_range(track);
      for (auto entry = first; entry != last;) {
        entry = entry->second == sheet ? numbers_.erase(entry) : std::next(entry);
      }
    }
    sheets_.erase(found);
  }
  /// Nothing for a file that is not in the index.
  AudioProperties properties(const char* path) const {
    const auto found = files_.find(path);
    return found == files_.end() ? AudioProperties() : found->second;
  }

 private:
  using Track = std::pair<std::string, int>;
  std::map<std::string, AudioProperties, std::less<>> files_;
  std::multimap<Track, std::string> numbers_;  ///< Each with its cue sheet.
  std::map<std::string, std::vector<Track>> sheets_;
};

void replay(std::span<const File> files, std::vector<Cut>& cuts, AudioFiles& audio,
            Albums& albums) {
  std::size_t begin = 0;  // of the file's own tracks
  for (const auto& file : files) {
    const std::string path = file.info->path;
    albums.leave(path);
    audio.drop(path);
    for (auto& cut : std::span(cuts).first(begin)) {
      if (cut.comment.ends_with(path)) cut.comment_stays = false;
    }
    auto end = begin;
    for (; end < cuts.size() && cuts[end].sheet == &file; ++end) {
      auto& cut = cuts[end];
      const auto& info = *cut.info;
      if (audio.has(info.path, info.track)) ambiguous(info.path);
      audio.add(info.path, info.track, path);
      cut.album = albums.add(info.album, info.artist, info.album_artist, path);
    }
    begin = end;
  }
}

struct PlaylistRows {
  void add(const Info& info) {
    const auto userid = owner_of(info.path);
    const int songs = playlist_song_count(info.path);
    const char* date = date_or_epoch(info.date);
    const char* mdate = date_or_epoch(info.mdate);
    if (userid != 0) {
      personal.add(userid, info.path, info.filesize, info.title, info.album, songs, date, mdate,
                   info.fs_uuid, 1);
    } else {
      shared.add(info.path, info.filesize, info.title, info.album, songs, date, mdate,
                 info.fs_uuid);
    }
  }
  void copy(Batch& batch) const {
    batch.copy(shared);
    batch.copy(personal);
  }
  CopyRows shared{"playlist(path, filesize, title, album, song_count, date, mdate, fs_uuid)"};
  CopyRows personal{
      "personal_playlist(userid, path, filesize, title, album, song_count, date, mdate, fs_uuid, "
      "updated)"};
};

void add_virtual_music(CopyRows& rows, const Cut& cut) {
  const auto& info = *cut.info;
  rows.add(info.path, info.title, info.album, info.artist, info.album_artist, info.composer,
           info.year, info.genre, cut.comment, whole_seconds(info.duration), info.track);
}

/// A pattern for every text that ends with this one.
std::string ending_with(std::string_view text) {
  std::string pattern = "%";
  for (const char c : text) {
    if (c == '\\' || c == '%' || c == '_') pattern += '\\';
    pattern += c;
  }
  return pattern;
}

}  // namespace

void save_playlists(std::span<File> files) {
  PlaylistRows playlists;
  PlaylistRows replaced;
  const auto last = last_of_each_path(files);
  std::vector<Cut> cuts;
  for (auto& file : files) {
    trim_texts(*file.info);
    (last.at(file.info->path) == &file ? playlists : replaced).add(*file.info);
    if (file.is_cue_sheet) look_at_tracks(file, cuts);
  }
  ArrayText paths;
  ArrayText patterns;
  for (const auto& [path, file] : last) {
    paths.add(path);
    patterns.add(ending_with(path));
  }
  std::set<std::string_view> names;
  std::set<std::string_view> losing;  // by what a later save of a sheet replaces
  std::set<std::string_view> audio_paths;
  for (const auto& cut : cuts) {
    names.insert(cut.info->album);
    if (last.at(cut.sheet->info->path) != cut.sheet) losing.insert(cut.info->album);
    audio_paths.insert(cut.info->path);
  }
  ArrayText audio_path_array(audio_paths);

  Batch batch;
  if (TAVODBNumRows(batch.select(kSelectSharedTracks, {paths.value()}).get()) != 0) {
    throw GivenUp("tracks of two cue sheets");
  }
  AudioFiles audio;
  audio.load(batch.select(kSelectTracks, {audio_path_array.value()}));
  Albums albums;
  load_albums(batch.select(kSelectAlbums,
                           {paths.value(), ArrayText(names).value(), ArrayText(losing).value()}),
              albums);
  replay(files, cuts, audio, albums);

  const auto ids = batch.reserve_track_ids(cuts.size());
  TrackTables tracks;
  CopyRows virtual_music(
      "virtual_music(path, title, album, artist, album_artist, composer, year, genre, comment, "
      "duration, track)");
  for (std::size_t i = 0; i < cuts.size(); ++i) {
    const auto& cut = cuts[i];
    if (last.at(cut.sheet->info->path) == cut.sheet) {
      tracks.add_virtual({ids[i], *cut.info, cut.userid, albums.added(cut.album), cut.ratings},
                         *cut.sheet->info, audio.properties(cut.info->path));
    }
    if (cut.comment_stays && cut.userid == 0) add_virtual_music(virtual_music, cut);
  }

  replaced.copy(batch);
  batch.run(kDeleteTracks, {paths.value()});
  batch.run(kDeleteVirtualMusic, {patterns.value()});
  batch.run(kDeletePersonalPlaylists, {paths.value()});
  batch.run(kDeletePlaylists, {paths.value()});
  update_albums(batch, albums);
  playlists.copy(batch);
  tracks.copy(batch);
  batch.copy(virtual_music);
  batch.run(kMarkActual, {audio_path_array.value()});
  batch.commit();
}

}  // namespace mediidx::many
