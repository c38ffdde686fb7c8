// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "verb_test.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;

/// Two tracks in one file, with this title (in whatever character set) for the first.
std::string sheet(const std::string& title) {
  return "REM GENRE Folk\nREM DATE 1999\nPERFORMER \"Ada\"\nTITLE \"Night Ferry\"\n"
         "FILE \"a.wav\" WAVE\n"
         "  TRACK 01 AUDIO\n    TITLE \"" +
         title +
         "\"\n    PERFORMER \"Bo\"\n    INDEX 01 00:00:00\n"
         "  TRACK 02 AUDIO\n    TITLE \"Two\"\n    INDEX 01 01:05:00\n";
}

/// One second of silence: a WAV file of 8-bit samples.
std::string silence() {
  using namespace std::string_literals;
  const std::string samples(8000, '\x80');
  const auto number = [](std::size_t value) {
    std::string out;
    for (int i = 0; i < 4; ++i) out += static_cast<char>(value >> (8 * i));
    return out;
  };
  return "RIFF" + number(36 + samples.size()) + "WAVEfmt " + number(16) + "\1\0\1\0"s +
         number(8000) + number(8000) + "\1\0\10\0"s + "data" + number(samples.size()) + samples;
}

class CueShow : public VerbTest {
 protected:
  /// Saves the audio file of sheet(), and lets the command know its share as this test does.
  void save_audio() const {
    save({.path = at("a.wav"), .duration = 100});
    output({"stats"});  // makes the data folder
    for (const char* file : {"usr/tavo/etc/share.conf", "usr/tavo/etc/index_folder.conf"}) {
      data.write(std::string("d/root/") + file, root.read(file));
    }
  }
  void set_code_page(const std::string& code) const {
    output({"stats"});  // makes the data folder
    data.write("d/root/etc/tavoinfo.conf", "codepage=\"" + code + "\"\n");
  }
};

TEST_F(CueShow, TellsTheTracksOfASheet) {
  save_audio();
  const auto shown = json({"cue", "show", media.write("a.cue", sheet("One"))});
  EXPECT_EQ(shown["charset"], "ASCII");
  const auto& tracks = shown["tracks"];
  EXPECT_THAT(column(tracks, "track"), ElementsAre("1", "2"));
  EXPECT_THAT(column(tracks, "start"), ElementsAre("00:00:00", "01:05:00"));
  EXPECT_THAT(column(tracks, "title"), ElementsAre("One", "Two"));
  EXPECT_THAT(column(tracks, "artist"), ElementsAre("Bo", ""));
  EXPECT_THAT(column(tracks, "album"), ElementsAre("Night Ferry", "Night Ferry"));
  EXPECT_THAT(column(tracks, "path"), ElementsAre(at("a.wav"), at("a.wav")));
  EXPECT_EQ(tracks[0]["duration"], 65.0);
  EXPECT_EQ(tracks[1]["duration"], 35.0);
  EXPECT_EQ(tracks[0]["year"], 1999);
}

TEST_F(CueShow, PrintsATrackALine) {
  save_audio();
  EXPECT_EQ(output({"cue", "show", media.write("a.cue", sheet("One"))}),
            "1\t00:00:00\t1:05\tOne\tBo\t" + at("a.wav") + "\tASCII\n2\t01:05:00\t0:35\tTwo\t\t" +
                at("a.wav") + "\tASCII\n");
}

TEST_F(CueShow, KnowsNoDurationOfTheLastTrackOfAFileThatIsNotIndexed) {
  const auto shown = json({"cue", "show", media.write("a.cue", sheet("One"))});
  EXPECT_EQ(shown["tracks"][0]["duration"], 65.0);
  EXPECT_TRUE(shown["tracks"][1]["duration"].isNull());
}

TEST_F(CueShow, ConvertsFromTheCharacterSetOfTheCodePage) {
  set_code_page("rus");
  const auto shown = json({"cue", "show", media.write("a.cue", sheet("\xCF\xE0\xF0\xEE\xEC"))});
  EXPECT_THAT(shown["charset"].asString(), testing::AnyOf("CP1251", "WINDOWS-1251"));
  EXPECT_EQ(shown["tracks"][0]["title"], "Паром");
}

TEST_F(CueShow, SaysThatACharacterSetCannotBeTold) {
  const auto shown = json({"cue", "show",
                           media.write("a.cue", sheet("Fran\xE7"
                                                      "ais"))});
  EXPECT_TRUE(shown["charset"].isNull());
  EXPECT_EQ(shown["tracks"][0]["title"], "Fran\uFFFDais");
}

TEST_F(CueShow, OfTracksInNoAudioFileIsEmpty) {
  const auto file =
      media.write("a.cue", "FILE \"a.txt\" WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n");
  const auto shown = json({"cue", "show", file});
  EXPECT_TRUE(shown["tracks"].isArray());
  EXPECT_THAT(shown["tracks"], IsEmpty());
}

TEST_F(CueShow, FailsForASheetWithoutTracks) {
  const auto done = run({"cue", "show", media.write("a.cue", "REM nothing\n")});
  EXPECT_EQ(done.status, 1);
  EXPECT_EQ(done.out, "");
  EXPECT_EQ(done.err, "mediidx: the cue sheet cannot be understood\n");
}

TEST_F(CueShow, FailsForWhatIsNoCueSheet) {
  EXPECT_EQ(run({"cue", "show", at("missing.cue")}).status, 1);
  const auto text = media.write("a.txt", "x");
  const auto done = run({"cue", "show", text});
  EXPECT_EQ(done.status, 1);
  EXPECT_EQ(done.err, "mediidx: " + text + " is no cue sheet, by its name\n");
  EXPECT_EQ(run({"cue", "show"}).status, 2);
}

using IndexingACueSheet = CueShow;

TEST_F(IndexingACueSheet, ComesAfterItsAudioFile) {
  media.write("z/a.wav", silence());
  media.write("z/a.cue",
              "FILE \"a.wav\" WAVE\n TRACK 01 AUDIO\n  TITLE \"One\"\n  INDEX 01 00:00:00\n");
  output({"index", media.path()});
  EXPECT_EQ(value("SELECT duration FROM track WHERE is_virtual = 'TRUE'"), "1.000000");
}

TEST_F(IndexingACueSheet, BeforeItsAudioFileComesToTheSameInTheEnd) {
  const auto catalogue = [this] {
    return rows(
        "SELECT (to_jsonb(t) - 'id')::text, to_jsonb(a) - 'track', to_jsonb(v) - 'track' "
        "FROM track t LEFT JOIN album_track a ON a.track = t.id "
        "LEFT JOIN virtual_info_track v ON v.track = t.id ORDER BY 1");
  };
  media.write("a.cue", sheet("One"));
  output({"index", media.path()});
  media.write("a.wav", silence());
  output({"index", media.path()});
  const auto sheet_first = catalogue();
  ASSERT_EQ(sheet_first.size(), 3U);

  TestServer::get().fresh_database();
  output({"index", media.path()});
  EXPECT_EQ(catalogue(), sheet_first);
}

TEST_F(IndexingACueSheet, OfALegacyCharacterSetNeedsTheCodePage) {
  set_code_page("jpn");
  media.write("a.wav", silence());
  media.write("a.cue", sheet("\x96\xE9\x82\xCC\x8D\x60"));
  output({"index", media.path()});
  EXPECT_EQ(value("SELECT title FROM track WHERE is_virtual = 'TRUE' AND track = 1"), "夜の港");
}

TEST_F(IndexingACueSheet, OfAnUnknownCharacterSetSaysSoAndKeepsThePlaylist) {
  media.write("a.wav", silence());
  const auto file = media.write("a.cue", sheet("Fran\xE7"
                                               "ais"));
  media.write("b.cue", sheet("Good"));
  const auto done = run({"index", media.path()});
  EXPECT_EQ(done.status, 3);
  EXPECT_THAT(done.err, HasSubstr("mediidx: not indexed: " + file +
                                  ": the sheet's tracks: ERROR:  invalid byte sequence"));
  EXPECT_EQ(count("playlist", "path = " + quoted(file)), 1);
  EXPECT_EQ(count("virtual_info_track", "cue_sheet_path = " + quoted(file)), 0);
  EXPECT_EQ(count("virtual_info_track", "cue_sheet_path = " + quoted(at("b.cue"))), 2);
}

}  // namespace
}  // namespace mediidx::test
