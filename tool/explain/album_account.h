// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Where the album artists of an album come from.
#ifndef MEDIIDX_TOOL_EXPLAIN_ALBUM_ACCOUNT_H_
#define MEDIIDX_TOOL_EXPLAIN_ALBUM_ACCOUNT_H_

#include <string>
#include <vector>

#include "store/database.h"

namespace mediidx::tool {

/// Where the album artist of one track comes from.
enum class ArtistSource {
  kTag,       ///< The track's own album-artist tag.
  kArtist,    ///< No tag: the track's artist, the only one of the album's untagged tracks.
  kSeveral,   ///< No tag, or an overruled one, and the album's tracks name several artists: none.
  kLastLeft,  ///< The one artist that was left when a file of several artists went; it may stand in
              ///< place of a tag.
  kUnknown,   ///< Rows that no save leaves behind.
};
/// For programs: "tag", "artist", …
const char* name_of(ArtistSource source);

struct AlbumTrack {
  std::string path;
  std::string title;
  std::string artist;
  std::string album_artist;
  std::string cue_sheet;  ///< Of a track that one cuts out of the file.
  int disc = 0;
  int track = 0;
  long userid = 0;
  bool is_tagged = false;  ///< The track has an album-artist tag.
  ArtistSource source = ArtistSource::kUnknown;
};

/// An album: every track with this album name, wherever it lies.
struct AlbumAccount {
  std::string album;
  std::vector<AlbumTrack> tracks;

  /// In people's words, a sentence each.
  std::vector<std::string> sentences() const;
};

/// The albums of this very name, else those that differ from it in the case of a to z only.
std::vector<AlbumAccount> find_albums(Database& database, const std::string& name);

}  // namespace mediidx::tool

#endif
