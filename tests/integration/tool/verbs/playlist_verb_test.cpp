// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "verb_test.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;

class PlaylistShow : public VerbTest {};

TEST_F(PlaylistShow, TellsWhatTheIndexKnows) {
  save({.path = at("songs/a.mp3"), .title = "Boarding"});
  const auto file = media.write("lists/mix.m3u",
                                "#EXTM3U\n../songs/a.mp3\n#EXTINF:5,Lost One\nlost.mp3\n"
                                "http://radio.example/stream\n");
  const auto shown = json({"playlist", "show", file});
  EXPECT_THAT(column(shown, "entry"), ElementsAre("1", "2", "3"));
  EXPECT_THAT(column(shown, "index"), ElementsAre("known", "unknown", "stream"));
  EXPECT_THAT(column(shown, "title"), ElementsAre("Boarding", "Lost One", "stream"));
  EXPECT_THAT(column(shown, "path"),
              ElementsAre(at("songs/a.mp3"), at("lists/lost.mp3"), "http://radio.example/stream"));
  EXPECT_TRUE(shown[0]["id"].isIntegral());
  EXPECT_TRUE(shown[1]["id"].isNull());
}

TEST_F(PlaylistShow, PrintsAnEntryALine) {
  save({.path = at("a.mp3"), .title = "Boarding"});
  const auto file = media.write("mix.pls", "[playlist]\nFile1=a.mp3\nFile2=it's %.mp3\n");
  EXPECT_EQ(output({"playlist", "show", file}), "1\tknown\tBoarding\t" + at("a.mp3") +
                                                    "\n2\tunknown\tit's %.mp3\t" +
                                                    at("it's %.mp3") + "\n");
}

TEST_F(PlaylistShow, OfAnEmptyListIsEmpty) {
  const auto file = media.write("mix.m3u", "#EXTM3U\n");
  EXPECT_EQ(output({"playlist", "show", file}), "");
  EXPECT_EQ(output({"playlist", "show", file, "--json"}), "[]\n");
}

TEST_F(PlaylistShow, FailsForWhatIsNoPlaylist) {
  struct Case {
    std::string file;
    std::string message;
    int status;
  };
  const auto missing = at("missing.m3u");
  const auto text = media.write("a.txt", "x");
  const auto cue = media.write("a.cue", "x");
  for (const auto& [file, message, status] :
       {Case{missing, missing + ": No such file or directory", 1},
        Case{text, text + " is no playlist, by its name", 1},
        Case{media.path().string(), media.path().string() + " is a folder", 1},
        Case{cue, "a cue sheet is shown by mediidx cue show\nTry \"mediidx help\".", 2}}) {
    const auto done = run({"playlist", "show", file});
    EXPECT_EQ(done.status, status) << file;
    EXPECT_EQ(done.out, "");
    EXPECT_EQ(done.err, "mediidx: " + message + "\n");
  }
  EXPECT_EQ(run({"playlist", "show"}).status, 2);
  EXPECT_EQ(run({"playlist"}).status, 2);
}

}  // namespace
}  // namespace mediidx::test
