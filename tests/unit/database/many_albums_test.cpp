// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/many_albums.h"

#include <gtest/gtest.h>

#include <random>
#include <tuple>

#include "integration/catalogue/album_model.h"

namespace mediidx::many {
namespace {

using test::AlbumModel;

/// "artist follows" or "artist stands".
std::string shown(const Albums::Row& row) {
  return row.album_artist.value_or("<null>") + (row.follows ? " follows" : " stands");
}

Albums::Row row_of(const char* artist, const char* album_artist, bool follows,
                   const std::string& file = "") {
  return {artist, album_artist, follows, file, !file.empty(), true};
}

TEST(AnAlbum, FollowsItsOneArtist) {
  Albums albums;
  const auto one = albums.add("Hits", "X", "", "/1");
  const auto two = albums.add("Hits", "X", "", "/2");
  EXPECT_EQ(shown(albums.added(one)), "X follows");
  EXPECT_EQ(shown(albums.added(two)), "X follows");
  EXPECT_TRUE(albums.changes().empty());
}

TEST(AnAlbum, CollapsesWithASecondArtist) {
  Albums albums;
  const auto one = albums.add("Hits", "X", "", "/1");
  const auto two = albums.add("Hits", "Y", "", "/2");
  const auto three = albums.add("Hits", "X", "", "/3");
  const auto other = albums.add("hits", "Z", "", "/4");
  EXPECT_EQ(shown(albums.added(one)), " stands");
  EXPECT_EQ(shown(albums.added(two)), " stands");
  EXPECT_EQ(shown(albums.added(three)), " stands");
  EXPECT_EQ(shown(albums.added(other)), "Z follows");
}

TEST(AnAlbum, LeavesTaggedTracksAlone) {
  Albums albums;
  const auto tagged = albums.add("Hits", "X", "Band", "/1");
  const auto untagged = albums.add("Hits", "Y", "", "/2");
  EXPECT_EQ(shown(albums.added(tagged)), "Band stands");
  EXPECT_EQ(shown(albums.added(untagged)), "Y follows");
}

TEST(AnAlbum, FollowsTheArtistThatIsLeft) {
  Albums albums;
  const auto one = albums.add("Hits", "X", "", "/1");
  albums.add("Hits", "Y", "", "/2");
  const auto tagged = albums.add("Hits", "X", "Band", "/3");
  albums.leave("/2");
  EXPECT_EQ(shown(albums.added(one)), "X follows");
  EXPECT_EQ(shown(albums.added(tagged)), "X follows") << "tags do not protect from a recovery";
}

TEST(AnAlbum, StaysCollapsedWhileTwoArtistsAreLeft) {
  Albums albums;
  const auto one = albums.add("Hits", "X", "", "/1");
  albums.add("Hits", "Y", "", "/2");
  albums.add("Hits", "Z", "", "/3");
  albums.leave("/2");
  albums.leave("/never there");
  EXPECT_EQ(shown(albums.added(one)), " stands");
}

TEST(AnAlbum, TellsWhatBecameOfItsRowsInTheDatabase) {
  Albums albums;
  albums.load("Hits", row_of("X", "X", true));
  albums.add("Hits", "Y", "", "/2");
  const auto changes = albums.changes();
  ASSERT_EQ(changes.size(), 1U);
  EXPECT_EQ(changes[0].album, "Hits");
  EXPECT_TRUE(changes[0].followed);
  EXPECT_EQ(changes[0].album_artist, "");
  EXPECT_FALSE(changes[0].follows);
}

TEST(AnAlbum, RecoversToTheNullOfATrackWithoutArtist) {
  Albums albums;
  albums.load("Hits", {std::nullopt, "", false, "", false, true});
  albums.load("Hits", row_of("Y", "", false, "/2"));
  albums.leave("/2");
  const auto changes = albums.changes();
  ASSERT_EQ(changes.size(), 1U);
  EXPECT_EQ(changes[0].album_artist, std::nullopt);
  EXPECT_TRUE(changes[0].follows);
}

TEST(AnAlbum, CountsNoArtistThatIsNotBesideALeavingFile) {
  Albums albums;
  albums.load("Hits", {"V", "", false, "/2", false, true});  // a virtual track of the file
  albums.load("Hits", {"W", "", false, "", false, false});   // one of no cue sheet
  albums.load("Hits", row_of("Y", "", false, "/2"));
  albums.load("Hits", row_of("X", "", false));
  albums.leave("/2");
  const auto changes = albums.changes();
  ASSERT_EQ(changes.size(), 1U);
  EXPECT_EQ(changes[0].album_artist, "X");
}

/// Random steps told to the model and, from some step on, to albums loaded with its rows.
class Replays : public testing::TestWithParam<bool> {
 protected:
  struct Track {
    AlbumModel::Key key;
    AlbumModel::Tags tags;
  };

  unsigned below(unsigned n) { return static_cast<unsigned>(random() % n); }
  std::string path() { return std::string("/") + "abcd"[below(4)]; }
  std::string sheet() { return std::string("/") + "xyz"[below(3)]; }
  AlbumModel::Tags tags() {
    return {below(3) == 0 ? "" : "Hits", std::string(1, "XYZ"[below(3)]),
            below(5) == 0 ? "Band" : ""};
  }
  AlbumModel::Key virtual_key(const std::string& sheet, int number) {
    return {path(), number, sheet};
  }

  /// A save of a file or of a sheet with up to two tracks; numbers are the sheet's own.
  std::vector<Track> step(bool of_sheets) {
    if (!of_sheets) return {{{path(), 0, ""}, tags()}};
    const auto name = sheet();
    const int first = (name[1] - 'x') * 10;
    std::vector<Track> tracks;
    for (int i = 0; i < 2; ++i) tracks.push_back({virtual_key(name, first + i), tags()});
    return tracks;
  }
  static void tell(AlbumModel& model, const std::vector<Track>& tracks) {
    if (tracks[0].key.cue_sheet.empty()) {
      return model.save_file(tracks[0].key, tracks[0].tags);
    }
    model.remove_cue_sheet(tracks[0].key.cue_sheet);
    for (const auto& track : tracks) model.save_cue_sheet({{track.key, track.tags}});
  }
  static Albums load(const AlbumModel& model, bool of_sheets) {
    Albums albums;
    for (const auto& [key, row] : model.rows()) {
      const bool is_virtual = !key.cue_sheet.empty();
      albums.load(row.tags.album,
                  {row.tags.artist, row.album_artist, row.following,
                   of_sheets ? key.cue_sheet : key.path, is_virtual == of_sheets, true});
    }
    return albums;
  }

  std::mt19937 random{7};
};

TEST_P(Replays, GiveWhatTheRulesGive) {
  const bool of_sheets = GetParam();
  for (int run = 0; run < 4000; ++run) {
    AlbumModel model;
    for (unsigned i = below(12); i > 0; --i) tell(model, step(below(2) == 0));
    const auto before = model.rows();
    auto albums = load(model, of_sheets);
    std::map<AlbumModel::Key, std::size_t> added;
    for (unsigned i = below(12); i > 0; --i) {
      const auto tracks = step(of_sheets);
      tell(model, tracks);
      const auto& key = tracks[0].key;
      const auto file = of_sheets ? key.cue_sheet : key.path;
      albums.leave(file);
      std::erase_if(added, [&](const auto& entry) {
        return (of_sheets ? entry.first.cue_sheet : entry.first.path) == file;
      });
      for (const auto& track : tracks) {
        added[track.key] =
            albums.add(track.tags.album, track.tags.artist, track.tags.album_artist, file);
      }
    }

    std::map<std::pair<std::string, bool>, Albums::Change> changes;
    for (auto& change : albums.changes()) changes[{change.album, change.followed}] = change;
    for (const auto& [key, row] : model.rows()) {
      SCOPED_TRACE(key.path + " " + key.cue_sheet + " in run " + std::to_string(run));
      if (const auto found = added.find(key); found != added.end()) {
        const auto& given = albums.added(found->second);
        ASSERT_EQ(given.album_artist, row.album_artist);
        ASSERT_EQ(given.follows, row.following);
        continue;
      }
      const auto& old = before.at(key);
      const auto change = changes.find({old.tags.album, old.following});
      ASSERT_EQ(change == changes.end() ? old.album_artist : change->second.album_artist,
                row.album_artist);
      ASSERT_EQ(change == changes.end() ? old.following : change->second.follows, row.following);
    }
  }
}

INSTANTIATE_TEST_SUITE_P(OfFilesAndSheets, Replays, testing::Bool());

}  // namespace
}  // namespace mediidx::many
