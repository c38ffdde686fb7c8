// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/many_albums.h"

#include <set>
#include <utility>

namespace mediidx::many {
namespace {

bool is_collapsed(const Albums::Row& row) { return !row.follows && row.album_artist == ""; }

}  // namespace

std::size_t Albums::number_of(const std::string& name) {
  const auto [place, is_new] = numbers_.try_emplace(name, albums_.size());
  if (is_new) albums_.push_back({name, {}, {}, 0, {}});
  return place->second;
}

Albums::Place Albums::insert(const std::string& name, Row row) {
  const auto number = number_of(name);
  auto& album = albums_[number];
  const Place place{number, album.rows.size()};
  if (row.follows) ++album.following;
  if (!row.file.empty() && row.leaves_with_it) files_[row.file].push_back(place);
  album.rows.push_back(std::move(row));
  album.gone.push_back(false);
  return place;
}

void Albums::load(const std::string& album, Row row) {
  const bool follows = row.follows;
  const auto place = insert(album, std::move(row));
  auto& loaded = albums_[place.album].loaded[follows];
  loaded.exists = true;
  loaded.follows = follows;
}

/// A following row of another artist, or a collapsed album.
bool Albums::stands_against(const Album& album, const std::string& artist) {
  for (std::size_t i = 0; i < album.rows.size(); ++i) {
    const auto& row = album.rows[i];
    if (album.gone[i]) continue;
    if (is_collapsed(row)) return true;
    if (row.follows && row.album_artist && *row.album_artist != artist) return true;
  }
  return false;
}

void Albums::collapse(Album& album) {
  for (auto& loaded : album.loaded) {
    if (loaded.exists && loaded.follows) loaded = {true, true, false, ""};
  }
  if (album.following == 0) return;
  for (std::size_t i = 0; i < album.rows.size(); ++i) {
    auto& row = album.rows[i];
    if (!row.follows || album.gone[i]) continue;
    row.follows = false;
    row.album_artist = "";
  }
  album.following = 0;
}

void Albums::recover(Album& album, const Text& artist) {
  for (auto& loaded : album.loaded) {
    if (loaded.exists && !loaded.follows) loaded = {true, true, true, artist};
  }
  for (std::size_t i = 0; i < album.rows.size(); ++i) {
    auto& row = album.rows[i];
    if (row.follows || album.gone[i]) continue;
    row.follows = true;
    row.album_artist = artist;
    ++album.following;
  }
}

void Albums::leave(const std::string& file) {
  const auto leaving = files_.find(file);
  if (leaving == files_.end()) return;
  std::set<std::size_t> collapsed;
  for (const auto& place : leaving->second) {
    if (is_collapsed(albums_[place.album].rows[place.row])) collapsed.insert(place.album);
  }
  std::set<Text> artists;
  for (const auto number : collapsed) {
    const auto& album = albums_[number];
    for (std::size_t i = 0; i < album.rows.size() && artists.size() < 2; ++i) {
      const auto& row = album.rows[i];
      const bool beside = !album.gone[i] && row.counts_beside && row.file != file;
      if (beside && !row.follows) artists.insert(row.artist);
    }
  }
  if (artists.size() == 1) {
    for (const auto number : collapsed) recover(albums_[number], *artists.begin());
  }
  for (const auto& place : leaving->second) {
    auto& album = albums_[place.album];
    album.gone[place.row] = true;
    if (album.rows[place.row].follows) --album.following;
  }
  files_.erase(leaving);
}

std::size_t Albums::add(const std::string& name, const std::string& artist,
                        const std::string& album_artist, const std::string& file) {
  Row row{artist, album_artist, false, file};
  if (album_artist.empty()) {
    auto& album = albums_[number_of(name)];
    if (stands_against(album, artist)) {
      collapse(album);
    } else {
      row.album_artist = artist;
      row.follows = true;
    }
  }
  added_.push_back(insert(name, std::move(row)));
  return added_.size() - 1;
}

const Albums::Row& Albums::added(std::size_t number) const {
  const auto& place = added_[number];
  return albums_[place.album].rows[place.row];
}

std::vector<Albums::Change> Albums::changes() const {
  std::vector<Change> all;
  for (const auto& album : albums_) {
    for (const bool followed : {false, true}) {
      const auto& loaded = album.loaded[followed];
      if (loaded.changed)
        all.push_back({album.name, followed, loaded.album_artist, loaded.follows});
    }
  }
  return all;
}

}  // namespace mediidx::many
