// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Batches that cannot be saved as a whole.
#include <tavodb.h>

#include <new>

#include "mediidx/database.h"
#include "twin_test.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;

class FailingBatches : public TwinTest {
 protected:
  FailingBatches() {
    root.write("volume1/media/0.cue",
               "REM COMMENT \"Ünder 日本語\"\nTITLE Hits\nFILE \"0.mp3\" "
               "WAVE\nTRACK 1 AUDIO\nPERFORMER X\nINDEX 01 00:00:00\n");
  }

  std::vector<Info> records(const std::string& extension, std::size_t count = 5) {
    std::vector<Info> all;
    for (std::size_t i = 0; i < count; ++i) {
      all.push_back(record(shared(std::to_string(i) + extension)));
      set(all.back().album, "Hits");
      set(all.back().artist, "Artist " + std::to_string(i % 2));
    }
    return all;
  }

  /// The third record is one that the database refuses.
  void expect_that_only_the_bad_one_fails(MEDIA_TABLE_TYPE type, const std::string& extension) {
    auto all = records(extension);
    set(all[2].date, "no date");
    const auto given = add_to_both(all, type);
    EXPECT_THAT(given.results, ElementsAre(0, 0, -1, 0, 0));
    EXPECT_TRUE(fell_back(given));
    expect_same_content();
  }

  /// Adds songs and cue sheets, once for each statement that they take, with `fail` called before
  /// that statement; everything is added all the same. `undoes`: whether there is something to be
  /// undone then.
  void expect_whole_whatever_fails(
      const std::function<bool()>& fail,
      const std::function<bool(std::string_view)>& undoes = [](auto) { return true; }) {
    for (const auto& [type, extension] : {std::pair(MEDIA_TABLE_MUSIC, std::string(".mp3")),
                                          std::pair(MEDIA_TABLE_PLAYLIST, std::string(".cue"))}) {
      auto some = records(extension, extension == ".cue" ? 1 : 3);
      bool failed = true;
      int nth = 1;
      for (; failed && !HasFailure(); ++nth) {
        SCOPED_TRACE(extension + ", statement " + std::to_string(nth));
        failed = false;
        bool undone = false;
        int left = nth;
        platform_calls().before_statement = [&](std::string_view sql) {
          if (--left != 0) return true;
          failed = true;
          undone = undoes(sql);
          return fail();
        };
        const auto given = add_to_both(some, static_cast<MEDIA_TABLE_TYPE>(type));
        platform_calls().before_statement = nullptr;
        EXPECT_THAT(given.results, testing::Each(0));
        EXPECT_EQ(fell_back(given), undone);
        expect_same_content();
      }
      EXPECT_GT(nth, 10) << "statements of a batch";
    }
  }
};

TEST_F(FailingBatches, OfSongsLeaveOutTheBadOnly) {
  expect_that_only_the_bad_one_fails(MEDIA_TABLE_MUSIC, ".mp3");
}

TEST_F(FailingBatches, OfVideosLeaveOutTheBadOnly) {
  expect_that_only_the_bad_one_fails(MEDIA_TABLE_VIDEO, ".mp4");
}

TEST_F(FailingBatches, OfPhotosLeaveOutTheBadOnly) {
  expect_that_only_the_bad_one_fails(MEDIA_TABLE_PHOTO, ".jpg");
}

TEST_F(FailingBatches, OfPlaylistsLeaveOutTheBadOnly) {
  expect_that_only_the_bad_one_fails(MEDIA_TABLE_PLAYLIST, ".m3u");
}

TEST_F(FailingBatches, OfFoldersLeaveOutTheBadOnly) {
  std::vector<DIR_INFO_REC> folders;
  for (const char* name : {"a", "b", "c"}) {
    folders.push_back(folder_record(root.make_folder(std::string("volume1/media/") + name)));
  }
  set(folders[1].mdate, "no date");
  const auto given = add_to_both(folders);
  EXPECT_THAT(given.results, ElementsAre(0, -1, 0));
  EXPECT_TRUE(fell_back(given));
  expect_same_content();
}

TEST_F(FailingBatches, FailForARecordThatALaterOneReplaces) {
  for (const auto type :
       {MEDIA_TABLE_MUSIC, MEDIA_TABLE_VIDEO, MEDIA_TABLE_PHOTO, MEDIA_TABLE_PLAYLIST}) {
    std::vector<Info> two{record(shared("a.m3u")), record(shared("a.m3u"))};
    set(two[0].date, "no date");
    EXPECT_THAT(add_to_both(two, static_cast<MEDIA_TABLE_TYPE>(type)).results, ElementsAre(-1, 0));
  }
  const auto path = root.make_folder("volume1/media/a");
  std::vector<DIR_INFO_REC> folders{folder_record(path), folder_record(path)};
  set(folders[0].date, "no date");
  EXPECT_THAT(add_to_both(folders).results, ElementsAre(-1, 0));
  expect_same_content();
}

TEST_F(FailingBatches, SayWhyInTheLog) {
  auto all = records(".mp4", 2);
  set(all[0].date, "no date");
  use(Side::kTogether);
  EXPECT_EQ(TAVOMediaIndexAddMany(all.data(), 2, MEDIA_TABLE_VIDEO, nullptr), -1);
  EXPECT_TRUE(was_logged("Failed to exec [COPY video(path, "));
  EXPECT_TRUE(was_logged("invalid input syntax for type timestamp: \"no date\""));
  EXPECT_TRUE(was_logged("Nothing is saved together: a statement failed"));
}

TEST_F(FailingBatches, AreAddedOneByOneWhicheverStatementFails) {
  expect_whole_whatever_fails([] { return false; });
}

TEST_F(FailingBatches, AreUndoneWithinTheCallersTransaction) {
  auto earlier = record(shared("earlier.mp4"));
  auto all = records(".mp4");
  int left = 1;
  for (bool failed = true; failed; ++left) {
    use(Side::kTogether);
    ASSERT_EQ(TAVODBExecute(MediaDBConnGet(), "BEGIN", nullptr), 0);
    EXPECT_EQ(TAVOMediaIndexAdd(&earlier, MEDIA_TABLE_VIDEO), 0);
    failed = false;
    int until_failure = left;
    platform_calls().before_statement = [&](std::string_view) {
      failed = failed || --until_failure == 0;
      return until_failure != 0;
    };
    std::vector<int> results(all.size(), 77);
    EXPECT_EQ(TAVOMediaIndexAddMany(all.data(), static_cast<unsigned>(all.size()),
                                    MEDIA_TABLE_VIDEO, results.data()),
              0);
    platform_calls().before_statement = nullptr;
    EXPECT_THAT(results, testing::Each(0));
    EXPECT_EQ(was_logged("Nothing is saved together"), failed);
    ASSERT_EQ(TAVODBExecute(MediaDBConnGet(), "COMMIT", nullptr), 0);
    EXPECT_EQ(count("video"), 1 + static_cast<long>(all.size()));
    empty_both();
    clear_log();
  }
  EXPECT_GT(left, 4) << "statements of a batch";
}

TEST_F(FailingBatches, AreAddedOneByOneWhereverTheConnectionIsLost) {
  const auto cut = [&] {
    cut_connections();
    return true;
  };
  // Before its transaction begins, a batch goes on over a new connection.
  expect_whole_whatever_fails(cut, [](std::string_view sql) { return sql != "BEGIN"; });
}

TEST_F(FailingBatches, AreAddedOneByOneWhereverMemoryRunsOut) {
  expect_whole_whatever_fails([]() -> bool { throw std::bad_alloc(); });
}

TEST_F(FailingBatches, FailAsAWholeWithoutADatabase) {
  auto all = records(".mp3", 2);
  use(Side::kTogether);
  TAVOMediaIndexDBClose();
  TestServer::get().stop();
  std::vector<int> results(2, 77);
  EXPECT_EQ(TAVOMediaIndexAddMany(all.data(), 2, MEDIA_TABLE_MUSIC, results.data()), -1);
  TestServer::get().start();
  EXPECT_THAT(results, ElementsAre(-1, -1));
}

TEST_F(FailingBatches, LeaveTracksOfOneNumberToTheSingleAdds) {
  root.write("volume1/media/1.cue", root.read("volume1/media/0.cue"));
  auto sheets = records(".cue", 2);
  const auto given = add_to_both(sheets, MEDIA_TABLE_PLAYLIST);
  EXPECT_THAT(given.results, ElementsAre(0, 0));
  EXPECT_TRUE(fell_back(given));
  EXPECT_TRUE(was_logged("Nothing is saved together: tracks of one number in " + shared("0.mp3")));
  expect_same_content();
}

}  // namespace
}  // namespace mediidx::test
