// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "explain/album_account.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <filesystem>
#include <set>

#include "store/query.h"

namespace mediidx::tool {
namespace {

using Text = const char*;

constexpr Template<Text, Text, Text> kSelectTracks{
    "SELECT b.album, t.path, t.title, a.artist, a.has_album_artist, b.album_artist, "
    "b.from_album_artist, v.cue_sheet_path, t.disc, t.track, t.userid "
    "FROM album_track b "
    "JOIN track t ON t.id = b.track "
    "LEFT JOIN artist_track a ON a.track = t.id "
    "LEFT JOIN virtual_info_track v ON v.track = t.id "
    "WHERE b.album = '@TAVO:VAR' OR (b.album_search = upper('@TAVO:VAR' COLLATE \"C\") "
    "AND NOT EXISTS (SELECT 1 FROM album_track e WHERE e.album = '@TAVO:VAR')) "
    "ORDER BY b.album, t.disc, t.track, t.title, t.path, t.id"};

ArtistSource source_of(const AlbumTrack& track, bool from_album_artist) {
  if (!from_album_artist) {
    return track.is_tagged || track.album_artist != track.artist ? ArtistSource::kLastLeft
                                                                 : ArtistSource::kArtist;
  }
  if (track.album_artist.empty()) return ArtistSource::kSeveral;
  return track.is_tagged ? ArtistSource::kTag : ArtistSource::kUnknown;
}

AlbumTrack track_of(const Rows& rows) {
  AlbumTrack out;
  out.path = rows.text("path");
  out.title = rows.text("title");
  out.artist = rows.text("artist");
  out.album_artist = rows.text("album_artist");
  out.cue_sheet = rows.text("cue_sheet_path");
  out.disc = std::atoi(rows.text("disc").c_str());
  out.track = std::atoi(rows.text("track").c_str());
  out.userid = std::atol(rows.text("userid").c_str());
  out.is_tagged = rows.text("has_album_artist") == "TRUE";
  out.source = source_of(out, rows.text("from_album_artist") == "TRUE");
  return out;
}

std::string quoted_or_none(const std::string& artist) {
  return artist.empty() ? "no artist" : "\"" + artist + "\"";
}

/// "\"A\", \"B\" and 3 more"
std::string listed(const std::set<std::string>& artists) {
  constexpr std::size_t kNamed = 5;
  std::string out;
  std::size_t count = 0;
  for (const auto& artist : artists) {
    if (count++ == kNamed) break;
    out += (out.empty() ? "" : ", ") + quoted_or_none(artist);
  }
  if (artists.size() > kNamed) out += " and " + std::to_string(artists.size() - kNamed) + " more";
  return out;
}

std::string tracks_text(std::size_t count) {
  return count == 1 ? "1 track" : std::to_string(count) + " tracks";
}

/// The tracks of one source, and what they name.
struct Group {
  std::size_t tracks = 0;
  std::size_t tagged = 0;
  std::set<std::string> artists;
  std::set<std::string> album_artists;
};

Group group_of(const std::vector<AlbumTrack>& tracks, ArtistSource source) {
  Group out;
  for (const auto& track : tracks) {
    if (track.source != source) continue;
    ++out.tracks;
    out.tagged += track.is_tagged ? 1 : 0;
    out.artists.insert(track.artist);
    out.album_artists.insert(track.album_artist);
  }
  return out;
}

std::string sentence_on(ArtistSource source, const Group& group) {
  const auto tracks = tracks_text(group.tracks);
  switch (source) {
    case ArtistSource::kTag:
      return tracks + " with an album-artist tag: the tag says " + listed(group.album_artists) +
             ".";
    case ArtistSource::kArtist:
      return tracks + " without an album-artist tag, and one artist in all of them: " +
             listed(group.artists) + " stands as album artist too.";
    case ArtistSource::kSeveral: {
      // A tag is overwritten when the album has one artist for a while.
      const auto text = tracks +
                        (group.tagged > 0 ? " whose album-artist tags were overruled"
                                          : " without an album-artist tag") +
                        " in an album of several artists";
      if (group.artists.size() > 1) return text + " (" + listed(group.artists) + "): it has none.";
      return text +
             ": it has none. The others are gone or carry a tag now; when the files are "
             "indexed again, " +
             listed(group.artists) + " becomes the album artist.";
    }
    case ArtistSource::kLastLeft:
      return tracks +
             (group.tagged > 0 ? ", tags of " + std::to_string(group.tagged) + " overruled," : "") +
             " had no single album artist until files of other artists were removed: " +
             listed(group.album_artists) + " was the only artist left.";
    case ArtistSource::kUnknown:
      return tracks +
             " with rows that contradict each other: mediidx repair, or index the album "
             "again.";
  }
  return "";
}

}  // namespace

const char* name_of(ArtistSource source) {
  static constexpr std::array kNames{"tag", "artist", "several_artists", "last_artist_left",
                                     "unknown"};
  static_assert(kNames.size() == static_cast<std::size_t>(ArtistSource::kUnknown) + 1);
  return kNames.at(static_cast<std::size_t>(source));
}

std::vector<std::string> AlbumAccount::sentences() const {
  std::vector<std::string> out;
  for (const auto source : {ArtistSource::kTag, ArtistSource::kArtist, ArtistSource::kSeveral,
                            ArtistSource::kLastLeft, ArtistSource::kUnknown}) {
    const auto group = group_of(tracks, source);
    if (group.tracks > 0) out.push_back(sentence_on(source, group));
  }
  std::set<std::string> folders;
  for (const auto& track : tracks) {
    folders.insert(std::filesystem::path(track.path).parent_path().string());
  }
  if (folders.size() > 1) {
    out.push_back("The tracks lie in " + std::to_string(folders.size()) +
                  " folders: albums are known by their name alone, so those of the same name are "
                  "one.");
  }
  return out;
}

std::vector<AlbumAccount> find_albums(Database& database, const std::string& name) {
  std::vector<AlbumAccount> out;
  auto rows = database.query(filled(kSelectTracks, name.c_str(), name.c_str(), name.c_str()));
  while (rows.next()) {
    const auto album = rows.text("album");
    if (out.empty() || out.back().album != album) out.push_back({album, {}});
    out.back().tracks.push_back(track_of(rows));
  }
  return out;
}

}  // namespace mediidx::tool
