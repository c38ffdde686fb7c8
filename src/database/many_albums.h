// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The album-artist rules, replayed in memory over the rows of the albums concerned.
///
/// A row of album_track follows its own artist ("FALSE") while no other artist of the album stands
/// against it; it stands ("TRUE") with the file's own tag, or, in a collapsed album, with nothing.
#ifndef MEDIIDX_DATABASE_MANY_ALBUMS_H_
#define MEDIIDX_DATABASE_MANY_ALBUMS_H_

#include <array>
#include <cstddef>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

namespace mediidx::many {

class Albums {
 public:
  /// SQL null, or a text.
  using Text = std::optional<std::string>;

  /// What an album row says, beside its album.
  struct Row {
    Text artist;        ///< The track's own.
    Text album_artist;  ///< Null only where the artist of a recovery was.
    bool follows;
    std::string file = {};       ///< The file or cue sheet with which the row may leave.
    bool leaves_with_it = true;  ///< Else it stays, although it is not beside the file either.
    bool counts_beside = true;   ///< Whether its artist counts when another file leaves.
  };

  /// A row of the database. Rows that differ in nothing need be loaded once only.
  void load(const std::string& album, Row row);

  /// A file or cue sheet leaves: albums that are left with one artist follow it, and its rows go.
  void leave(const std::string& file);
  /// A track of a file or cue sheet comes; without a tag of its own (an empty one) it follows its
  /// artist, or the album is collapsed. Returns the row's number.
  std::size_t add(const std::string& album, const std::string& artist,
                  const std::string& album_artist, const std::string& file);

  /// An added row, as it stands now.
  const Row& added(std::size_t number) const;

  /// What became of the rows that an album had in the database.
  struct Change {
    std::string album;
    bool followed;  ///< Which of them: those that followed, or those that stood.
    Text album_artist;
    bool follows;
  };
  std::vector<Change> changes() const;

 private:
  /// The loaded rows of an album that followed, or stood: they have moved together since.
  struct Loaded {
    bool exists = false;
    bool changed = false;
    bool follows = false;
    Text album_artist;
  };
  struct Album {
    std::string name;
    std::vector<Row> rows;
    std::vector<bool> gone;
    std::size_t following = 0;  ///< Rows that follow and are not gone.
    std::array<Loaded, 2> loaded;
  };
  struct Place {
    std::size_t album;
    std::size_t row;
  };

  Album& album_of(const std::string& name);
  std::size_t number_of(const std::string& name);
  Place insert(const std::string& album, Row row);
  static bool stands_against(const Album& album, const std::string& artist);
  static void collapse(Album& album);
  static void recover(Album& album, const Text& artist);

  std::vector<Album> albums_;
  std::unordered_map<std::string, std::size_t> numbers_;
  std::unordered_map<std::string, std::vector<Place>> files_;  ///< Rows that leave with a file.
  std::vector<Place> added_;
};

}  // namespace mediidx::many

#endif
