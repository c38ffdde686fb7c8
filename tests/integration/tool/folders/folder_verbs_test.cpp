// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <json/writer.h>
#include <sys/stat.h>

#include <fstream>
#include <iterator>

#include "folder_test.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

class FolderVerbs : public FolderTest {};

Json::Value entry(const std::string& name, const std::string& path, bool photo, bool music,
                  bool video) {
  Json::Value out;
  out["name"] = name;
  out["path"] = path;
  out["photo"] = photo;
  out["music"] = music;
  out["video"] = video;
  out["default"] = false;
  return out;
}

TEST_F(FolderVerbs, AddingSwitchingAndRemovingAFolderKeepItsRowsTrue) {
  fill("m");
  const auto folder = media.at("m");
  const auto added = output({"folder", "add", folder});
  EXPECT_THAT(added, HasSubstr("Indexing " + folder + "\n"));
  EXPECT_THAT(added, HasSubstr(folder + ": 1 music, 1 photos, 1 videos, 0 playlists, 1 folders"));
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
  EXPECT_THAT(stored("photo"), ElementsAre("m/b.jpg"));
  EXPECT_THAT(stored("video"), ElementsAre("m/c.mp4"));
  EXPECT_THAT(stored("directory"), ElementsAre("m"));

  const auto set = output({"folder", "set", folder, "--no-photo", "--no-video"});
  EXPECT_THAT(set, HasSubstr("Indexing again: " + folder + "\n"));
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
  EXPECT_THAT(stored("photo"), IsEmpty());
  EXPECT_THAT(stored("video"), IsEmpty());

  output({"folder", "set", folder, "--photo", "--no-music"});
  EXPECT_THAT(stored("music"), IsEmpty());
  EXPECT_THAT(stored("photo"), ElementsAre("m/b.jpg"));

  const auto removed = output({"folder", "remove", folder});
  EXPECT_THAT(removed, HasSubstr("Taking out of the index: " + folder + "\n"));
  for (const char* table : {"music", "photo", "video", "playlist", "directory", "track"}) {
    EXPECT_EQ(count(table), 0) << table;
  }
  EXPECT_FALSE(fs::exists(settings("index_folder.conf")));
}

TEST_F(FolderVerbs, AWholeLibraryGoesInAndOutAgain) {
  media.take_sample("", "m");
  const auto folder = media.at("m");
  run({"folder", "add", folder});  // some of its files are damaged
  auto expected = Json::Value(Json::arrayValue);
  expected.append(entry("m", "/m", true, true, true));
  EXPECT_EQ(read_json(settings("index_folder.conf")), expected);
  const auto tables = rows(
      "SELECT tablename FROM pg_tables WHERE schemaname = 'public' AND tablename NOT LIKE "
      "'personal_%' AND tablename NOT IN ('video_convert', 'virtual_music', 'rating_track')");
  for (const auto& table : tables) EXPECT_GT(count(table[0]), 0) << table[0];
  const auto songs = stored("music");
  const auto photos = stored("photo");
  const auto folders = stored("directory");

  run({"folder", "set", folder, "--no-music"});
  expected[0]["music"] = false;
  EXPECT_EQ(read_json(settings("index_folder.conf")), expected);
  for (const char* table : {"music", "playlist", "track", "artist_track", "virtual_info_track"}) {
    EXPECT_EQ(count(table), 0) << table;
  }
  EXPECT_EQ(stored("photo"), photos);
  EXPECT_EQ(stored("directory"), folders);

  const auto sub = media.at("m/music");
  run({"folder", "add", sub, "--music", "--name", "Songs"});
  expected.append(entry("Songs", "/m/music", false, true, false));
  EXPECT_EQ(read_json(settings("index_folder.conf")), expected);
  EXPECT_THAT(stored("music"), testing::Each(testing::StartsWith("m/music/")));
  EXPECT_GT(count("virtual_info_track"), 0);

  run({"folder", "set", folder, "--music"});
  run({"folder", "remove", sub});
  expected = Json::Value(Json::arrayValue);
  expected.append(entry("m", "/m", true, true, true));
  EXPECT_EQ(read_json(settings("index_folder.conf")), expected);
  EXPECT_EQ(stored("music"), songs);
  EXPECT_EQ(stored("photo"), photos);
  EXPECT_EQ(stored("directory"), folders);

  run({"folder", "remove", folder});
  EXPECT_FALSE(fs::exists(settings("index_folder.conf")));
  for (const auto& table : rows("SELECT tablename FROM pg_tables WHERE schemaname = 'public'")) {
    EXPECT_EQ(count(table[0]), 0) << table[0];
  }
}

TEST_F(FolderVerbs, SetIndexesThatFolderOnly) {
  fill("m");
  fill("n");
  output({"folder", "add", media.at("m")});
  output({"folder", "add", media.at("n")});
  rows("DELETE FROM music");
  output({"folder", "set", media.at("m"), "--no-video"});
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
  EXPECT_THAT(stored("video"), ElementsAre("n/c.mp4"));
}

TEST_F(FolderVerbs, ShowABarOnATerminal) {
  fill("m");
  Setting setting;
  setting.on_terminal = true;
  const Words begin{"--data-dir", data.at("d"), "folder"};
  for (const Words& words :
       {Words{"add", media.at("m")}, Words{"set", media.at("m"), "--no-photo"}}) {
    auto all = begin;
    all.insert(all.end(), words.begin(), words.end());
    const auto done = run_mediidx(all, setting);
    EXPECT_EQ(done.status, 0) << done.out;
    EXPECT_THAT(done.out, HasSubstr("Indexing ")) << words[0];
    EXPECT_THAT(done.out, HasSubstr("[                        ]   0%  0/4  ")) << words[0];
    EXPECT_THAT(done.out, HasSubstr(media.at("m") + ": 1 music")) << words[0];
  }
}

TEST_F(FolderVerbs, AddTakesTheNamedKindsOnly) {
  fill("m");
  output({"folder", "add", media.at("m"), "--video", "--name", "Films"});
  EXPECT_THAT(stored("music"), IsEmpty());
  EXPECT_THAT(stored("photo"), IsEmpty());
  EXPECT_THAT(stored("video"), ElementsAre("m/c.mp4"));
  EXPECT_EQ(json({"folder", "list"})[0]["name"], "Films");
}

TEST_F(FolderVerbs, AddIndexesNothingElse) {
  fill("m");
  fill("n");
  output({"folder", "add", media.at("m")});
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
}

TEST_F(FolderVerbs, ASubfolderWithAKindSwitchedOffHidesItsParents) {
  fill("m");
  fill("m/sub");
  output({"folder", "add", media.at("m")});
  output({"folder", "add", media.at("m/sub"), "--photo"});
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
  EXPECT_THAT(stored("photo"), ElementsAre("m/b.jpg", "m/sub/b.jpg"));
}

TEST_F(FolderVerbs, RemovingASubfolderGivesItBackToItsParent) {
  fill("m");
  fill("m/sub");
  output({"folder", "add", media.at("m")});
  output({"folder", "add", media.at("m/sub"), "--photo"});
  output({"folder", "remove", media.at("m/sub")});
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3", "m/sub/a.mp3"));
}

TEST_F(FolderVerbs, RemovingAParentKeepsItsSubfolder) {
  fill("m");
  fill("m/sub");
  output({"folder", "add", media.at("m")});
  output({"folder", "add", media.at("m/sub")});
  output({"folder", "remove", media.at("m")});
  EXPECT_THAT(stored("music"), ElementsAre("m/sub/a.mp3"));
  EXPECT_THAT(stored("directory"), ElementsAre("m/sub"));
}

TEST_F(FolderVerbs, WhatIndexChoseIsListedAndRemoved) {
  fill("m");
  EXPECT_EQ(run({"index", media.at("m")}).status, 0);
  ASSERT_EQ(json({"folder", "list"}).size(), 1U);
  output({"folder", "remove", media.at("m")});
  EXPECT_THAT(stored("music"), IsEmpty());
  EXPECT_EQ(json({"folder", "list"}).size(), 0U);
}

TEST_F(FolderVerbs, NoFolderIsChangedWhileAConfiguredOneIsAway) {
  fill("m");
  fill("disk");
  fill("n");
  output({"folder", "add", media.at("m")});
  output({"folder", "add", media.at("disk")});
  fs::rename(media.at("disk"), media.at("moved"));
  const auto before = read_json(settings("index_folder.conf"));
  for (const Words& words :
       {Words{"folder", "add", media.at("n")}, Words{"folder", "set", media.at("m"), "--no-music"},
        Words{"folder", "remove", media.at("m")}}) {
    const auto refused = run(words);
    EXPECT_EQ(refused.status, 1) << words[1];
    EXPECT_THAT(refused.err, HasSubstr(media.at("disk") + " is not there")) << words[1];
    EXPECT_THAT(refused.err, HasSubstr("--drop-missing")) << words[1];
  }
  EXPECT_EQ(read_json(settings("index_folder.conf")), before);
  EXPECT_THAT(stored("music"), ElementsAre("disk/a.mp3", "m/a.mp3"));
}

TEST_F(FolderVerbs, DropMissingGivesUpWhatIsAway) {
  fill("m");
  fill("disk");
  output({"folder", "add", media.at("m")});
  output({"folder", "add", media.at("disk")});
  fs::rename(media.at("disk"), media.at("moved"));
  const auto out = output({"folder", "set", media.at("m"), "--no-video", "--drop-missing"});
  EXPECT_THAT(out, HasSubstr("Taking out of the index: " + media.at("disk") + "\n"));
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
  EXPECT_THAT(stored("video"), IsEmpty());
  EXPECT_THAT(stored("directory"), ElementsAre("m"));
  EXPECT_EQ(json({"folder", "list"}).size(), 1U);
}

TEST_F(FolderVerbs, AFolderThatIsAwayIsRemovedOnPurpose) {
  fill("disk");
  output({"folder", "add", media.at("disk")});
  fs::rename(media.at("disk"), media.at("moved"));
  output({"folder", "remove", media.at("disk"), "--drop-missing"});
  EXPECT_THAT(stored("music"), IsEmpty());
  EXPECT_THAT(stored("directory"), IsEmpty());
}

TEST_F(FolderVerbs, ASubfolderThatIsGivenUpLeavesNoRowBelowItsParent) {
  fill("m");
  fill("m/sub");
  output({"folder", "add", media.at("m"), "--photo"});
  output({"folder", "add", media.at("m/sub"), "--music"});
  fs::rename(media.at("m/sub"), media.at("moved"));
  output({"folder", "remove", media.at("m/sub"), "--drop-missing"});
  EXPECT_THAT(stored("music"), IsEmpty());
  EXPECT_THAT(stored("photo"), ElementsAre("m/b.jpg"));
  EXPECT_THAT(stored("directory"), ElementsAre("m"));
}

TEST_F(FolderVerbs, ASubfolderHidesAndShowsAKindAsItIsSet) {
  fill("m");
  fill("m/sub");
  output({"folder", "add", media.at("m")});
  output({"folder", "add", media.at("m/sub")});
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3", "m/sub/a.mp3"));
  output({"folder", "set", media.at("m/sub"), "--no-music"});
  EXPECT_THAT(stored("music"), ElementsAre("m/a.mp3"));
  output({"folder", "set", media.at("m"), "--no-music"});
  output({"folder", "set", media.at("m/sub"), "--music"});
  EXPECT_THAT(stored("music"), ElementsAre("m/sub/a.mp3"));
  EXPECT_THAT(stored("photo"), ElementsAre("m/b.jpg", "m/sub/b.jpg"));
}

TEST_F(FolderVerbs, ListShowsPathsKindsAndWhatIsAway) {
  fs::create_directory(media.at("m"));
  output({"folder", "add", media.at("m"), "--music", "--photo"});
  auto list = json({"folder", "list"});
  ASSERT_EQ(list.size(), 1U);
  EXPECT_EQ(list[0]["path"], media.at("m"));
  EXPECT_EQ(list[0]["share_path"], "/m");
  EXPECT_EQ(list[0]["name"], "m");
  EXPECT_EQ(list[0]["music"], true);
  EXPECT_EQ(list[0]["photo"], true);
  EXPECT_EQ(list[0]["video"], false);
  EXPECT_EQ(list[0]["exists"], true);
  EXPECT_EQ(output({"folder", "list"}), media.at("m") + "\tm\tyes\tyes\tno\tyes\n");
  fs::remove(media.at("m"));
  list = json({"folder", "list"});
  EXPECT_EQ(list[0]["exists"], false);
}

TEST_F(FolderVerbs, AFolderIsAddedOnce) {
  output({"folder", "add", media.path()});
  const auto again = run({"folder", "add", media.path()});
  EXPECT_EQ(again.status, 1);
  EXPECT_THAT(again.err, HasSubstr(media.path().string() + " is chosen already"));
}

TEST_F(FolderVerbs, WhatIsNotChosenIsNeitherSetNorRemoved) {
  for (const Words& words :
       {Words{"folder", "set", media.path(), "--music"}, Words{"folder", "remove", media.path()}}) {
    const auto refused = run(words);
    EXPECT_EQ(refused.status, 1);
    EXPECT_THAT(refused.err, HasSubstr(media.path().string() + " is not chosen for indexing"));
  }
}

TEST_F(FolderVerbs, SetNeedsAKindAndNoContradiction) {
  output({"folder", "add", media.path()});
  EXPECT_EQ(run({"folder", "set", media.path()}).status, 2);
  EXPECT_EQ(run({"folder", "set", media.path(), "--music", "--no-music"}).status, 2);
}

TEST_F(FolderVerbs, SettingWhatIsSetChangesNothing) {
  output({"folder", "add", media.path()});
  EXPECT_EQ(output({"folder", "set", media.path(), "--music"}), "Nothing changes.\n");
}

TEST_F(FolderVerbs, AConfigurationThatIsNoListIsNotOverwritten) {
  output({"folder", "list"});
  const auto deep = std::string(100000, '[');
  for (const std::string& text : {std::string("{\"a\": 1}"), std::string("[{\"path\""), deep}) {
    std::ofstream(settings("index_folder.conf")) << text;
    EXPECT_EQ(run({"folder", "add", media.path()}).status, 1);
    std::ifstream in(settings("index_folder.conf"));
    EXPECT_EQ(std::string(std::istreambuf_iterator<char>(in), {}), text);
    EXPECT_EQ(run({"--json", "folder", "list"}).out, "[]\n");
  }
}

TEST_F(FolderVerbs, AConfigurationThatCannotBeReadIsNotOverwritten) {
  fs::create_directory(media.at("m"));
  output({"folder", "add", media.at("m")});
  const auto before = read_json(settings("index_folder.conf"));
  ASSERT_EQ(chmod(settings("index_folder.conf").c_str(), 0), 0);
  const OpenCommand command("nobody");
  command.give(data.path());
  const auto refused =
      run_mediidx({"--data-dir", data.at("d"), "folder", "add", media.path()}, command.setting());
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.err, HasSubstr("index_folder.conf"));
  ASSERT_EQ(chmod(settings("index_folder.conf").c_str(), 0600), 0);
  EXPECT_EQ(read_json(settings("index_folder.conf")), before);
}

TEST_F(FolderVerbs, AnEmptyConfigurationFileIsFilled) {
  output({"folder", "list"});
  std::ofstream(settings("index_folder.conf")) << "";
  output({"folder", "add", media.path()});
  EXPECT_EQ(json({"folder", "list"}).size(), 1U);
}

TEST_F(FolderVerbs, UnusableEntriesArePassedOver) {
  fs::create_directory(media.at("m"));
  output({"folder", "add", media.at("m")});
  auto entries = read_json(settings("index_folder.conf"));
  entries.append(7);
  entries[2]["path"] = Json::Value(Json::arrayValue);
  std::ofstream(settings("index_folder.conf"))
      << Json::writeString(Json::StreamWriterBuilder(), entries);
  EXPECT_EQ(json({"folder", "list"}).size(), 1U);
  output({"folder", "set", media.at("m"), "--no-music"});
  EXPECT_EQ(read_json(settings("index_folder.conf")).size(), 1U);
}

TEST_F(FolderVerbs, AFolderWhoseShareIsUnknownIsAway) {
  fs::create_directory(media.at("m"));
  output({"folder", "add", media.at("m")});
  fs::remove(settings("share.conf"));
  const auto list = json({"folder", "list"});
  EXPECT_TRUE(list[0]["path"].isNull());
  EXPECT_EQ(list[0]["exists"], false);
  const auto refused = run({"folder", "add", media.path()});
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.err, HasSubstr("/m is not there"));
}

TEST_F(FolderVerbs, WhatCannotBeIndexedIsNotAdded) {
  const auto file = media.write("a.txt", "text");
  for (const auto& named : {file, media.at("gone"), std::string("/")}) {
    const auto refused = run({"folder", "add", named});
    EXPECT_EQ(refused.status, 1) << named;
    EXPECT_THAT(refused.err, HasSubstr(named)) << named;
  }
}

}  // namespace
}  // namespace mediidx::test
