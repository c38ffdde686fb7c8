// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The album-artist rules in plain C++, for comparison with what the database says.
///
/// A row's album artist is the file's own tag, or its artist, or nothing. It is "following" while
/// it is its artist's because no other artist stands against it; a row that is not following is
/// tagged, or belongs to a collapsed album.
#ifndef MEDIIDX_TESTS_CATALOGUE_ALBUM_MODEL_H_
#define MEDIIDX_TESTS_CATALOGUE_ALBUM_MODEL_H_

#include <compare>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <string_view>

namespace mediidx::test {

class AlbumModel {
 public:
  /// One track; `cue_sheet` is empty for an audio file.
  struct Key {
    std::string path;
    int track = 0;
    std::string cue_sheet;
    auto operator<=>(const Key&) const = default;
  };
  struct Tags {
    std::string album;
    std::string artist;
    std::string album_artist;
  };
  struct Row {
    Tags tags;
    std::string album_artist;
    bool following = false;
  };

  /// A file comes in; what is known of its path goes first.
  void save_file(const Key& key, const Tags& tags) {
    remove_file(key.path);
    add(key, tags);
  }
  /// A cue sheet's tracks come in one by one.
  void save_cue_sheet(const std::map<Key, Tags>& tracks) {
    for (const auto& [key, tags] : tracks) add(key, tags);
  }
  void remove_file(const std::string& path) {
    leave([&](const Key& key) { return is_file(key) && key.path == path; },
          // What is cut from the file leaves with it as far as albums are concerned.
          [&](const Key& key) { return key.path != path; });
    std::erase_if(rows_,
                  [&](const auto& row) { return is_file(row.first) && row.first.path == path; });
  }
  void remove_cue_sheet(const std::string& cue_sheet) {
    const auto is_of_sheet = [&](const Key& key) { return key.cue_sheet == cue_sheet; };
    leave(is_of_sheet, std::not_fn(is_of_sheet));
    std::erase_if(rows_, [&](const auto& row) { return is_of_sheet(row.first); });
  }
  /// A folder goes with all that is below it, and no album is looked at.
  void remove_folder(const std::string& folder) {
    std::erase_if(rows_, [&](const auto& row) { return row.first.path.starts_with(folder + "/"); });
  }

  const std::map<Key, Row>& rows() const { return rows_; }

  /// The upper-cased name, and what is left of it without its article.
  static std::string search_key(std::string name) {
    for (char& letter : name) {
      if (letter >= 'a' && letter <= 'z') letter = static_cast<char>(letter & ~0x20);
    }
    return name;
  }
  static std::string sort_key(const std::string& name) {
    const auto key = search_key(name);
    for (const std::string article : {"A ", "AN ", "THE "}) {
      if (key.compare(0, article.size(), article) == 0) return key.substr(article.size());
    }
    return key;
  }

 private:
  static bool is_file(const Key& key) { return key.cue_sheet.empty(); }
  static bool is_collapsed(const Row& row) { return !row.following && row.album_artist.empty(); }

  void add(const Key& key, const Tags& tags) {
    if (!tags.album_artist.empty()) {
      rows_[key] = {tags, tags.album_artist, false};
      return;
    }
    bool alone = true;
    for (const auto& [other, row] : rows_) {
      if (row.tags.album != tags.album) continue;
      if (is_collapsed(row)) alone = false;
      if (row.following && row.album_artist != tags.artist) alone = false;
    }
    if (!alone) collapse(tags.album);
    rows_[key] = alone ? Row{tags, tags.artist, true} : Row{tags, "", false};
  }

  void collapse(const std::string& album) {
    for (auto& [key, row] : rows_) {
      if (row.tags.album == album && row.following) {
        row.album_artist.clear();
        row.following = false;
      }
    }
  }

  /// Collapsed albums of the leaving rows follow the one artist that the staying rows name.
  template <class Leaves, class Stays>
  void leave(Leaves leaves, Stays stays) {
    std::set<std::string> albums;
    for (const auto& [key, row] : rows_) {
      if (leaves(key) && is_collapsed(row)) albums.insert(row.tags.album);
    }
    std::set<std::string> artists;
    for (const auto& [key, row] : rows_) {
      if (albums.contains(row.tags.album) && !row.following && stays(key)) {
        artists.insert(row.tags.artist);
      }
    }
    if (artists.size() != 1) return;
    for (auto& [key, row] : rows_) {
      if (albums.contains(row.tags.album) && !row.following) {
        row.album_artist = *artists.begin();
        row.following = true;
      }
    }
  }

  std::map<Key, Row> rows_;
};

}  // namespace mediidx::test

#endif
