// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <json/json.h>
#include <sys/stat.h>

#include <fstream>
#include <sstream>

#include "command.h"
#include "database.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;

constexpr const char* kSong = "music/Untagged/tape side A.mp3";

class Indexing : public DatabaseTest {
 protected:
  Outcome index(const std::vector<std::string>& folders, const Setting& setting = {}) {
    std::vector<std::string> words{"index", "--data-dir", data.at("d")};
    words.insert(words.end(), folders.begin(), folders.end());
    return run_mediidx(words, setting);
  }
  std::vector<Row> paths(const std::string& table) {
    return rows("SELECT path FROM " + table + " ORDER BY path");
  }
  Json::Value settings(const std::string& file) const {
    std::ifstream in(data.at("d/root/usr/tavo/etc/" + file));
    Json::Value out;
    in >> out;
    return out;
  }

  OpenFolder data;
  OpenFolder media;
};

TEST_F(Indexing, DoesNotOverwriteAConfigurationThatIsNoList) {
  media.take_sample(kSong, "a.mp3");
  ASSERT_EQ(index({media.path()}).status, 0);
  const auto conf = data.at("d/root/usr/tavo/etc/index_folder.conf");
  std::ofstream(conf) << "{\"half\": written";
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 1);
  EXPECT_THAT(run.err, HasSubstr("not a list"));
  std::ostringstream kept;
  kept << std::ifstream(conf).rdbuf();
  EXPECT_EQ(kept.str(), "{\"half\": written");
}

TEST_F(Indexing, PutsEveryKindIntoItsTable) {
  media.take_sample(kSong, "a.mp3");
  media.take_sample("photos/2021 Harbour/IMG_0001.jpg", "b.jpg");
  media.take_sample("videos/harbour.mp4", "c.mp4");
  media.write("sub/d.m3u", "../a.mp3\n");
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_EQ(run.err, "");
  EXPECT_THAT(paths("music"), ElementsAre(Row{media.at("a.mp3")}));
  EXPECT_THAT(paths("photo"), ElementsAre(Row{media.at("b.jpg")}));
  EXPECT_THAT(paths("video"), ElementsAre(Row{media.at("c.mp4")}));
  EXPECT_THAT(paths("playlist"), ElementsAre(Row{media.at("sub/d.m3u")}));
  EXPECT_THAT(paths("directory"), ElementsAre(Row{media.path()}, Row{media.at("sub")}));
}

TEST_F(Indexing, SaysWhatItFound) {
  media.take_sample(kSong, "a.mp3");
  media.take_sample(kSong, "b.mp3");
  const auto run = index({media.path()});
  EXPECT_THAT(run.out, HasSubstr("Indexed " + media.path().string() + ":\n"));
  EXPECT_THAT(run.out, HasSubstr("\n  music               2\n"));
  EXPECT_THAT(run.out, HasSubstr("\n  folders             1\n"));
  EXPECT_THAT(run.out, HasSubstr("\n  failed              0\n"));
  EXPECT_THAT(run.out, HasSubstr("The index is the database mediaserver on "));
  EXPECT_THAT(run.out, HasSubstr("Next: mediidx list albums --data-dir " + data.at("d")));
}

TEST_F(Indexing, TwiceLeavesTheSameRows) {
  const auto samples = media.take_sample("", "samples");
  ASSERT_NE(index({samples}).status, 1);
  const auto all = [this] {
    std::vector<std::vector<Row>> out;
    for (const char* table : {"music", "photo", "video", "playlist", "directory"}) {
      out.push_back(rows("SELECT (to_jsonb(t) - 'id')::text FROM " + std::string(table) +
                         " t ORDER BY path"));
    }
    out.push_back(
        rows("SELECT t.path, t.is_virtual, t.title, a.artist, b.album, b.album_artist, "
             "r.rg_track_gain FROM track t LEFT JOIN artist_track a ON a.track = t.id "
             "LEFT JOIN album_track b ON b.track = t.id "
             "LEFT JOIN replaygain_track r ON r.track = t.id "
             "ORDER BY t.path, t.is_virtual, t.title"));
    out.push_back(rows("SELECT genre, count(*) FROM genre_track GROUP BY genre ORDER BY genre"));
    return out;
  };
  const auto first = all();
  EXPECT_GT(first[0].size(), 30U);
  ASSERT_NE(index({samples}).status, 1);
  EXPECT_EQ(all(), first);
  EXPECT_EQ(settings("index_folder.conf").size(), 1U);
  EXPECT_EQ(settings("share.conf").size(), 1U);
}

TEST_F(Indexing, NamesTheFilesThatCannotBeReadAndGoesOn) {
  media.take_sample("damaged/not a picture.jpg", "bad.jpg");
  media.write("bad.mp3", std::string(5000, 'x'));
  media.write("bad.mkv", "nothing");
  media.take_sample(kSong, "good.mp3");
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 3);
  EXPECT_THAT(run.err, HasSubstr("mediidx: not indexed: " + media.at("bad.jpg") + ": "));
  EXPECT_THAT(run.err, HasSubstr("mediidx: not indexed: " + media.at("bad.mp3") + ": "));
  EXPECT_THAT(run.err, HasSubstr("mediidx: not indexed: " + media.at("bad.mkv") + ": "));
  EXPECT_THAT(run.out, HasSubstr("\n  failed              3\n"));
  EXPECT_THAT(paths("music"), ElementsAre(Row{media.at("good.mp3")}));
}

TEST_F(Indexing, NamesAFileThatCannotBeSavedWithTheServersReason) {
  media.take_sample(kSong, "a.mp3");
  media.take_sample(kSong, "b.mp3");
  rows("ALTER TABLE music ADD CHECK (path NOT LIKE '%/a.mp3')");
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 3);
  EXPECT_THAT(run.err, HasSubstr("mediidx: not indexed: " + media.at("a.mp3") +
                                 ": ERROR:  new row for relation \"music\" violates check"));
  EXPECT_THAT(paths("music"), ElementsAre(Row{media.at("b.mp3")}));
}

TEST_F(Indexing, ListsNamesThatAreNotUtf8Escaped) {
  media.take_sample(kSong, "caf\xE9.mp3");
  media.take_sample(kSong, "good.mp3");
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 3);
  EXPECT_EQ(run.err, "mediidx: not indexed: " + media.at("caf\\xE9.mp3") +
                         ": its name is not valid UTF-8\n");
  EXPECT_THAT(paths("music"), ElementsAre(Row{media.at("good.mp3")}));
}

TEST_F(Indexing, TakesHostileNamesAsTheyAre) {
  const std::string names[] = {"it's \"q\".mp3",  "100%_x.mp3",    "back\\slash\\.mp3",
                               "line\nbreak.mp3", "@TAVO:VAR.mp3", "'; DROP TABLE track; --.mp3",
                               "夜.mp3",          "-dash.mp3"};
  for (const auto& name : names) media.take_sample(kSong, name);
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 0) << run.err;
  for (const auto& name : names) {
    EXPECT_EQ(count("music", "path = " + quoted(media.at(name))), 1) << name;
    EXPECT_EQ(count("track", "path = " + quoted(media.at(name))), 1) << name;
  }
}

TEST_F(Indexing, TakesPathsOfFourThousandBytes) {
  fs::path folder = media.path();
  while (folder.native().size() < 3700) folder /= std::string(200, 'd');
  const auto file = folder / (std::string(200, 'f') + ".mp3");
  fs::create_directories(folder);
  fs::copy_file(fs::path(MEDIIDX_SAMPLE_LIBRARY) / kSong, file);
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_THAT(paths("music"), ElementsAre(Row{file}));
}

TEST_F(Indexing, SkipsAnUnreadableFileByName) {
  const auto secret = media.take_sample(kSong, "secret.mp3");
  media.take_sample(kSong, "open.mp3");
  fs::permissions(media.path(), fs::perms(0755));
  ASSERT_EQ(chmod(secret.c_str(), 0), 0);
  fs::create_directories(media.at("closed"));
  ASSERT_EQ(chmod(media.at("closed").c_str(), 0), 0);
  const OpenCommand command("nobody");
  command.give(data.path());
  auto setting = command.setting();
  setting.environment["HOME"] = data.path();
  // The test's server stands in a folder of its own user: nobody runs its own.
  setting.without_server = true;
  const auto run = index({media.path()}, setting);
  EXPECT_EQ(run.status, 3) << run.err;
  EXPECT_THAT(run.err, HasSubstr("mediidx: not indexed: " + secret + ": Permission denied\n"));
  EXPECT_THAT(run.err,
              HasSubstr("mediidx: not indexed: " + media.at("closed") + ": Permission denied\n"));
  EXPECT_THAT(run.out, HasSubstr("\n  music               1\n"));
  EXPECT_THAT(run.out, HasSubstr("\n  failed              2\n"));
  chmod(media.at("closed").c_str(), 0755);
}

TEST_F(Indexing, LeavesOutWhatTheConfigurationSwitchesOff) {
  media.take_sample(kSong, "a.mp3");
  media.take_sample(kSong, "private/b.mp3");
  ASSERT_EQ(index({media.path()}).status, 0);
  const auto share = "/" + media.path().filename().string();
  auto entries = settings("index_folder.conf");
  Json::Value off = entries[0];
  off["path"] = share + "/private";
  off["music"] = false;
  entries.append(off);
  std::ofstream(data.at("d/root/usr/tavo/etc/index_folder.conf")) << entries;
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 0);
  EXPECT_THAT(run.out, HasSubstr("\n  switched off        1\n"));
}

TEST_F(Indexing, PutsAFolderInsideAShareUnderThatShare) {
  media.take_sample(kSong, "music/jazz/a.mp3");
  ASSERT_EQ(index({media.at("music")}).status, 0);
  ASSERT_EQ(index({media.at("music/jazz")}).status, 0);
  EXPECT_THAT(settings("share.conf").getMemberNames(), ElementsAre("music"));
  const auto entries = settings("index_folder.conf");
  ASSERT_EQ(entries.size(), 2U);
  EXPECT_EQ(entries[0]["path"], "/music");
  EXPECT_EQ(entries[1]["path"], "/music/jazz");
}

TEST_F(Indexing, GivesEqualBaseNamesSharesOfTheirOwn) {
  media.take_sample(kSong, "a/music/a.mp3");
  media.take_sample(kSong, "b/music/b.mp3");
  const auto run = index({media.at("a/music"), media.at("b/music")});
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_THAT(settings("share.conf").getMemberNames(), ElementsAre("music", "music-2"));
  EXPECT_EQ(settings("share.conf")["music-2"]["path"], media.at("b/music"));
  EXPECT_EQ(count("music"), 2);
}

TEST_F(Indexing, MakesFoldersAbsoluteAndReal) {
  media.take_sample(kSong, "real/a.mp3");
  fs::create_symlink(media.at("real"), media.at("link"));
  EXPECT_EQ(index({media.at("link/../link/")}).status, 0);
  EXPECT_THAT(paths("music"), ElementsAre(Row{media.at("real/a.mp3")}));
}

TEST_F(Indexing, CountsSongsOfPlaylistsThatComeBeforeTheirMedia) {
  media.write("0.m3u", "z/song.mp3\nz/other.mp3\n");
  media.take_sample(kSong, "z/song.mp3");
  media.take_sample(kSong, "z/other.mp3");
  EXPECT_EQ(index({media.path()}).status, 0);
  EXPECT_EQ(value("SELECT song_count FROM playlist"), "2");
}

TEST_F(Indexing, CutsACueSheetIntoTracks) {
  media.take_sample("music/Night Ferry/Night Ferry.flac", "Night Ferry.flac");
  media.take_sample("music/Night Ferry/Night Ferry.cue", "Night Ferry.cue");
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 0) << run.err;
  EXPECT_THAT(run.out, HasSubstr("\n  cue sheets          1\n"));
  EXPECT_THAT(rows("SELECT title FROM track WHERE is_virtual = 'TRUE' ORDER BY track"),
              ElementsAre(Row{"Boarding"}, Row{"Open Sea"}, Row{"Landfall"}));
}

TEST_F(Indexing, RefusesWhatIsNoFolderToIndex) {
  const auto file = media.take_sample(kSong, "a.mp3");
  const std::pair<std::string, std::string> cases[] = {
      {"/", "/: the whole system cannot be indexed"},
      {media.at("gone"), media.at("gone") + ": No such file or directory"},
      {file, file + ": not a folder"},
  };
  for (const auto& [folder, reason] : cases) {
    const auto run = index({media.path(), folder});
    EXPECT_EQ(run.status, 1);
    EXPECT_EQ(run.err, "mediidx: " + reason + "\n");
    EXPECT_EQ(count("music"), 0);
  }
}

TEST_F(Indexing, RefusesSettingsThatItCannotUnderstand) {
  media.take_sample(kSong, "a.mp3");
  ASSERT_EQ(index({media.path()}).status, 0);
  const auto file = data.at("d/root/usr/tavo/etc/share.conf");
  std::ofstream(file) << "{ broken";
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 1);
  EXPECT_EQ(run.err, "mediidx: the share file cannot be understood: " + file + "\n");
}

TEST_F(Indexing, RefusesADataFolderWithOtherThingsInIt) {
  media.take_sample(kSong, "a.mp3");
  data.write("d/thesis.txt", "mine");
  const auto run = index({media.path()});
  EXPECT_EQ(run.status, 1);
  EXPECT_EQ(run.err,
            "mediidx: " + data.at("d") + " holds other things: name an empty or a new folder\n");
}

TEST_F(Indexing, ShowsABarOnATerminalAndCleansItUp) {
  media.take_sample(kSong, "a.mp3");
  Setting setting;
  setting.on_terminal = true;
  const auto run = index({media.path()}, setting);
  EXPECT_EQ(run.status, 0) << run.out;
  EXPECT_THAT(run.out, HasSubstr("[                        ]   0%  0/2  "));
  EXPECT_THAT(run.out, HasSubstr("\x1B[KIndexed "));
}

TEST_F(Indexing, IsQuietInAPipe) {
  media.take_sample(kSong, "a.mp3");
  EXPECT_EQ(index({media.path()}).err, "");
}

}  // namespace
}  // namespace mediidx::test
