// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fileref.h>
#include <tag.h>

#include <map>

#include "explain_test.h"

namespace mediidx::test {
namespace {

using testing::Contains;

class Inspect : public ExplainTest {
 protected:
  /// The fields of the record by name.
  static std::map<std::string, Json::Value> fields(const Json::Value& shown) {
    std::map<std::string, Json::Value> out;
    for (const auto& field : shown["record"]) out[field["field"].asString()] = field;
    return out;
  }
};

TEST_F(Inspect, ShowsWhatIsStoredAndWhatWasRead) {
  const auto path = sample("music/Harbour Lights/Low Tide/03 - A Long Ebb.flac", "a.flac");
  const auto shown = json({"inspect", path});
  EXPECT_EQ(shown["path"], path);
  EXPECT_EQ(shown["userid"], 0);
  const auto record = fields(shown);
  EXPECT_EQ(record.at("title")["read"], "A Long Ebb");
  EXPECT_EQ(record.at("title")["stored"], "A Long Ebb");
  EXPECT_EQ(record.at("title")["note"], "");
  EXPECT_EQ(record.at("genre")["stored"], "Folk;Sea Songs");
  EXPECT_EQ(record.at("track")["stored"], 3);
  EXPECT_EQ(record.at("rg_track_gain")["stored"], "-3.500000");
  EXPECT_EQ(record.count("camera_make"), 0U);
  const auto& tags = shown["tags"];
  EXPECT_THAT(column(tags, "tag"), Contains("GENRE").Times(2));
  EXPECT_THAT(column(tags, "value"), Contains("-3.50 dB"));
}

TEST_F(Inspect, StoresWhatTheIndexThenHolds) {
  const auto path = sample("music/Mina Okafor/Tide Tables/01 High Water.m4a", "a.m4a");
  index();
  const auto record = fields(json({"inspect", path}));
  for (const char* name : {"title", "album", "artist", "album_artist", "composer", "comment",
                           "genre", "year", "track", "disc", "channel", "frequency", "bitrate",
                           "covercount", "duration", "filesize", "fs_uuid", "date", "mdate"}) {
    const auto stored = value(std::string("SELECT ") + name + " FROM music");
    const auto found = record.find(name);
    if (found == record.end()) {
      EXPECT_TRUE(stored.empty() || stored == "0") << name << ": " << stored;
    } else {
      EXPECT_EQ(found->second["stored"].asString(), stored) << name;
    }
  }
}

TEST_F(Inspect, TellsWhatWasCleanedAndCut) {
  const auto path = sample("music/Untagged/tape side A.mp3", "a.mp3");
  {
    const TagLib::FileRef file(path.c_str());
    // 253 letters and a character of two bytes: together one byte too many.
    file.tag()->setTitle(
        TagLib::String(std::string(253, 'x') + "\xC3\xBC" + "yz", TagLib::String::UTF8));
    file.tag()->setArtist("Ada\n\tBrandt\x01");
    ASSERT_TRUE(file.file()->save());
  }
  const auto shown = json({"inspect", path});
  const auto record = fields(shown);
  EXPECT_EQ(record.at("title")["stored"], std::string(253, 'x'));
  EXPECT_EQ(record.at("title")["note"], "cut to 253 bytes");
  EXPECT_EQ(record.at("artist")["read"], "Ada Brandt");
  EXPECT_EQ(record.at("duration")["note"].asString().substr(0, 20), "cut to whole seconds");
  for (const auto& tag : shown["tags"]) {
    if (tag["tag"] == "ARTIST") {
      EXPECT_EQ(tag["value"], "Ada\n\tBrandt\x01");
      EXPECT_EQ(tag["cleaned"], "Ada Brandt");
    } else {
      EXPECT_TRUE(tag["cleaned"].isNull()) << tag["tag"].asString();
    }
  }
  EXPECT_THAT(lines(output({"inspect", path})),
              Contains("tag ARTIST\tAda\\n\\tBrandt\\x01\tAda Brandt\tcleaned"));
}

TEST_F(Inspect, KnowsPhotosVideosAndPlaylists) {
  const auto photo = json({"inspect", sample("photos/2021 Harbour/IMG_0001.jpg", "a.jpg")});
  EXPECT_EQ(fields(photo).at("exposure")["stored"], "1/125");
  EXPECT_THAT(column(photo["tags"], "tag"), Contains("Exif.Photo.ExposureTime"));
  const auto video = json({"inspect", sample("videos/harbour.mp4", "a.mp4")});
  EXPECT_EQ(fields(video).at("video_codec")["stored"], "h264");
  EXPECT_THAT(column(video["tags"], "value"), Contains("A Day at the Harbour"));
  media.write("a.m3u", "a.mp3\n");
  const auto playlist = json({"inspect", at("a.m3u")});
  EXPECT_EQ(fields(playlist).at("title")["stored"], "a");
  EXPECT_THAT(playlist["tags"], IsEmpty());
}

TEST_F(Inspect, NamesTheOwnerOfAPersonalSong) {
  home.take_sample("music/Untagged/tape side A.mp3", "ada/music/a.mp3");
  EXPECT_EQ(json({"inspect", at_home("music/a.mp3")})["userid"], 1026);
}

TEST_F(Inspect, FailsForWhatCannotBeRead) {
  media.write("broken.mp4", "no video");
  media.write("a.txt", "x");
  const auto broken = run({"inspect", at("broken.mp4")});
  EXPECT_EQ(broken.status, 1);
  EXPECT_THAT(broken.err, HasSubstr(at("broken.mp4") + " would not be indexed: "));
  EXPECT_EQ(run({"inspect", at("a.txt")}).err,
            "mediidx: " + at("a.txt") + " is no medium, by its name\n");
  EXPECT_EQ(run({"inspect", at("none.mp3")}).status, 1);
  EXPECT_EQ(run({"inspect"}).status, 2);
}

}  // namespace
}  // namespace mediidx::test
