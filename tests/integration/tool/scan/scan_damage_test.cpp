// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Thousands of damaged files: cut and flipped copies of good ones.
#include <fstream>
#include <random>
#include <set>
#include <sstream>

#include "scan_fixture.h"

namespace mediidx::test {
namespace {

constexpr int kDamaged = 2200;

class DamagedMedia : public ScanTest {
 protected:
  /// The media files of the sample library, each with its content.
  static std::vector<std::pair<fs::path, std::string>> good_files() {
    static const std::set<std::string> kExtensions{".mp3", ".flac", ".ogg", ".opus", ".m4a",
                                                   ".wav", ".jpg",  ".png", ".mp4",  ".mkv"};
    std::vector<std::pair<fs::path, std::string>> out;
    for (const char* part : {"music", "photos", "videos"}) {
      for (const auto& entry :
           fs::recursive_directory_iterator(fs::path(MEDIIDX_SAMPLE_LIBRARY) / part)) {
        if (!kExtensions.contains(entry.path().extension())) continue;
        std::ifstream in(entry.path(), std::ios::binary);
        out.emplace_back(entry.path(), std::string((std::istreambuf_iterator<char>(in)), {}));
      }
    }
    std::ranges::sort(out);
    return out;
  }

  static std::string damaged(std::string content, std::mt19937& random) {
    if (random() % 3 == 0) {
      content.resize(1 + random() % content.size());
      return content;
    }
    // Most of what a reader looks at stands at the beginning.
    const auto reach = random() % 2 ? content.size() : std::min<std::size_t>(content.size(), 600);
    const auto flips = 1 + random() % 40;
    for (std::size_t i = 0; i < flips; ++i) {
      content[random() % reach] ^= static_cast<char>(1U << random() % 8);
    }
    return content;
  }
};

TEST_F(DamagedMedia, CostsItselfOnlyAndIsNamed) {
  const unsigned seeds[] = {20'240'601U, std::random_device()()};
  const auto good = good_files();
  ASSERT_GT(good.size(), 30U);
  index();
  int copies = 0;
  for (const auto seed : seeds) {
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    for (int i = 0; i < kDamaged / 2; ++i) {
      const auto& [path, content] = good[random() % good.size()];
      media.write("m/damaged/" + std::to_string(copies++) + path.extension().string(),
                  damaged(content, random));
    }
  }
  int kept = 0;
  for (const auto& [path, content] : good) {
    media.write("m/good/" + std::to_string(kept++) + path.extension().string(), content);
  }
  const auto done = scan();
  EXPECT_EQ(done.status, 3);
  EXPECT_EQ(done.counts.added + done.counts.failed, kDamaged + kept) << seeds[1];
  EXPECT_GT(done.counts.failed, 100);

  std::set<std::string> named;
  std::istringstream lines(done.err);
  for (std::string line; std::getline(lines, line);) {
    const std::string begin = "mediidx: not indexed: " + at("damaged/");
    EXPECT_TRUE(line.starts_with(begin)) << line;
    named.insert(line.substr(begin.size(), line.find(": ", begin.size()) - begin.size()));
  }
  EXPECT_EQ(static_cast<int>(named.size()), done.counts.failed);
  EXPECT_EQ(count("scan.file", "failure IS NOT NULL"), done.counts.failed);
  long good_rows = 0;
  long rows = 0;
  for (const char* table : {"music", "photo", "video"}) {
    good_rows += count(table, "path LIKE '%/good/%'");
    rows += count(table);
  }
  EXPECT_EQ(good_rows, kept);
  EXPECT_EQ(rows, done.counts.added);
  // And each is left alone from then on.
  const auto again = scan();
  EXPECT_EQ(again.status, 0) << again.err;
  EXPECT_EQ(again.counts, Counts{.skipped = done.counts.failed});
}

}  // namespace
}  // namespace mediidx::test
