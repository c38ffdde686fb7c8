// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <sys/stat.h>

#include <filesystem>
#include <sstream>

#include "explain_test.h"
#include "mediidx/request.h"

namespace mediidx::test {
namespace {

class Why : public ExplainTest {
 protected:
  /// The reason for a path; the exit status has to agree with the answer.
  std::string reason(const std::string& path) const {
    const auto done = run({"why", path});
    const auto answer = json_with(done.status, {"why", path});
    EXPECT_EQ(done.status, answer["indexed"].asBool() ? 0 : 3) << path;
    return answer["reason"].asString();
  }
};

TEST_F(Why, TellsThatAFileWouldBeIndexedAndByWhichFolder) {
  media.write("a.mp3", "x");
  const auto answer = json({"why", at("a.mp3")});
  EXPECT_EQ(answer["path"], at("a.mp3"));
  EXPECT_EQ(answer["indexed"], true);
  EXPECT_EQ(answer["exists"], true);
  EXPECT_EQ(answer["kind"], "music");
  EXPECT_EQ(answer["reason"], "index_folder");
  EXPECT_EQ(answer["folder"]["folder"], media.path().string());
  EXPECT_EQ(answer["folder"]["name"], "All of it");
  EXPECT_EQ(answer["folder"]["photo"], true);
  EXPECT_EQ(output({"why", at("a.mp3")}),
            at("a.mp3") + " would be indexed as music: it lies in the folder chosen for indexing " +
                media.path().string() + " (music, photos, videos)\n");
}

TEST_F(Why, KnowsWhatIgnoreFilesLeaveOut) {
  media.write(".mediidxignore", "drafts/\n*.wav\n");
  media.write("drafts/a.mp3", "x");
  media.write("b.wav", "x");
  media.write("c.mp3", "x");
  EXPECT_EQ(reason(at("drafts/a.mp3")), "ignored");
  EXPECT_EQ(reason(at("drafts/")), "ignored");
  EXPECT_EQ(reason(at("b.wav")), "ignored");
  EXPECT_EQ(reason(at("c.mp3")), "index_folder");
  EXPECT_THAT(run({"why", at("b.wav")}).out, HasSubstr("a .mediidxignore file leaves it out"));
}

TEST_F(Why, AnswersForWhatDoesNotExist) {
  const auto answer = json({"why", at("none/b.jpg")});
  EXPECT_EQ(answer["exists"], false);
  EXPECT_EQ(answer["kind"], "photo");
  EXPECT_EQ(answer["indexed"], true);
  ASSERT_EQ(answer["notes"].size(), 1U);
  EXPECT_EQ(answer["notes"][0], "it does not exist now");
  EXPECT_EQ(json({"why", at("none/")})["kind"], "folder");
}

TEST_F(Why, NamesTheDeepestFolderThatLeavesAKindOut) {
  choose(R"({"path": "/media", "photo": true, "music": true, "video": true},
            {"name": "Private", "path": "/media/private", "photo": false, "music": true,
             "video": false})");
  const auto answer = json_with(3, {"why", at("private/a.jpg")});
  EXPECT_EQ(answer["reason"], "kind_off");
  EXPECT_EQ(answer["library"], 0);
  EXPECT_EQ(answer["folder"]["name"], "Private");
  EXPECT_EQ(run({"why", at("private/a.jpg")}).out,
            at("private/a.jpg") +
                " would not be indexed as photo: the deepest folder chosen for indexing that holds "
                "it leaves this kind out: " +
                at("private") +
                " (music)\nNote: it does not exist now\nNote: the chosen folder is "
                "not there now: " +
                at("private") + "\n");
}

struct ReasonCase {
  const char* path;
  const char* reason;
};

TEST_F(Why, KnowsWhatTheScanPassesOver) {
  media.write("empty.mp3", "");
  media.write("song.mp3", "x");
  media.write("other/song.mp3", "x");
  std::filesystem::create_symlink(at("other/song.mp3"), at("link.mp3"));
  std::filesystem::create_symlink("/nowhere", at("dangling.mp3"));
  constexpr ReasonCase kCases[] = {
      {"song.mp3", "index_folder"},      {"empty.mp3", "empty_file"},
      {"link.mp3", "other_name"},        {"dangling.mp3", "index_folder"},
      {".hidden/a.mp3", "passed_over"},  {"a/@eaDir/a.mp3", "passed_over"},
      {"#RECYCLE/a.mp3", "passed_over"}, {".a.mp3", "passed_over"},
      {".mp3", "unknown_extension"},     {"a.txt", "unknown_extension"},
      {"none", "unknown_extension"},     {"a\xE9.mp3", "not_utf8"},
  };
  for (const auto& one : kCases) EXPECT_EQ(reason(at(one.path)), one.reason) << one.path;
  EXPECT_EQ(reason(at(std::string(4096, 'a') + ".mp3")), "too_long");
  EXPECT_EQ(json_with(3, {"why", at("a/@eaDir/b.mp3")})["text"], "the name @eaDir is passed over");
}

TEST_F(Why, PassesNothingOverAboveAChosenFolder) {
  choose(R"({"path": "/media/.music", "photo": true, "music": true, "video": true})");
  EXPECT_EQ(reason(at(".music/a.mp3")), "index_folder");
}

TEST_F(Why, KnowsFilesThatAreNoneAndItsOwnData) {
  ASSERT_EQ(mkfifo(at("pipe.mp3").c_str(), 0600), 0);
  EXPECT_EQ(reason(at("pipe.mp3")), "no_file");
  set_shares(R"("data": {"path": ")" + data.path().string() + R"(", "status": 32})");
  choose(R"({"path": "/data", "photo": true, "music": true, "video": true})");
  EXPECT_EQ(reason(data.at("d/a.mp3")), "own_data");
  EXPECT_EQ(reason(data.at("e/a.mp3")), "index_folder");
}

TEST_F(Why, TellsOfAPersonalLibrary) {
  home.write("ada/Music/a.mp3", "x");
  const auto answer = json({"why", at_home("Music/a.mp3")});
  EXPECT_EQ(answer["reason"], "personal_library");
  EXPECT_EQ(answer["user"], "ada");
  EXPECT_EQ(answer["notes"].size(), 1U);
  EXPECT_EQ(reason(at_home("Musical/a.mp3")), "outside");
}

TEST_F(Why, TellsThatNoFolderIsMeantOrItsShareIsGone) {
  EXPECT_EQ(reason("/elsewhere/a.mp3"), "outside");
  choose(R"({"path": "/media"}, {"path": "/gone/rock", "music": true})");
  EXPECT_EQ(reason("/volume1/gone/rock/a.mp3"), "share_gone");
  EXPECT_EQ(json_with(3, {"why", "/volume1/gone/rock/a.mp3"})["text"],
            "the configuration's entry /gone/rock names a share that is not known");
  EXPECT_EQ(reason("/volume1/gone/rocks/a.mp3"), "outside");
  choose("");
  EXPECT_EQ(reason(at("a.mp3")), "no_folders");
}

TEST_F(Why, AgreesWithTheLibraryOnEveryPath) {
  choose(R"({"path": "/media", "photo": false, "music": true, "video": true},
            {"path": "/media/2010", "photo": true, "music": false, "video": false},
            {"path": "/media/2010/off"},
            {"path": "/lost", "music": true})");
  std::filesystem::create_directory(at("2010"));
  const std::string names[] = {
      "a.mp3",       "a.MP3",        "a.jpg",          "a.mp4",      "a.m3u",       "a.cue",
      "2010",        "2010/",        "2010/a.mp3",     "2010/a.jpg", "2010x/a.mp3", "2010x/a.jpg",
      "2010/a.m3u8", "2010/b/a.jpg", "2010/off/a.jpg", "2010/off/",  "x/y/z.flac",  ".h/a.mp3",
  };
  std::vector<std::string> paths{"/a.mp3",
                                 "/lost/a.mp3",
                                 "/",
                                 at_home("music/a.mp3"),
                                 at_home("music/"),
                                 at_home("MUSIC/b.jpg"),
                                 at_home("a.mp3")};
  for (const auto& name : names) paths.push_back(at(name));
  for (const auto& path : paths) {
    const auto done = run({"why", path});
    const auto answer = json_with(done.status, {"why", path});
    const auto kind = answer["kind"].asString();
    const MEDIA_TABLE_TYPE type = kind == "music"    ? MEDIA_TABLE_MUSIC
                                  : kind == "photo"  ? MEDIA_TABLE_PHOTO
                                  : kind == "video"  ? MEDIA_TABLE_VIDEO
                                  : kind == "folder" ? MEDIA_TABLE_DIRECTORY
                                                     : MEDIA_TABLE_PLAYLIST;
    const int library = TAVOMediaIndexIsIndexPath(answer["path"].asCString(), type);
    EXPECT_EQ(answer["library"], library) << path;
    const auto reason = answer["reason"].asString();
    const bool is_refused_by_library = reason == "kind_off" || reason == "outside" ||
                                       reason == "share_gone" || reason == "no_folders";
    EXPECT_EQ(library <= 0, is_refused_by_library) << path << ": " << reason;
    EXPECT_EQ(done.status, answer["indexed"].asBool() ? 0 : 3) << path;
  }
}

TEST_F(Why, IsDescribedInItsHelp) {
  const auto help = output({"help", "why"});
  EXPECT_THAT(help, HasSubstr("Usage: mediidx why PATH\n"));
  EXPECT_THAT(help, HasSubstr("Exit status: 0 it would be indexed, 1 failed, 2 wrong usage, "
                              "3 it would not.\n"));
  EXPECT_EQ(run({"why"}).status, 2);
  EXPECT_EQ(run({"why", ""}).status, 1);
}

TEST(TheVerbsThatExplain, HaveTheirExitStatusesInTheirHelp) {
  for (const char* verb : {"why", "inspect", "explain", "doctor", "verify", "repair", "rating set",
                           "rating show", "rating import", "rating export"}) {
    Words words{"help"};
    std::istringstream in(verb);
    for (std::string word; in >> word;) words.push_back(word);
    const auto done = run_mediidx(words);
    EXPECT_EQ(done.status, 0) << verb;
    EXPECT_THAT(done.out, HasSubstr("\nExit status: 0 ")) << verb;
    EXPECT_THAT(done.out, HasSubstr("--json")) << verb;
  }
}

}  // namespace
}  // namespace mediidx::test
