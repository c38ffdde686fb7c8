// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <json/json.h>
#include <wchar.h>

#include <algorithm>
#include <clocale>
#include <cstdlib>
#include <sstream>

#include "command.h"
#include "database.h"

namespace mediidx::test {
namespace {

using testing::HasSubstr;

const std::string kSamples = MEDIIDX_SAMPLE_LIBRARY;

class Listing : public testing::Test {
 protected:
  static void SetUpTestSuite() {
    TestServer::get().fresh_database();
    folder_ = new OpenFolder;
    run_mediidx({"index", "--data-dir", folder_->at("d"), kSamples});
    TestServer::get().rows(
        "INSERT INTO personal_playlist (userid, path, title, song_count) "
        "VALUES (1000, '/home/u/music/mine.m3u', 'mine', 3)");
    TestServer::get().rows(
        "INSERT INTO personal_directory (userid, path, title) VALUES (1000, '/home/u/music', 'm')");
    TestServer::get().rows(
        "INSERT INTO track (userid, path, title, is_virtual) "
        "VALUES (1000, '/home/u/music/a.mp3', 'Mine ' || chr(27) || '[2J', 'FALSE')");
  }
  static void TearDownTestSuite() { delete folder_; }

  static Outcome list(std::vector<std::string> words, bool on_terminal = false) {
    words.insert(words.begin(), {"list", "--data-dir", folder_->at("d")});
    Setting setting;
    setting.on_terminal = on_terminal;
    return run_mediidx(words, setting);
  }
  static Json::Value json(const std::string& what) {
    std::istringstream in(list({what, "--json"}).out);
    Json::Value out;
    in >> out;
    return out;
  }
  /// The object of one path.
  static Json::Value of_path(const std::string& what, const std::string& path) {
    for (const auto& object : json(what)) {
      if (object["path"] == path) return object;
    }
    return {};
  }

  static inline OpenFolder* folder_ = nullptr;
};

TEST_F(Listing, OfEverythingIsAJsonArrayOfItsRows) {
  const std::pair<const char*, const char*> tables[] = {
      {"music", "track"},
      {"photos", "photo"},
      {"videos", "video"},
      {"albums", "(SELECT DISTINCT album, album_artist FROM album_track WHERE album <> '') a"},
      {"artists", "(SELECT DISTINCT artist FROM artist_track WHERE artist <> '') a"},
      {"genres", "(SELECT DISTINCT genre FROM genre_track WHERE genre <> '') g"},
      {"playlists", "(SELECT path FROM playlist UNION SELECT path FROM personal_playlist) p"},
      {"folders", "(SELECT path FROM directory UNION SELECT path FROM personal_directory) d"},
  };
  for (const auto& [what, table] : tables) {
    const auto rows = TestServer::get().rows(std::string("SELECT count(*) FROM ") + table);
    EXPECT_EQ(std::to_string(json(what).size()), rows[0][0]) << what;
    EXPECT_NE(rows[0][0], "0") << what;
  }
}

TEST_F(Listing, OfMusicHasTypedValues) {
  const auto song = of_path("music", kSamples + "/music/Confluence/02 Weir.ogg");
  EXPECT_EQ(song["title"], "Weir");
  EXPECT_EQ(song["artist"], "Ada Brandt; Mina Okafor");
  EXPECT_EQ(song["album"], "Confluence");
  EXPECT_EQ(song["album_artist"], "The Ferrymen");
  EXPECT_EQ(song["year"], 2018);
  EXPECT_EQ(song["duration"], 2.0);
  EXPECT_EQ(song["virtual"], false);
}

TEST_F(Listing, HasPersonalLibraries) {
  EXPECT_EQ(of_path("music", "/home/u/music/a.mp3")["userid"], 1000);
  EXPECT_EQ(of_path("playlists", "/home/u/music/mine.m3u")["song_count"], 3);
  EXPECT_EQ(of_path("folders", "/home/u/music")["title"], "m");
}

TEST_F(Listing, InAPipeHasALineARowAndNothingElse) {
  const auto run = list({"videos"});
  EXPECT_EQ(run.status, 0);
  EXPECT_EQ(run.err, "");
  EXPECT_EQ(run.out.find("A Day at the Harbour\t0:01\t64\t64\th264\taac\t" + kSamples +
                         "/videos/harbour.mp4\n"),
            run.out.rfind("A Day at the Harbour"));
  EXPECT_EQ(std::count(run.out.begin(), run.out.end(), '\n'), 3);
}

TEST_F(Listing, EscapesControlCharacters) {
  EXPECT_THAT(list({"music"}).out, HasSubstr("Mine \\x1B[2J\t"));
  const auto on_terminal = list({"music"}, true).out;
  EXPECT_THAT(on_terminal, HasSubstr("Mine \\x1B[2J"));
  EXPECT_EQ(on_terminal.find('\x1B'), std::string::npos);
}

TEST_F(Listing, OnATerminalIsATableThatFits) {
  std::setlocale(LC_CTYPE, "C.UTF-8");
  const auto run = list({"music"}, true);
  EXPECT_EQ(run.status, 0);
  EXPECT_EQ(run.out.substr(0, 5), "Title");
  std::istringstream lines(run.out);
  for (std::string line; std::getline(lines, line);) {
    line.erase(line.find_last_not_of('\r') + 1);
    std::wstring wide(line.size(), L' ');
    wide.resize(std::mbstowcs(wide.data(), line.c_str(), wide.size()));
    EXPECT_LE(wcswidth(wide.c_str(), wide.size()), 80) << line;
  }
}

TEST_F(Listing, OfWhatIsNotKnownIsAUsageError) {
  const auto run = list({"songs"});
  EXPECT_EQ(run.status, 2);
  EXPECT_EQ(run.out, "");
  EXPECT_THAT(run.err, HasSubstr("mediidx: list does not know \"songs\""));
}

}  // namespace
}  // namespace mediidx::test
