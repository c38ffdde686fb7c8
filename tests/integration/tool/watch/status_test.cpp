// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <json/reader.h>

#include <sstream>

#include "integration/tool/scan/scan_fixture.h"

namespace mediidx::test {
namespace {

class Status : public ScanTest {
 protected:
  Json::Value status() const {
    const auto done = run({"status", "--json"});
    EXPECT_EQ(done.status, 0) << done.err;
    Json::Value out;
    std::istringstream in(done.out);
    EXPECT_TRUE(Json::parseFromStream(Json::CharReaderBuilder(), in, &out, nullptr)) << done.out;
    return out;
  }
};

TEST_F(Status, OfNothingSaysSo) {
  EXPECT_THAT(run({"status"}).out, HasSubstr("No folder is chosen for indexing.\n"));
  EXPECT_EQ(status()["roots"].size(), 0U);
}

TEST_F(Status, TellsOfRootsAndScans) {
  song("a.mp3");
  index();
  const auto roots = status()["roots"];
  ASSERT_EQ(roots.size(), 1U);
  EXPECT_EQ(roots[0]["path"], media.at("m"));
  EXPECT_EQ(roots[0]["online"], true);
  EXPECT_EQ(roots[0]["exists"], true);
  EXPECT_EQ(roots[0]["files"], 1);
  EXPECT_EQ(roots[0]["left_alone"], 0);
  EXPECT_EQ(roots[0]["scanned"].asString().size(), std::string("2026-11-21 20:00:00").size());
  EXPECT_THAT(run({"status"}).out, HasSubstr(media.at("m") + ": online, 1 files, last scan 20"));
}

TEST_F(Status, TellsOfARootThatIsAway) {
  song("a.mp3");
  index();
  fs::rename(media.at("m"), media.at("away"));
  scan();
  const auto roots = status()["roots"];
  EXPECT_EQ(roots[0]["online"], false);
  EXPECT_EQ(roots[0]["exists"], false);
  EXPECT_EQ(roots[0]["files"], 1);
  EXPECT_THAT(run({"status"}).out, HasSubstr(media.at("m") + ": away, 1 files"));
}

TEST_F(Status, NamesTheFilesThatAreLeftAlone) {
  index();
  media.write("m/bad.jpg", "no picture");
  scan();
  const auto found = status();
  ASSERT_EQ(found["left_alone"].size(), 1U);
  EXPECT_EQ(found["left_alone"][0]["path"], at("bad.jpg"));
  EXPECT_FALSE(found["left_alone"][0]["reason"].asString().empty());
  EXPECT_EQ(found["roots"][0]["left_alone"], 1);
  EXPECT_THAT(run({"status"}).out,
              HasSubstr("Left alone until they change:\n  " + at("bad.jpg") + ": "));
}

TEST_F(Status, NamesTheScanThatRuns) {
  index();
  EXPECT_TRUE(status()["running"].isNull());
  for (int i = 0; i < 800; ++i) {
    fs::copy_file(fs::path(MEDIIDX_SAMPLE_LIBRARY) / kSong, at(std::to_string(i) + ".mp3"));
  }
  Setting setting;
  setting.meanwhile = [this](pid_t pid) {
    while (count("track") == 0) usleep(1000);
    EXPECT_EQ(status()["running"], std::to_string(pid));
  };
  EXPECT_EQ(scan({}, setting).status, 0);
}

}  // namespace
}  // namespace mediidx::test
