// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <memory>
#include <random>
#include <sstream>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

#include "database.h"
#include "integration/database/faults.h"
#include "mediidx/cue_sheet.h"
#include "mediidx/playlist.h"

namespace {

using mediidx::test::clear_log;
using mediidx::test::Failing;
using mediidx::test::logged;
using mediidx::test::quoted;
#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
using mediidx::test::Allocator;
using mediidx::test::FailingAllocation;
#endif
using testing::ElementsAre;
using testing::IsEmpty;

struct FreeList {
  void operator()(_PLAYLIST_REC* list) const { TAVOPlaylistRecFree(list); }
};
using List = std::unique_ptr<_PLAYLIST_REC, FreeList>;

/// A sheet in an indexed folder, its lines fed to a parser.
class CueSheet : public mediidx::test::DatabaseTest {
 protected:
  CueSheet() {
    root.index_everything("music", folder);
    clear_log();
  }

  bool parse(const std::vector<std::string>& lines) {
    for (const auto& line : lines) {
      if (parser.ParseCommand(line, sheet.c_str()) == 0) return false;
    }
    return true;
  }

  std::vector<__tag_TAVO_MEDIA_INFO> output() {
    _PLAYLIST_REC* head = nullptr;
    result = parser.OutputResultLists(&head);
    const List list(head);
    std::vector<__tag_TAVO_MEDIA_INFO> tracks;
    for (const auto* node = head; node; node = node->next) tracks.push_back(node->info);
    return tracks;
  }

  std::vector<__tag_TAVO_MEDIA_INFO> tracks_of(const std::vector<std::string>& lines) {
    EXPECT_TRUE(parse(lines));
    auto tracks = output();
    EXPECT_EQ(result, 1);
    return tracks;
  }

  static std::vector<float> durations(const std::vector<__tag_TAVO_MEDIA_INFO>& tracks) {
    std::vector<float> all;
    for (const auto& track : tracks) all.push_back(track.duration);
    return all;
  }

  static std::vector<std::string> starts(const std::vector<__tag_TAVO_MEDIA_INFO>& tracks) {
    std::vector<std::string> all;
    for (const auto& track : tracks) all.emplace_back(track.comment);
    return all;
  }

  /// Waits until so many sessions are open on the database, besides the one that asks: the server
  /// ends them after their client has left.
  bool open_sessions_become(long expected) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    while (count("pg_stat_activity",
                 "datname = 'mediaserver' AND pid <> pg_backend_pid() "
                 "AND backend_type = 'client backend'") != expected) {
      if (std::chrono::steady_clock::now() > end) return false;
      std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return true;
  }

  void index_audio(const std::string& name, int duration_s) {
    rows("INSERT INTO music(path, duration) VALUES(" + quoted(folder + "/" + name) + ", " +
         std::to_string(duration_s) + ")");
  }

  std::string folder = root.make_folder("volume1/music");
  std::string sheet = folder + "/album.cue";
  MediaInfoCueParser parser;
  int result = -1;
};

TEST_F(CueSheet, GivesTracksTheirStartsAndDurations) {
  index_audio("a.flac", 600);

  const auto tracks =
      tracks_of({"FILE \"a.flac\" WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00", "TRACK 02 AUDIO",
                 "INDEX 01 03:00:00", "TRACK 03 AUDIO", "INDEX 01 07:30:37"});

  EXPECT_EQ(durations(tracks), (std::vector<float>{180, 20287 / 75.0F, 11213 / 75.0F}));
  EXPECT_THAT(starts(tracks), ElementsAre("00:00:00", "03:00:00", "07:30:37"));
  EXPECT_EQ(tracks[1].path, folder + "/a.flac");
  EXPECT_EQ(tracks[1].track, 2);
}

TEST_F(CueSheet, EndsATrackAtTheLastIndexOfTheNextOne) {
  const auto tracks = tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00",
                                 "TRACK 02 AUDIO", "INDEX 00 02:58:00", "INDEX 01 03:00:00"});
  EXPECT_EQ(tracks[0].duration, 180);
}

TEST_F(CueSheet, AddsThePregapToTheStart) {
  const auto tracks =
      tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "PREGAP 00:02:00", "INDEX 01 01:00:00"});
  EXPECT_THAT(starts(tracks), ElementsAre("01:02:00"));
}

TEST_F(CueSheet, ForgetsThePregapAtTheNextTrack) {
  const auto tracks = tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "PREGAP 00:02:00",
                                 "INDEX 01 01:00:00", "TRACK 02 AUDIO", "INDEX 01 02:00:00"});
  EXPECT_THAT(starts(tracks), ElementsAre("01:02:00", "02:00:00"));
}

TEST_F(CueSheet, ShortensATrackByItsPostgap) {
  const auto tracks =
      tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00", "POSTGAP 00:01:00",
                 "TRACK 02 AUDIO", "INDEX 01 03:00:00", "TRACK 03 AUDIO", "INDEX 01 04:00:00"});
  EXPECT_EQ(tracks[0].duration, 179);
  EXPECT_EQ(tracks[1].duration, 60);
}

TEST_F(CueSheet, TakesThePostgapOffTheEndOfTheFileToo) {
  index_audio("a.flac", 100);
  const auto tracks =
      tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:10:00", "POSTGAP 00:01:00"});
  EXPECT_EQ(tracks[0].duration, 89);
}

TEST_F(CueSheet, TakesTheLastTracksOfSeveralFilesFromTheirRows) {
  index_audio("a.flac", 100);
  index_audio("b.flac", 200);

  const auto tracks = tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00",
                                 "FILE b.flac WAVE", "TRACK 02 AUDIO", "INDEX 01 00:00:00"});

  EXPECT_EQ(durations(tracks), (std::vector<float>{100, 200}));
  EXPECT_EQ(tracks[0].path, folder + "/a.flac");
  EXPECT_EQ(tracks[1].path, folder + "/b.flac");
}

TEST_F(CueSheet, EndsATrackWithoutAPathAtTheNextIndex) {
  const auto tracks =
      tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "TRACK 02 AUDIO", "INDEX 01 01:00:00"});
  ASSERT_EQ(tracks.size(), 1U);  // the first one names no music file
  EXPECT_EQ(tracks[0].track, 2);
}

TEST_F(CueSheet, GivesMinusTheStartForAFileWithoutARow) {
  const auto tracks = tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 05:00:00"});
  EXPECT_EQ(tracks[0].duration, -300);
}

TEST_F(CueSheet, GivesMinusTheStartForAFileOutsideTheIndex) {
  sheet = "/elsewhere/album.cue";
  rows("INSERT INTO music(path, duration) VALUES('/elsewhere/a.flac', 600)");
  const auto tracks = tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 05:00:00"});
  EXPECT_EQ(tracks[0].duration, -300);
}

TEST_F(CueSheet, GivesMinusStartAndPostgapForAFileWithoutARow) {
  const auto tracks =
      tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:10:00", "POSTGAP 00:01:00"});
  EXPECT_EQ(tracks[0].duration, -11);
}

TEST_F(CueSheet, KeepsTheDurationWithoutADatabase) {
  const std::string host = std::getenv("PGHOST");
  setenv("PGHOST", root.make_folder("no-server").c_str(), 1);
  const auto tracks = tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 05:00:00"});
  setenv("PGHOST", host.c_str(), 1);

  EXPECT_EQ(tracks[0].duration, 0);
  EXPECT_EQ(logged().back().text, "mediidx_playlist_cue_parse:239 Failed to connect to database.");
}

TEST_F(CueSheet, FailsWhenTheLookUpFails) {
  rows("DROP TABLE music");
  EXPECT_TRUE(parse({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 05:00:00"}));
  EXPECT_EQ(parser.ParseCommand("FILE b.flac WAVE", sheet.c_str()), 0);
  ASSERT_FALSE(logged().empty());
  EXPECT_THAT(logged().back().text,
              testing::StartsWith("mediidx_playlist_cue_parse:255 Failed to exec [SELECT * FROM "
                                  "music WHERE path = '" +
                                  folder + "/a.flac'] ("));
  EXPECT_THAT(output(), IsEmpty());
  EXPECT_EQ(result, 0);
}

TEST_F(CueSheet, FailsWhenTheRowCannotBeFetched) {
  index_audio("a.flac", 600);
  EXPECT_TRUE(parse({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 05:00:00"}));
  {
    const Failing fetch("TAVODBFetchRow");
    EXPECT_EQ(parser.ParseCommand("FILE b.flac WAVE", sheet.c_str()), 0);
  }
  ASSERT_EQ(logged().size(), 1U);
  EXPECT_EQ(logged()[0].text, "mediidx_playlist_cue_parse:266 Failed to fetch row");
  EXPECT_EQ(logged()[0].priority, 3);
  EXPECT_TRUE(open_sessions_become(0));
}

TEST_F(CueSheet, FailsWhenItsStatementCannotBeBuilt) {
  index_audio("a.flac", 600);
  EXPECT_TRUE(parse({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 05:00:00"}));
  const Failing fill("TAVODBEscapeStringEX3");
  EXPECT_THAT(output(), IsEmpty());
  EXPECT_EQ(result, 0);
  EXPECT_TRUE(open_sessions_become(0));
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_F(CueSheet, KeepsTheNodesMadeBeforeMemoryRanOut) {
  EXPECT_TRUE(parse({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00", "TRACK 02 AUDIO",
                     "INDEX 01 03:00:00", "TRACK 03 AUDIO", "INDEX 01 04:00:00"}));
  std::vector<__tag_TAVO_MEDIA_INFO> tracks;
  {
    const FailingAllocation calloc(Allocator::kCalloc, sizeof(_PLAYLIST_REC), 3);
    tracks = output();
  }
  EXPECT_EQ(result, 0);
  EXPECT_THAT(starts(tracks), ElementsAre("00:00:00", "03:00:00"));
  ASSERT_EQ(logged().size(), 1U);
  EXPECT_EQ(logged()[0].text, "mediidx_playlist_cue_parse:452 Failed to calloc.");
}
#endif

TEST_F(CueSheet, IsConnectedOnlyWhileItLooksUp) {
  index_audio("a.flac", 600);
  EXPECT_TRUE(parse({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00"}));
  EXPECT_TRUE(parse({"FILE b.flac WAVE", "TRACK 02 AUDIO", "INDEX 01 00:00:00"}));
  EXPECT_EQ(mediidx::test::last_connect(),
            (mediidx::test::ConnectArguments{"<null>", "postgres", "<null>", "mediaserver"}));
  EXPECT_TRUE(open_sessions_become(0));

  auto* const conn = parser.PersonalLibraryDBConnect();
  ASSERT_NE(conn, nullptr);
  EXPECT_EQ(parser.PersonalLibraryDBConnect(), conn);
  EXPECT_TRUE(open_sessions_become(1));
  parser.PersonalLibraryDBClose();
  parser.PersonalLibraryDBClose();
  EXPECT_TRUE(open_sessions_become(0));
}

// The last INDEX line of a track counts, whatever its number.
TEST_F(CueSheet, EndsATrackAtAFurtherIndexOfTheNextOne) {
  const auto tracks = tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00",
                                 "TRACK 02 AUDIO", "INDEX 01 03:00:00", "INDEX 02 04:00:00"});
  EXPECT_EQ(tracks[0].duration, 240);
  EXPECT_STREQ(tracks[1].comment, "03:00:00");
}

TEST_F(CueSheet, LeavesATrackOfAnotherFileAlone) {
  index_audio("a.flac", 100);
  const auto tracks =
      tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00", "TRACK 02 AUDIO",
                 "INDEX 00 01:30:00", "FILE b.flac WAVE", "INDEX 01 00:00:00", "INDEX 02 00:40:00",
                 "TRACK 03 AUDIO", "INDEX 01 02:00:00"});
  EXPECT_EQ(tracks[0].duration, 90);
  EXPECT_EQ(tracks[1].duration, 120);
  EXPECT_EQ(tracks[1].path, folder + "/b.flac");
}

TEST_F(CueSheet, WithoutAPositionOfItsLastTrackIsNotClosedByAFile) {
  rows("DROP TABLE music");
  EXPECT_TRUE(parse({"FILE a.flac WAVE", "TRACK 01 AUDIO", "FILE b.flac WAVE"}));
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(CueSheet, TakesGenreAndYearFromAnywhere) {
  const auto tracks = tracks_of({"REM GENRE Pop", "FILE a.flac WAVE", "TRACK 01 AUDIO",
                                 "INDEX 01 00:00:00", "REM GENRE Rock", "REM DATE 1999",
                                 "TRACK 02 AUDIO", "INDEX 01 01:00:00", "REM COMMENT x"});
  for (const auto& track : tracks) {
    EXPECT_STREQ(track.genre, "Rock");
    EXPECT_EQ(track.year, 1999);
  }
}

TEST_F(CueSheet, WithoutGenreAndYearGivesNone) {
  const auto tracks = tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00"});
  EXPECT_STREQ(tracks[0].genre, "");
  EXPECT_EQ(tracks[0].year, 0);
}

TEST_F(CueSheet, KnowsItsCommandsInCapitalsOnly) {
  const auto tracks =
      tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00", "track 02 AUDIO",
                 "index 01 01:00:00", "Title x", "rem date 1999"});
  ASSERT_EQ(tracks.size(), 1U);
  EXPECT_STREQ(tracks[0].title, "");
  EXPECT_EQ(tracks[0].year, 0);
}

TEST_F(CueSheet, RebuildsQuotedValuesWithSingleBlanks) {
  const auto tracks = tracks_of({"TITLE \"Live  at   Home\"", "FILE a.flac WAVE", "TRACK 01 AUDIO",
                                 "TITLE Live  at   Home", "INDEX 01 00:00:00"});
  EXPECT_STREQ(tracks[0].album, "Live at Home");
  EXPECT_STREQ(tracks[0].title, "Live");
}

TEST_F(CueSheet, FindsAFileWithBlanksInItsNameBesideTheSheet) {
  const auto tracks =
      tracks_of({"FILE \"My Album.flac\" WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00"});
  EXPECT_EQ(tracks[0].path, folder + "/My Album.flac");
}

TEST_F(CueSheet, WithoutAFolderFindsItsFileWithoutOne) {
  sheet = "album.cue";
  const auto tracks = tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00"});
  EXPECT_STREQ(tracks[0].path, "a.flac");
}

TEST_F(CueSheet, GivesSheetLevelTextsToEveryTrack) {
  const auto tracks = tracks_of(
      {"TITLE Album", "PERFORMER Band", "SONGWRITER Writer", "REM GENRE \"Hard Rock\"",
       "FILE a.flac WAVE", "TRACK 01 AUDIO", "REM DATE 2004-05-01", "TITLE One", "PERFORMER Guest",
       "SONGWRITER Other", "INDEX 01 00:00:00", "TRACK 02 AUDIO", "INDEX 01 01:00:00"});
  EXPECT_STREQ(tracks[0].album, "Album");
  EXPECT_STREQ(tracks[0].album_artist, "Band");
  EXPECT_STREQ(tracks[0].title, "One");
  EXPECT_STREQ(tracks[0].artist, "Guest");
  EXPECT_STREQ(tracks[0].composer, "Other");
  EXPECT_STREQ(tracks[0].genre, "Hard Rock");
  EXPECT_EQ(tracks[0].year, 2004);
  EXPECT_STREQ(tracks[1].album, "Album");
  EXPECT_STREQ(tracks[1].title, "");
  EXPECT_STREQ(tracks[1].artist, "");
  EXPECT_STREQ(tracks[1].composer, "Writer");
  EXPECT_EQ(tracks[1].year, 2004);
}

TEST_F(CueSheet, LeavesOutTracksWhoseFileIsNoMusic) {
  EXPECT_THAT(tracks_of({"FILE x.bin BINARY", "TRACK 01 AUDIO", "INDEX 01 00:00:00"}), IsEmpty());
  EXPECT_THAT(logged(), IsEmpty());
}

TEST_F(CueSheet, WithoutATrackGivesNoList) {
  EXPECT_TRUE(parse({"FILE a.flac WAVE", "TITLE Album"}));
  EXPECT_FALSE(parser.GetIsCueSheet());
  EXPECT_THAT(output(), IsEmpty());
  EXPECT_EQ(result, 0);
}

TEST_F(CueSheet, IsOneFromItsFirstTrackOn) {
  EXPECT_FALSE(parser.GetIsCueSheet());
  EXPECT_TRUE(parse({"TRACK 1 AUDIO"}));
  EXPECT_TRUE(parser.GetIsCueSheet());
}

TEST_F(CueSheet, IgnoresWhatItDoesNotKnow) {
  EXPECT_TRUE(parse({"", "   \t", "CATALOG 123", "CDTEXTFILE x", "FLAGS DCP", "ISRC ABC", "track 1",
                     "REM COMMENT x", "nonsense"}));
  EXPECT_FALSE(parser.GetIsCueSheet());
}

TEST_F(CueSheet, IgnoresLinesThatSayTooLittle) {
  EXPECT_TRUE(parse({"TRACK", "INDEX", "INDEX 01", "PREGAP", "POSTGAP", "REM", "REM GENRE",
                     "REM DATE", "FILE", "TITLE", "PERFORMER", "SONGWRITER"}));
  EXPECT_FALSE(parser.GetIsCueSheet());
}

TEST_F(CueSheet, IgnoresAnIndexBeforeTheFirstTrack) {
  const auto tracks =
      tracks_of({"FILE a.flac WAVE", "INDEX 01 09:00:00", "TRACK 01 AUDIO", "INDEX 01 01:00:00"});
  EXPECT_THAT(starts(tracks), ElementsAre("01:00:00"));
}

TEST_F(CueSheet, KeepsAValueThatALineWithoutOneLeavesAlone) {
  const auto tracks = tracks_of({"TITLE Album",
                                 "TITLE",
                                 "PERFORMER Band",
                                 "PERFORMER",
                                 "SONGWRITER Writer",
                                 "SONGWRITER",
                                 "REM GENRE Rock",
                                 "REM GENRE",
                                 "REM DATE 1999",
                                 "REM DATE",
                                 "FILE a.flac WAVE",
                                 "FILE",
                                 "TRACK 01 AUDIO",
                                 "TRACK",
                                 "TITLE One",
                                 "TITLE",
                                 "PREGAP 00:01:00",
                                 "PREGAP",
                                 "INDEX 01 00:00:00",
                                 "INDEX 01",
                                 "FILE",
                                 "POSTGAP 00:02:00",
                                 "POSTGAP",
                                 "TRACK 02 AUDIO",
                                 "INDEX 01 01:00:00"});
  ASSERT_EQ(tracks.size(), 2U);
  EXPECT_STREQ(tracks[0].album, "Album");
  EXPECT_STREQ(tracks[0].album_artist, "Band");
  EXPECT_STREQ(tracks[0].composer, "Writer");
  EXPECT_STREQ(tracks[0].genre, "Rock");
  EXPECT_EQ(tracks[0].year, 1999);
  EXPECT_STREQ(tracks[0].title, "One");
  EXPECT_STREQ(tracks[0].comment, "00:01:00");
  EXPECT_EQ(tracks[0].duration, 57);
  EXPECT_EQ(tracks[1].path, folder + "/a.flac");
}

// The last word of a FILE line is its type, whatever it says.
TEST_F(CueSheet, TakesANameOfOneWordWithoutATypeOnly) {
  const auto tracks = tracks_of({"FILE a.flac", "TRACK 01 AUDIO", "INDEX 01 00:00:00",
                                 "FILE \"b c.flac\"", "TRACK 02 AUDIO", "INDEX 01 00:00:00"});
  ASSERT_EQ(tracks.size(), 1U);  // what is left of the second name is no music file
  EXPECT_EQ(tracks[0].path, folder + "/a.flac");
}

TEST_F(CueSheet, CutsATitleAtTheBorderOfACharacter) {
  const auto tracks =
      tracks_of({"FILE a.flac WAVE", "TRACK 01 AUDIO",
                 "TITLE " + std::string(253, 'a') + "\xC3\xA9", "INDEX 01 00:00:00"});
  EXPECT_EQ(std::string(tracks[0].title), std::string(253, 'a'));
}

TEST_F(CueSheet, CutsAPathThatDoesNotFit) {
  const auto tracks = tracks_of(
      {"FILE " + std::string(5000, 'a') + ".flac WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00"});
  EXPECT_THAT(tracks, IsEmpty());  // its extension is cut away
}

TEST_F(CueSheet, ReadsAFileNamedWithQuotesInItsNameAsOneName) {
  rows("INSERT INTO music(path, duration) VALUES(" + quoted(folder + "/it's; DROP.flac") + ", 60)");
  const auto tracks =
      tracks_of({"FILE \"it's; DROP.flac\" WAVE", "TRACK 01 AUDIO", "INDEX 01 00:00:00"});
  EXPECT_EQ(tracks[0].duration, 60);
}

/// The parser's fields as its callers are built against them.
struct ParserFields {
  tavodb_connection* connection;
  bool is_cue_sheet;
  __tag_TAVO_MEDIA_INFO album;
  std::vector<__tag_TAVO_MEDIA_INFO> tracks;
  std::string current_file;
  std::string pregap;
  std::string postgap;
};
static_assert(sizeof(MediaInfoCueParser) == sizeof(ParserFields));

TEST(CueParser, HoldsItsFieldsInTheOrderThatItsCallersKnow) {
  MediaInfoCueParser parser;
  const auto& fields = reinterpret_cast<const ParserFields&>(parser);
  EXPECT_EQ(fields.connection, nullptr);
  EXPECT_FALSE(fields.is_cue_sheet);
  EXPECT_STREQ(fields.album.title, "");
  for (const char* line : {"TITLE Album", "FILE a.flac WAVE", "TRACK 07 AUDIO", "PREGAP 00:02:00",
                           "POSTGAP 00:03:00"}) {
    EXPECT_EQ(parser.ParseCommand(line, "/m/a.cue"), 1);
  }
  EXPECT_TRUE(fields.is_cue_sheet);
  EXPECT_STREQ(fields.album.title, "Album");
  ASSERT_EQ(fields.tracks.size(), 1U);
  EXPECT_EQ(fields.tracks[0].track, 7);
  EXPECT_EQ(fields.current_file, "/m/a.flac");
  EXPECT_EQ(fields.pregap, "00:02:00");
  EXPECT_EQ(fields.postgap, "00:03:00");
}

TEST(CueParser, KeepsAPostgapUntilTheNextStart) {
  MediaInfoCueParser parser;
  const auto& fields = reinterpret_cast<const ParserFields&>(parser);
  for (const char* line :
       {"TRACK 01 AUDIO", "POSTGAP 00:03:00", "TRACK 02 AUDIO", "INDEX 00 00:10:00"}) {
    EXPECT_EQ(parser.ParseCommand(line, "/m/a.cue"), 1);
  }
  EXPECT_EQ(fields.postgap, "00:03:00");
  EXPECT_EQ(fields.tracks[0].duration, 7);
  EXPECT_EQ(parser.ParseCommand("INDEX 01 00:12:00", "/m/a.cue"), 1);
  EXPECT_EQ(fields.postgap, "");
  EXPECT_EQ(fields.tracks[0].duration, 9);
}

TEST(CueParser, RebuildsAValueFromItsTokens) {
  MediaInfoCueParser parser;
  std::string value = "before";
  parser.GetString(value, {"a"}, -1, 1);
  EXPECT_EQ(value, "before");
  parser.GetString(value, {"a"}, 1, 1);
  EXPECT_EQ(value, "before");
  parser.GetString(value, {"TITLE", "one", "two"}, 1, 2);
  EXPECT_EQ(value, "one");
  parser.GetString(value, {"TITLE", "\"one", "two\""}, 1, 2);
  EXPECT_EQ(value, "one two");
  parser.GetString(value, {"TITLE", "o\"ne", "two"}, 1, 2);
  EXPECT_EQ(value, "\"ne tw");
  parser.GetString(value, {"\""}, 0, 1);
  EXPECT_EQ(value, "");
  parser.GetString(value, {"\"a\""}, 0, 9);
  EXPECT_EQ(value, "a");
}

/// The words of a line, as a stream takes them from it.
std::vector<std::string> words_of(const std::string& line) {
  std::istringstream in(line);
  std::vector<std::string> words;
  for (std::string word; in >> word;) words.push_back(word);
  return words;
}

TEST(CueParser, ReadsEveryLineAsItsTokensGiveIt) {
  std::mt19937 numbers(7);
  constexpr std::string_view kLetters = "ab\"\" \t  \v\f\r\n1";
  for (int i = 0; i < 20000; ++i) {
    std::string text;
    for (auto length = numbers() % 12; length > 0; --length) {
      text += kLetters[numbers() % kLetters.size()];
    }
    for (const std::string command : {"TITLE ", "REM GENRE ", "FILE "}) {
      MediaInfoCueParser parser;
      const auto& fields = reinterpret_cast<const ParserFields&>(parser);
      ASSERT_EQ(parser.ParseCommand(" " + command + text, "/m/a.cue"), 1);
      const auto words = words_of(command + text);
      const auto count = static_cast<int>(words.size());
      std::string expected;
      if (command == "TITLE ") {
        parser.GetString(expected, words, 1, count - 1);
        ASSERT_EQ(fields.album.title, expected) << text;
      } else if (command == "FILE ") {
        parser.GetString(expected, words, 1, count - 2);
        ASSERT_EQ(fields.current_file, count < 2 ? "" : "/m/" + expected) << text;
      } else {
        parser.GetString(expected, words, 2, count - 2);
        ASSERT_EQ(fields.album.genre, expected) << text;
      }
    }
  }
}

TEST(CueParser, AddsAndSubtractsPositions) {
  MediaInfoCueParser parser;
  std::string position = "01:00:00";
  parser.CalPosition(position, "00:02:00", "+");
  EXPECT_EQ(position, "01:02:00");
  parser.CalPosition(position, "00:03:00", "-");
  EXPECT_EQ(position, "00:59:00");
  parser.CalPosition(position, "00:03:00", "*");
  EXPECT_EQ(position, "00:59:00");
}

TEST(CueParser, HasNoTrackOfANegativePosition) {
  MediaInfoCueParser parser;
  EXPECT_EQ(parser.CalDuration("00:00:00", -1), 0);
  EXPECT_EQ(parser.CalDuration("", -1), 0);
  EXPECT_EQ(parser.CalDuration("00:00:00", 0), 0);
}

}  // namespace
