// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <aifffile.h>
#include <asffile.h>
#include <fileref.h>
#include <id3v2tag.h>
#include <mp4file.h>
#include <mpegfile.h>
#include <popularimeterframe.h>
#include <tpropertymap.h>

#include <filesystem>
#include <fstream>
#include <iterator>

#include "explain_test.h"
#include "ratings/rating_tag.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;

constexpr const char* kMp3 = "music/Untagged/tape side A.mp3";

std::string bytes_of(const std::string& file) {
  std::ifstream in(file, std::ios::binary);
  return {std::istreambuf_iterator<char>(in), {}};
}

/// Adds a POPM frame.
void add_popm(const std::string& path, const std::string& email, int rating) {
  TagLib::MPEG::File file(path.c_str());
  auto* frame = new TagLib::ID3v2::PopularimeterFrame;
  frame->setEmail(email);
  frame->setRating(rating);
  file.ID3v2Tag(true)->addFrame(frame);
  ASSERT_TRUE(file.save());
}

class Rating : public ExplainTest {
 protected:
  std::string stored_stars() {
    return value(
        "SELECT coalesce(string_agg(userid || ':' || star, ' ' ORDER BY userid), '') "
        "FROM rating_track");
  }
  std::string rating_file(const std::string& name) const {
    return at("@eaDir/" + name + "/TAVOAUDIO_SONG_RATING");
  }
};

TEST_F(Rating, IsSetInTheFileAndTheIndex) {
  const auto path = sample(kMp3, "a.mp3");
  index();
  EXPECT_EQ(output({"rating", "set", path, "4", "--user", "ada"}), "");
  EXPECT_EQ(bytes_of(rating_file("a.mp3")), "1026=4\n");
  EXPECT_EQ(stored_stars(), "1026:4");
  const auto set = json({"rating", "set", path, "2", "--user", "1026"});
  EXPECT_EQ(set["stars"], 2);
  EXPECT_EQ(set["user"], "ada");
  EXPECT_EQ(set["indexed"], true);
  EXPECT_EQ(stored_stars(), "1026:2");
  EXPECT_EQ(count("track"), 1);
  EXPECT_EQ(count("music"), 1);
}

TEST_F(Rating, GoesWithNoStars) {
  const auto path = sample(kMp3, "a.mp3");
  index();
  output({"rating", "set", path, "4", "--user", "ada"});
  output({"rating", "set", path, "0", "--user", "ada"});
  EXPECT_EQ(stored_stars(), "");
  EXPECT_FALSE(std::filesystem::exists(rating_file("a.mp3")));
}

TEST_F(Rating, OfASongOutsideTheIndexIsKeptBesideIt) {
  const auto path = home.take_sample(kMp3, "elsewhere/a.mp3");
  const auto done = run({"rating", "set", path, "3", "--user", "ada"});
  EXPECT_EQ(done.status, 0);
  EXPECT_EQ(done.err, "mediidx: " + path + " is not in the index\n");
  EXPECT_EQ(count("track"), 0);
  EXPECT_EQ(json({"rating", "show", path})[0]["stars"], 3);
}

TEST_F(Rating, IsShownOfOneUserOrAll) {
  const auto path = sample(kMp3, "a.mp3");
  media.write("@eaDir/a.mp3/TAVOAUDIO_SONG_RATING", "4000=1\n1026=5\n");
  EXPECT_THAT(lines(output({"rating", "show", path})), ElementsAre("5\tada\t1026", "1\t\t4000"));
  const auto shown = json({"rating", "show", path, "--user", "ada"});
  ASSERT_EQ(shown.size(), 1U);
  EXPECT_EQ(shown[0]["userid"], 1026);
  EXPECT_EQ(output({"rating", "show", at("none.mp3")}), "");
}

TEST_F(Rating, OfATrackOfACueSheetStandsUnderItsNumber) {
  media.take_sample("music/Night Ferry", "f");
  std::filesystem::remove(at("f/lost.cue"));
  index();
  const auto path = at("f/Night Ferry.flac");
  output({"rating", "set", path, "5", "--track", "2", "--user", "ada"});
  EXPECT_EQ(bytes_of(at("f/@eaDir/Night Ferry.flac_2/TAVOAUDIO_SONG_RATING")), "1026=5\n");
  EXPECT_EQ(value("SELECT t.is_virtual || t.track || ':' || r.star FROM rating_track r "
                  "JOIN track t ON t.id = r.track"),
            "TRUE2:5");
  EXPECT_EQ(json({"rating", "show", path, "--track", "2"})[0]["stars"], 5);
  const auto given = json({"rating", "export", "--user", "ada"});
  ASSERT_EQ(given["ratings"].size(), 1U);
  EXPECT_EQ(given["ratings"][0]["track"], 2);
  const auto refused = run({"rating", "set", path, "5", "--track", "77", "--user", "ada"});
  EXPECT_EQ(refused.err, "mediidx: the index knows no track 77 of " + path + "\n");
}

struct RefusedCase {
  Words words;
  int status;
};

TEST_F(Rating, IsRefusedWhereItMakesNoSense) {
  const auto song = sample(kMp3, "a.mp3");
  media.write("a.txt", "x");
  const RefusedCase cases[] = {
      {{"rating", "set", song, "6", "--user", "ada"}, 2},
      {{"rating", "set", song, "-1", "--user", "ada"}, 2},
      {{"rating", "set", song, "four", "--user", "ada"}, 2},
      {{"rating", "set", song, "4"}, 2},
      {{"rating", "set", song, "4", "--user", "ada", "--track", "0"}, 2},
      {{"rating", "set", song, "4", "--user", "nobody-here"}, 1},
      {{"rating", "set", song, "4", "--user", "0"}, 1},
      {{"rating", "set", song, "4", "--user", "4000"}, 1},
      {{"rating", "set", at("a.txt"), "4", "--user", "ada"}, 1},
      {{"rating", "set", at("none.mp3"), "4", "--user", "ada"}, 1},
      {{"rating", "import"}, 2},
      {{"rating", "export"}, 2},
  };
  for (const auto& one : cases) {
    EXPECT_EQ(run(one.words).status, one.status) << testing::PrintToString(one.words);
  }
  EXPECT_FALSE(std::filesystem::exists(at("@eaDir")));
}

TEST_F(Rating, IsImportedFromTags) {
  add_popm(sample(kMp3, "popm.mp3"), "Windows Media Player 9 Series", 196);
  const auto both = sample(kMp3, "both.mp3");
  add_popm(both, "other", 1);
  add_popm(both, "ada", 255);
  ASSERT_TRUE(tool::write_rating_tag(sample("music/Confluence/02 Weir.ogg", "fmps.ogg"), "x", 2));
  sample(kMp3, "none.mp3");
  index();
  const auto imported = json({"rating", "import", "--user", "ada"});
  EXPECT_THAT(column(imported["imported"], "path"),
              ElementsAre(at("both.mp3"), at("fmps.ogg"), at("popm.mp3")));
  EXPECT_THAT(column(imported["imported"], "stars"), ElementsAre("5", "2", "4"));
  EXPECT_EQ(imported["unrated"], 1);
  EXPECT_EQ(imported["kept"], 0);
  EXPECT_THAT(imported["failed"], IsEmpty());
  EXPECT_EQ(bytes_of(rating_file("popm.mp3")), "1026=4\n");
  EXPECT_EQ(value("SELECT r.star FROM rating_track r JOIN track t ON t.id = r.track "
                  "WHERE path = " +
                  quoted(at("both.mp3"))),
            "5");
}

TEST_F(Rating, IsNotOverruledByATagUnlessAsked) {
  const auto path = sample(kMp3, "a.mp3");
  add_popm(path, "", 255);
  index();
  output({"rating", "set", path, "1", "--user", "ada"});
  auto done = run({"rating", "import", "--user", "ada"});
  EXPECT_EQ(done.status, 0);
  EXPECT_EQ(done.err, "mediidx: 0 imported, 1 kept as they were, 0 without a rating\n");
  EXPECT_EQ(stored_stars(), "1026:1");
  done = run({"rating", "import", "--replace", "--user", "ada"});
  EXPECT_EQ(done.out, "5\t" + path + "\n");
  EXPECT_EQ(stored_stars(), "1026:5");
}

TEST_F(Rating, ImportsOnlyBelowAPathAndGoesOnAfterAFailure) {
  add_popm(sample(kMp3, "in/a.mp3"), "", 64);
  add_popm(sample(kMp3, "in/gone.mp3"), "", 64);
  add_popm(sample(kMp3, "other/b.mp3"), "", 64);
  index();
  std::filesystem::remove(at("in/gone.mp3"));
  const auto imported = json_with(3, {"rating", "import", at("in"), "--user", "ada"});
  EXPECT_THAT(column(imported["imported"], "path"), ElementsAre(at("in/a.mp3")));
  ASSERT_EQ(imported["failed"].size(), 1U);
  EXPECT_EQ(imported["failed"][0]["path"], at("in/gone.mp3"));
  EXPECT_EQ(imported["failed"][0]["reason"], "No such file or directory");
}

TEST_F(Rating, IsExportedWithoutTouchingTheSongs) {
  const auto path = sample(kMp3, "a.mp3");
  sample(kMp3, "b.mp3");
  index();
  output({"rating", "set", path, "3", "--user", "ada"});
  const auto before = bytes_of(path);
  EXPECT_EQ(output({"rating", "export", "--user", "ada"}), "3\t\t" + path + "\n");
  const auto given = json({"rating", "export", "--user", "ada"});
  ASSERT_EQ(given["ratings"].size(), 1U);
  EXPECT_EQ(given["ratings"][0]["path"], path);
  EXPECT_EQ(given["ratings"][0]["stars"], 3);
  EXPECT_FALSE(given["ratings"][0].isMember("written"));
  EXPECT_EQ(bytes_of(path), before);
}

TEST_F(Rating, IsWrittenIntoTagsWhenAsked) {
  const auto mp3 = sample("music/Quay Sessions/01 - Ada Brandt.mp3", "a.mp3");
  const auto flac = sample("music/Harbour Lights/Low Tide/03 - A Long Ebb.flac", "b.flac");
  index();
  const auto before = value(
      "SELECT string_agg(title || artist || album || genre, ',' "
      "ORDER BY path) FROM music");
  output({"rating", "set", mp3, "4", "--user", "ada"});
  output({"rating", "set", flac, "2", "--user", "ada"});
  const auto given = json({"rating", "export", "--write-tags", "--user", "ada"});
  EXPECT_THAT(column(given["ratings"], "written"), ElementsAre("true", "true"));
  EXPECT_EQ(tool::read_rating_tag(mp3, "ada"), 4);
  EXPECT_EQ(tool::read_rating_tag(flac, "ada"), 2);
  EXPECT_EQ(value("SELECT string_agg(title || artist || album || genre, ',' ORDER BY path) "
                  "FROM music"),
            before);
  EXPECT_EQ(value("SELECT filesize FROM music WHERE path = " + quoted(flac)),
            std::to_string(std::filesystem::file_size(flac)));
  EXPECT_EQ(stored_stars(), "1026:4 1026:2");
  const auto again = json({"rating", "export", "--write-tags", "--user", "ada"});
  EXPECT_THAT(column(again["ratings"], "written"), ElementsAre("false", "false"));
}

struct FormatCase {
  const char* sample;
  const char* name;
};

class ARatingTagOf : public testing::TestWithParam<FormatCase> {};

TEST_P(ARatingTagOf, AFormatIsReadAsItWasWritten) {
  const OpenFolder folder;
  const auto path = folder.take_sample(GetParam().sample, GetParam().name);
  const auto properties = [&path] {
    auto tags = TagLib::FileRef(path.c_str()).file()->properties();
    tags.unsupportedData().clear();
    return tags;
  };
  const auto before = properties();
  EXPECT_EQ(tool::read_rating_tag(path, "ada"), std::nullopt);
  ASSERT_TRUE(tool::write_rating_tag(path, "ada", 3));
  EXPECT_EQ(tool::read_rating_tag(path, "ada"), 3);
  ASSERT_TRUE(tool::write_rating_tag(path, "ada", 5));
  EXPECT_EQ(tool::read_rating_tag(path, "ada"), 5);
  auto after = properties();
  after.erase("FMPS_RATING");
  EXPECT_EQ(before.toString().to8Bit(true), after.toString().to8Bit(true));
}

INSTANTIATE_TEST_SUITE_P(
    Formats, ARatingTagOf,
    testing::Values(FormatCase{"music/Quay Sessions/01 - Ada Brandt.mp3", "a.mp3"},
                    FormatCase{"music/Harbour Lights/Low Tide/03 - A Long Ebb.flac", "a.flac"},
                    FormatCase{"music/Mina Okafor/Tide Tables/01 High Water.m4a", "a.m4a"},
                    FormatCase{"music/Confluence/02 Weir.ogg", "a.ogg"},
                    FormatCase{"music/Confluence/03 Lock.opus", "a.opus"},
                    FormatCase{"music/Untagged/tape side B.wav", "a.wav"}),
    [](const auto& one) { return std::string(one.param.name).substr(2); });

TEST(ARatingTag, KeepsTheVersionOfId3AndTheFramesOfOthers) {
  const OpenFolder folder;
  const auto path = folder.take_sample(kMp3, "a.mp3");
  {
    TagLib::MPEG::File file(path.c_str());
    file.ID3v2Tag(true)->setTitle("T");
    ASSERT_TRUE(file.save(TagLib::MPEG::File::ID3v2, TagLib::File::StripNone, TagLib::ID3v2::v3));
  }
  add_popm(path, "other", 64);
  {
    TagLib::MPEG::File file(path.c_str());
    ASSERT_TRUE(file.save(TagLib::MPEG::File::ID3v2, TagLib::File::StripNone, TagLib::ID3v2::v3));
  }
  ASSERT_TRUE(tool::write_rating_tag(path, "ada", 5));
  TagLib::MPEG::File file(path.c_str());
  EXPECT_EQ(file.ID3v2Tag()->header()->majorVersion(), 3U);
  EXPECT_EQ(file.ID3v2Tag()->frameList("POPM").size(), 2U);
  EXPECT_EQ(tool::read_rating_tag(path, "other"), 2);
  EXPECT_EQ(tool::read_rating_tag(path, "ada"), 5);
}

TEST(ARatingTag, IsNotWrittenIntoWhatHoldsNone) {
  const OpenFolder folder;
  const auto path = folder.write("a.dsf", "DSD of a kind");
  EXPECT_FALSE(tool::write_rating_tag(path, "ada", 5));
  EXPECT_EQ(bytes_of(path), "DSD of a kind");
  EXPECT_EQ(tool::read_rating_tag(path, "ada"), std::nullopt);
  EXPECT_THROW(tool::read_rating_tag(folder.at("none.mp3"), "ada"), std::runtime_error);
}

}  // namespace
}  // namespace mediidx::test
