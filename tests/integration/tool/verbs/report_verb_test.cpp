// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>
#include <regex>
#include <sstream>

#include "verb_test.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;
using testing::AllOf;
using testing::Contains;
using testing::ElementsAre;
using testing::Not;

constexpr const char* kHostile = "</script><img src=x onerror=alert(1)>";
constexpr const char* kHarmless = "&lt;/script&gt;&lt;img src=x onerror=alert(1)&gt;";

class ReportVerb : public VerbTest {
 protected:
  /// The page that the verb writes.
  std::string page() const {
    EXPECT_EQ(output({"report", out()}), "");
    std::ostringstream text;
    text << std::ifstream(out()).rdbuf();
    return text.str();
  }
  /// The rows of a section's table, their cells' texts parted by tabs.
  std::vector<std::string> table(const std::string& section) const {
    return table(page(), section);
  }
  static std::vector<std::string> table(const std::string& text, const std::string& section) {
    const auto begin = text.find("<section id=\"" + section + "\"");
    auto part = text.substr(begin, text.find("</section>", begin) - begin);
    part = part.substr(std::min(part.find("<tbody>\n"), part.size()));
    std::vector<std::string> out;
    for (const auto& line : lines(part)) {
      if (!line.starts_with("<tr>")) continue;
      const auto cells = std::regex_replace(line, std::regex("</t[hd]><t[hd]"), "\t<");
      out.push_back(std::regex_replace(cells, std::regex("<[^>]*>"), ""));
    }
    return out;
  }
  std::string out() const { return data.at("out.html"); }

  /// A song with a year and the day on which it came.
  void insert_track(const std::string& path, int year) {
    rows("INSERT INTO track(userid, path, year, duration, is_virtual) VALUES (0, " + quoted(path) +
         ", " + std::to_string(year) + ", '1.000000', 'FALSE')");
  }
  void insert_music(const std::string& path, const std::string& date, long size = 1) {
    rows("INSERT INTO music(path, date, filesize, duration) VALUES (" + quoted(path) + ", " +
         quoted(date) + ", " + std::to_string(size) + ", 60)");
  }
  void insert_genres(int number) {
    for (int i = 1; i <= number; ++i) {
      rows("INSERT INTO genre_track(track, genre) SELECT id, 'Genre " + std::to_string(100 + i) +
           "' FROM track, generate_series(1, " + std::to_string(100 - i) + ")");
    }
  }
  void insert_failure(const std::string& folder, const std::string& name,
                      const std::string& failure) {
    rows("WITH f AS (INSERT INTO scan.folder(path, parent, personal) VALUES (" + quoted(folder) +
         ", '', false) RETURNING id) "
         "INSERT INTO scan.file(folder, name, kind, size, modified, device, inode, failure) "
         "SELECT id, " +
         quoted(name) + ", 0, 1, 1, 1, 1, " + quoted(failure) + " FROM f");
  }
};

TEST_F(ReportVerb, CountsFilesByKind) {
  insert("/v/a");
  insert_music("/v/b.mp3", "epoch", 2500);
  EXPECT_THAT(table("kinds"), ElementsAre("Music\t2\t2.5 kB\t", "Videos\t1\t\t", "Photos\t1\t\t",
                                          "Playlists\t1\t\t"));
}

TEST_F(ReportVerb, CountsSongsOfTheUsersOwnLibraries) {
  rows(
      "INSERT INTO track(userid, path, duration, filesize, is_virtual) "
      "VALUES (1026, '/home/x/a.ogg', '60.500000', 11, 'FALSE'), "
      "(1026, '/home/x/a.ogg', '20.500000', 0, 'TRUE')");
  EXPECT_THAT(table("kinds"), Contains("Music\t1\t11 B\t"));
  EXPECT_THAT(page(), HasSubstr("<strong>1</strong><span class=\"more\">1 min</span>"));
}

TEST_F(ReportVerb, CountsYearsWithThoseThatNoChartHasRoomFor) {
  insert_track("/a", 1998);
  insert_track("/b", 1998);
  insert_track("/c", 1785);
  insert_track("/d", 2147483647);
  insert_track("/e", 0);
  rows(
      "INSERT INTO photo(path, timetaken) VALUES ('/p', '1998-05-01'), ('/q', 'epoch'), "
      "('/r', 'infinity')");
  EXPECT_THAT(table("years"), ElementsAre("before 1900\t1\t", "1998\t2\t1", "in the future\t1\t"));
}

TEST_F(ReportVerb, SumsUpTheRareGenres) {
  insert_track("/a", 0);
  insert_genres(15);
  const auto genres = table("genres");
  ASSERT_EQ(genres.size(), 13U);
  EXPECT_EQ(genres[0], "Genre 101\t99");
  EXPECT_EQ(genres[12], "3 more\t" + std::to_string(87 + 86 + 85));
}

TEST_F(ReportVerb, NamesALastGenreThatIsAlone) {
  insert_track("/a", 0);
  insert_genres(13);
  EXPECT_EQ(table("genres").back(), "Genre 113\t87");
}

TEST_F(ReportVerb, CountsFormatsWhateverTheirCase) {
  insert_music("/v/a.MP3", "epoch");
  insert_music("/v/b.mp3", "epoch");
  insert_music("/v.d/none", "epoch");
  rows("INSERT INTO photo(path, filesize) VALUES ('/v/c.jpg', 5)");
  EXPECT_THAT(table("formats"),
              ElementsAre("mp3\t2\t\t\t\t2 B", "jpg\t\t\t1\t\t5 B", "—\t1\t\t\t\t1 B"));
}

TEST_F(ReportVerb, AddsUpTheFoldersBelowAScannedOne) {
  rows("INSERT INTO scan.root(path, volume) VALUES ('/v/media', '')");
  insert_music("/v/media/rock/x/a.mp3", "epoch", 10);
  insert_music("/v/media/rock/b.mp3", "epoch", 20);
  insert_music("/v/media/c.mp3", "epoch", 5);
  insert_music("/v/media2/deep/down/d.mp3", "epoch", 3);
  insert_music("/e.mp3", "epoch", 2);
  EXPECT_THAT(table("folders"), ElementsAre("/v/media/rock\t30 B\t\t\t2", "/v/media\t5 B\t\t\t1",
                                            "/v/media2\t3 B\t\t\t1", "/\t2 B\t\t\t1"));
}

TEST_F(ReportVerb, TellsGrowthByDay) {
  insert_music("/a", "2024-05-01 10:00");
  insert_music("/b", "2024-05-01 20:00");
  insert_music("/c", "2024-05-03");
  insert_music("/d", "epoch");
  insert_music("/e", "9999-01-01");
  EXPECT_THAT(table("growth"), ElementsAre("2024-05-01\t2\t\t\t", "2024-05-03\t1\t\t\t"));
}

TEST_F(ReportVerb, TellsLongGrowthByMonthAndLongerGrowthByYear) {
  insert_music("/a", "2023-05-01");
  insert_music("/b", "2024-05-03");
  EXPECT_THAT(table("growth"), ElementsAre("2023-05\t1\t\t\t", "2024-05\t1\t\t\t"));
  insert_music("/c", "1995-05-03");
  EXPECT_THAT(table("growth"), ElementsAre("1995\t1\t\t\t", "2023\t1\t\t\t", "2024\t1\t\t\t"));
}

TEST_F(ReportVerb, ListsAlbumsWithoutAnArtist) {
  save({.path = at("a.mp3"), .artist = "Ada", .album = "Hits"});
  save({.path = at("b.mp3"), .artist = "Bo", .album = "Hits"});
  save({.path = at("c.mp3"), .artist = "Ada", .album = "Own"});
  save({.path = at("d.mp3"), .artist = "Ada"});
  EXPECT_THAT(table("albums"), ElementsAre("Hits\t2\t2\t" + at("a.mp3")));
  EXPECT_THAT(page(), HasSubstr("1 album has no artist"));
}

TEST_F(ReportVerb, ListsFilesThatCouldNotBeRead) {
  insert_failure("/v/m", "a.mp3", "it is damaged");
  EXPECT_THAT(table("failures"), ElementsAre("/v/m/a.mp3\tit is damaged"));
  EXPECT_THAT(page(), HasSubstr("1 file could not be read"));
}

TEST_F(ReportVerb, ListsTheVolumesThatAreAway) {
  rows(
      "INSERT INTO music(path, filesize, fs_uuid, fs_online) VALUES "
      "('/v/b.mp3', 1, 'one', 'f'), ('/v/a.mp3', 2, 'one', 'f'), ('/w/c.mp3', 3, 'two', 't')");
  EXPECT_THAT(table("offline"), ElementsAre("one\t2\t\t\t3 B\t/v/a.mp3"));
  EXPECT_THAT(page(), HasSubstr("2 files are offline"));
}

TEST_F(ReportVerb, TellsWhenWhichFolderWasScanned) {
  rows(
      "INSERT INTO scan.root(path, volume, away, scanned) VALUES "
      "('/v', '', true, '2024-05-01 12:30:00+00'), ('/gone', '', false, now())");
  insert_failure("/v/m", "a.mp3", "it is damaged");
  EXPECT_THAT(table("scans"), ElementsAre("/v\taway\t2024-05-01 12:30\t\t1"));
}

TEST_F(ReportVerb, OfAnEmptyIndexSaysSo) {
  const auto text = page();
  EXPECT_THAT(text, AllOf(HasSubstr("The index is empty."), HasSubstr("Nothing has a genre."),
                          HasSubstr("No folder has been scanned."), Not(HasSubstr("<table>"))));
  EXPECT_THAT(text, HasSubstr("<strong>0 B</strong>"));
}

TEST_F(ReportVerb, HoldsHostileNamesAsText) {
  save({.path = at(std::string("a") + kHostile + ".mp3"),
        .artist = "Ada",
        .album = kHostile,
        .genre = kHostile});
  save({.path = at("b.mp3"), .artist = "Bo", .album = kHostile});
  insert_failure(std::string("/v/") + kHostile, kHostile, kHostile);
  insert_music("/v/<img src=x onerror=alert(1)>/x.<img src=x onerror=alert(1)>", "epoch");
  rows("UPDATE music SET fs_online = false, fs_uuid = " + quoted(kHostile));
  rows("INSERT INTO scan.root(path, volume) VALUES (" + quoted(std::string("/v/") + kHostile) +
       ", '')");
  const auto text = page();
  EXPECT_THAT(text, Not(HasSubstr("<img")));
  for (const char* section : {"genres", "albums", "failures", "offline", "scans"}) {
    EXPECT_THAT(table(text, section), Contains(HasSubstr(kHarmless))) << section;
  }
  for (const char* section : {"folders", "formats"}) {
    EXPECT_THAT(table(text, section), Contains(HasSubstr("&lt;img src=x onerror=alert(1)&gt;")))
        << section;
  }
}

TEST_F(ReportVerb, ReplacesAnEarlierReport) {
  page();
  insert_music("/a.mp3", "epoch");
  EXPECT_THAT(page(), Not(HasSubstr("The index is empty.")));
}

TEST_F(ReportVerb, LeavesAnyOtherFileAsItIs) {
  const auto song = data.write("song.mp3", "ID3");
  const auto done = run({"report", song});
  EXPECT_EQ(done.status, 1);
  EXPECT_THAT(done.err, HasSubstr("song.mp3: is there and is no report"));
  EXPECT_EQ(fs::file_size(song), 3U);
}

TEST_F(ReportVerb, NamesAFileThatCannotBeWritten) {
  const auto done = run({"report", data.at("no/such.html")});
  EXPECT_EQ(done.status, 1);
  EXPECT_THAT(done.err, HasSubstr("no/such.html: No such file or directory"));
}

TEST_F(ReportVerb, NeedsAFile) {
  EXPECT_EQ(run({"report"}).status, 2);
  EXPECT_EQ(run({"report", "a", "b"}).status, 2);
}

TEST_F(ReportVerb, NeedsADatabase) {
  Setting setting;
  setting.environment = {{"PGHOST", "/nowhere"}};
  const auto done = run({"report", out()}, setting);
  EXPECT_EQ(done.status, 5);
  EXPECT_FALSE(fs::exists(out()));
}

}  // namespace
}  // namespace mediidx::test
