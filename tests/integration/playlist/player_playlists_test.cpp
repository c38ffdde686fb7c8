// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Playlists as common players write them, made by us in their style, against the database.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "database.h"
#include "mediidx/playlist.h"

namespace {

namespace fs = std::filesystem;
using mediidx::test::quoted;

/// What each entry of a list should come to: its path below the scratch folder (or as it is, for a
/// stream), and its title.
struct PlayerCase {
  const char* file;
  std::vector<std::pair<std::string, std::string>> entries;
  friend void PrintTo(const PlayerCase& test, std::ostream* out) { *out << test.file; }
};

class PlayerPlaylist : public mediidx::test::DatabaseTest,
                       public testing::WithParamInterface<PlayerCase> {
 protected:
  PlayerPlaylist() {
    root.make_link("var/services/music", root.at("share"));
    root.write("etc/tavoinfo.conf", "codepage=\"enu\"\n");
    rows("INSERT INTO music(path, title) VALUES(" + quoted(root.at("share/Band/Live (100%).mp3")) +
         ", 'Known')");
  }
};

TEST_P(PlayerPlaylist, GivesItsEntries) {
  const auto list = root.make_folder("share/lists") + "/" + GetParam().file;
  fs::copy_file(fs::path(MEDIIDX_FIXTURES) / "playlists" / GetParam().file, list);
  int count = 0;
  auto* head = ParsePlayListByFieldGivenPath(
      list.c_str(), &count, 0, 0, "id, path, title",
      MEDIIDX_KEEP_KNOWN | MEDIIDX_KEEP_UNKNOWN | MEDIIDX_KEEP_STREAMS);
  std::vector<std::pair<std::string, std::string>> entries;
  for (const auto* node = head; node; node = node->next) {
    const std::string path = node->info.path;
    const auto below = root.at("share/");
    entries.emplace_back(path.starts_with(below) ? path.substr(below.size()) : path,
                         node->info.title);
  }
  TAVOPlaylistRecFree(head);
  EXPECT_EQ(entries, GetParam().entries);
  EXPECT_EQ(count, static_cast<int>(GetParam().entries.size()));
}

INSTANTIATE_TEST_SUITE_P(
    Players, PlayerPlaylist,
    testing::Values(
        PlayerCase{
            "winamp_cp1252.m3u",
            {{"lists/Été/01 Chanson.mp3", "Été - Chanson"}, {"Band/Live (100%).mp3", "Known"}}},
        PlayerCase{"vlc.m3u8",
                   {{"Band/Live (100%).mp3", "Known"},
                    {"http://radio.example/stream", "Radio"},
                    {"lists/日本/歌.mp3", "歌.mp3"}}},
        PlayerCase{"foobar_utf8_bom.m3u8",
                   {{"Music/Band/Live (100%).mp3", "Band - Live"}, {"it's.mp3", "It's"}}},
        PlayerCase{"media_player.wpl",
                   {{"Band/Live (100%).mp3", "Known"},
                    {"lists/Rock & Roll/it's.mp3", "it's.mp3"},
                    {"lists/日本/歌.mp3", "歌.mp3"}}},
        PlayerCase{"winamp.pls",
                   {{"Band/Live (100%).mp3", "Known"}, {"http://radio.example/stream", "stream"}}},
        PlayerCase{"rhythmbox.pls",
                   {{"Band/Live (100%).mp3", "Known"}, {"lists/日本/歌.mp3", "歌.mp3"}}},
        PlayerCase{
            "mpd.m3u",
            {{"lists/Band/Live (100%).mp3", "Live (100%).mp3"}, {"lists/日本/歌.mp3", "歌.mp3"}}}),
    [](const auto& test) {
      std::string name = test.param.file;
      for (char& c : name) {
        if (!std::isalnum(static_cast<unsigned char>(c))) c = '_';
      }
      return name;
    });

}  // namespace
