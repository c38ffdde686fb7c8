// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The size of a batch does not show in what is sent for it.
#include "twin_test.h"

namespace mediidx::test {
namespace {

constexpr unsigned kFew = 10;
constexpr unsigned kMany = 1000;

class RoundTrips : public TwinTest {
 protected:
  RoundTrips() {
    use(Side::kTogether);
    content(Side::kTogether);  // connects
  }

  /// Everything sent while `count` records are added, connecting included.
  template <class Add>
  std::size_t sent(unsigned count, Add add) {
    platform_calls() = {};
    clear_sent_statements();
    clear_log();
    std::vector<int> results(count, 77);
    EXPECT_EQ(add(count, results.data()), 0);
    EXPECT_EQ(results, std::vector<int>(count, 0));
    EXPECT_THAT(logged(), testing::IsEmpty());
    const auto& calls = platform_calls();
    EXPECT_GT(calls.statements, 0);
    return static_cast<std::size_t>(calls.statements + calls.connects) + sent_statements().size();
  }

  template <class Add>
  void expect_same_number(Add add) {
    const auto few = sent(kFew, add);
    EXPECT_EQ(sent(kMany, add), few);
    EXPECT_EQ(sent(kFew, add), few) << "of records that replace others";
  }

  /// Records of paths with numbers.
  std::vector<Info> records(unsigned count, const std::string& extension) {
    std::vector<Info> all;
    for (unsigned i = 0; i < count; ++i) {
      all.push_back(record(shared(std::to_string(i) + extension)));
      set(all.back().album, i % 3 == 0 ? "" : "Album " + std::to_string(i % 7));
      set(all.back().artist, "Artist " + std::to_string(i % 5));
    }
    return all;
  }

  auto adds(MEDIA_TABLE_TYPE type, const std::string& extension) {
    return [this, type, extension](unsigned count, int* results) {
      auto all = records(count, extension);
      return TAVOMediaIndexAddMany(all.data(), count, type, results);
    };
  }
};

TEST_F(RoundTrips, OfVideosAreAsManyForAThousandAsForTen) {
  expect_same_number(adds(MEDIA_TABLE_VIDEO, ".mp4"));
  EXPECT_EQ(count("video"), kMany);
}

TEST_F(RoundTrips, OfPhotosAreAsManyForAThousandAsForTen) {
  expect_same_number(adds(MEDIA_TABLE_PHOTO, ".jpg"));
  EXPECT_EQ(count("photo"), kMany);
}

TEST_F(RoundTrips, OfPlaylistsAreAsManyForAThousandAsForTen) {
  expect_same_number(adds(MEDIA_TABLE_PLAYLIST, ".m3u"));
  EXPECT_EQ(count("playlist"), kMany);
}

TEST_F(RoundTrips, OfSongsAreAsManyForAThousandAsForTen) {
  expect_same_number([&](unsigned count, int* results) {
    Json::Value array(Json::arrayValue);
    for (const auto& info : records(count, ".mp3")) {
      Json::Value song(Json::objectValue);
      song["szPath"] = info.path;
      song["album"] = info.album;
      song["artist"] = info.artist;
      song["rg_track_gain"] = -6.5;
      array.append(song);
    }
    return TAVOMediaIndexAddMany_Json(array, MEDIA_TABLE_MUSIC, results);
  });
  EXPECT_EQ(count("music"), kMany);
  EXPECT_EQ(count("replaygain_track"), kMany);
}

TEST_F(RoundTrips, OfCueSheetsAreAsManyForAThousandAsForTen) {
  for (unsigned i = 0; i < kMany; ++i) {
    const auto name = std::to_string(i);
    root.write("volume1/media/" + name + ".cue",
               "REM COMMENT \"Ünder 日本語\"\nFILE \"" + name +
                   ".mp3\" WAVE\nTRACK 1 AUDIO\nINDEX 01 00:01:00\n");
  }
  sent(kMany, adds(MEDIA_TABLE_MUSIC, ".mp3"));
  expect_same_number(adds(MEDIA_TABLE_PLAYLIST, ".cue"));
  EXPECT_EQ(count("virtual_music"), kMany);
  EXPECT_EQ(count("track", "has_virtual = 'TRUE'"), kMany);
}

TEST_F(RoundTrips, OfFoldersAreAsManyForAThousandAsForTen) {
  for (unsigned i = 0; i < kMany; ++i) root.make_folder("volume1/media/" + std::to_string(i));
  const auto add = [&](unsigned count, int* results) {
    std::vector<DIR_INFO_REC> folders;
    for (unsigned i = 0; i < count; ++i) {
      folders.push_back(folder_record(shared(std::to_string(i))));
    }
    return TAVOMediaIndexDirAddMany(folders.data(), count, results);
  };
  const auto few = sent(kFew, add);
  EXPECT_EQ(sent(kMany, add), few);
  EXPECT_EQ(count("directory"), kMany);
}

}  // namespace
}  // namespace mediidx::test
