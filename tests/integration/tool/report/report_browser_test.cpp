// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The report as a browser shows it.
#include <array>
#include <fstream>
#include <sstream>

#include "integration/tool/verbs/verb_test.h"

namespace mediidx::test {
namespace {

using testing::Not;

// Of the style of a light page.
struct Colour {
  const char* name;
  std::array<unsigned char, 3> rgb;
};
constexpr Colour kColours[] = {
    {"music", {0x38, 0x67, 0xD6}},
    {"videos", {0xE0, 0x53, 0x3D}},
    {"photos", {0xE5, 0xA5, 0x0A}},
    {"playlists", {0x2A, 0xA1, 0x98}},
};

constexpr const char* kHostile = "</script><img src=http://127.0.0.1/ onerror=alert(1)>";

int times(const std::string& text, const std::string& what) {
  int out = 0;
  for (auto at = text.find(what); at != text.npos; at = text.find(what, at + 1)) ++out;
  return out;
}

std::string text_of(const std::string& file) {
  std::ostringstream out;
  out << std::ifstream(file, std::ios::binary).rdbuf();
  return out.str();
}

class ReportInABrowser : public VerbTest {
 protected:
  ReportInABrowser() {
    rows(
        "INSERT INTO music(path, filesize, date) SELECT '/v/m/' || i || '.mp3', 9, "
        "timestamp '2024-01-01' + i * interval '1 day' FROM generate_series(1, 40) AS i");
    rows(
        "INSERT INTO track(userid, path, year, duration, is_virtual) "
        "SELECT 0, path, 1990 + id % 20, '1.000000', 'FALSE' FROM music");
    rows("INSERT INTO genre_track(track, genre) SELECT id, 'Genre ' || id % 5 FROM track");
    rows("INSERT INTO photo(path, filesize, date) SELECT '/v/p.jpg', 200, '2024-01-09'");
    rows("INSERT INTO video(path, filesize, date) SELECT '/v/f.mkv', 300, '2024-01-19'");
    rows("INSERT INTO playlist(path, filesize, date) SELECT '/v/l.m3u', 1, '2024-01-29'");
  }

  /// Loads a page, without a network; what it has become, and what the browser had to say.
  Outcome load(const std::string& page) const {
    Setting setting;
    setting.environment = {{"HOME", data.path()}};
    setting.program = MEDIIDX_TIMEOUT;
    // Its sandbox needs rights that root lacks here and that a chroot does not give.
    return run_mediidx(
        {"--kill-after=5", "90", MEDIIDX_CHROMIUM, "--headless=new", "--no-sandbox",
         "--disable-gpu", "--disable-dev-shm-usage", "--disable-background-networking",
         "--host-resolver-rules=MAP * ~NOTFOUND", "--user-data-dir=" + data.at("chromium"),
         "--force-color-profile=srgb", "--enable-logging=stderr", "--window-size=1200,2000",
         "--hide-scrollbars", "--screenshot=" + picture(), "--dump-dom", "file://" + page},
        setting);
  }
  std::string report() const {
    EXPECT_EQ(output({"report", data.at("out.html")}), "");
    return data.at("out.html");
  }
  std::string picture() const { return data.at("shot.png"); }
  /// How many points of the picture have a colour.
  int points(const Colour& colour) const {
    Setting setting;
    setting.program = MEDIIDX_FFMPEG;
    const auto raw =
        run_mediidx({"-v", "error", "-i", picture(), "-f", "rawvideo", "-pix_fmt", "rgb24", "-"},
                    setting)
            .out;
    int out = 0;
    for (std::size_t at = 0; at + 2 < raw.size(); at += 3) {
      const auto matches = [&](std::size_t i) {
        return static_cast<unsigned char>(raw[at + i]) == colour.rgb[i];
      };
      if (matches(0) && matches(1) && matches(2)) ++out;
    }
    return out;
  }
};

TEST_F(ReportInABrowser, DrawsItsChartsWithoutAComplaint) {
  const auto shown = load(report());
  EXPECT_EQ(shown.status, 0);
  EXPECT_THAT(shown.err, Not(HasSubstr("CONSOLE")));
  EXPECT_EQ(times(shown.out, "<figure "), 6);
  EXPECT_EQ(times(shown.out, "data-drawn=\""), 6);
  EXPECT_EQ(times(shown.out, "<details open"), 0);
  for (const auto& colour : kColours) EXPECT_GT(points(colour), 500) << colour.name;
}

TEST_F(ReportInABrowser, ShowsHostileNamesAsText) {
  rows("UPDATE genre_track SET genre = " + quoted(kHostile));
  rows("UPDATE music SET path = " + quoted(std::string("/v") + kHostile + "/") +
       " || id || '.mp3'");
  const auto shown = load(report());
  EXPECT_EQ(shown.status, 0);
  EXPECT_THAT(shown.err, Not(HasSubstr("CONSOLE")));
  EXPECT_THAT(shown.out, Not(HasSubstr("<img")));
  EXPECT_EQ(times(shown.out, "<script"), 2);
  EXPECT_EQ(times(shown.out, "data-drawn=\""), 6);
}

TEST_F(ReportInABrowser, OfAnEmptyIndexHasNothingToDraw) {
  TestServer::get().fresh_database();
  const auto shown = load(report());
  EXPECT_EQ(shown.status, 0);
  EXPECT_THAT(shown.err, Not(HasSubstr("CONSOLE")));
  EXPECT_EQ(times(shown.out, "<figure "), 0);
}

TEST_F(ReportInABrowser, WithoutItsScriptsShowsItsTables) {
  auto page = text_of(report());
  const std::string tag = "<script nonce=\"";
  for (auto at = page.find(tag); at != page.npos; at = page.find(tag, at + tag.size())) {
    page.insert(at + tag.size(), "x");
  }
  const auto shown = load(data.write("foreign.html", page));
  EXPECT_EQ(shown.status, 0);
  EXPECT_THAT(shown.err, HasSubstr("CONSOLE"));
  EXPECT_EQ(times(shown.out, "data-drawn=\""), 0);
  EXPECT_EQ(times(shown.out, "<details open"), 6);
  for (const auto& colour : kColours) EXPECT_EQ(points(colour), 0) << colour.name;
}

}  // namespace
}  // namespace mediidx::test
