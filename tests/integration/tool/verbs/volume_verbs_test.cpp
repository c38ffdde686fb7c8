// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "verb_test.h"

namespace mediidx::test {
namespace {

using testing::ElementsAre;

class Volumes : public VerbTest {
 protected:
  /// Paths of music rows in a state; every other kind has to agree.
  std::vector<std::string> paths(const std::string& where = "true") {
    std::vector<std::string> out;
    for (const auto& row : rows("SELECT path FROM music WHERE " + where + " ORDER BY path")) {
      out.push_back(row[0]);
    }
    for (const char* table : {"video", "photo", "playlist", "directory"}) {
      EXPECT_EQ(count(table, where), static_cast<long>(out.size())) << table;
    }
    return out;
  }
  std::vector<std::string> offline() { return paths("fs_online = false"); }
};

TEST_F(Volumes, GoOfflineWithoutThoseWhoseNamesBeginLikewise) {
  for (const char* path : {"/volume1/a", "/volume1/b/c", "/volume10/a", "/volume2/a"}) insert(path);
  EXPECT_EQ(output({"volume", "offline", "/volume1"}),
            "music\t2\nvideos\t2\nphotos\t2\nplaylists\t2\nfolders\t2\n");
  EXPECT_THAT(offline(), ElementsAre("/volume1/a", "/volume1/b/c"));
}

TEST_F(Volumes, ComeBackWithEveryRow) {
  for (const char* path : {"/volume1/a", "/volume1/b"}) insert(path);
  const auto before = rows("SELECT * FROM music ORDER BY id");
  output({"volume", "offline", "/volume1/"});
  EXPECT_EQ(offline().size(), 2U);
  const auto told = json({"volume", "online", "/volume1/"});
  EXPECT_EQ(told["path"], "/volume1");
  EXPECT_EQ(told["music"], 2);
  EXPECT_THAT(offline(), IsEmpty());
  EXPECT_EQ(rows("SELECT * FROM music ORDER BY id"), before);
}

TEST_F(Volumes, GoOfflineWithTheFolderItself) {
  for (const char* path : {"/volume1/share", "/volume1/share/a", "/volume1/shared"}) insert(path);
  output({"volume", "offline", "/volume1/other/../share"});
  EXPECT_THAT(offline(), ElementsAre("/volume1/share", "/volume1/share/a"));
}

TEST_F(Volumes, WithHostileNamesAreOnlyThemselves) {
  for (const char* path : {"/it's %_\\/a", "/it's XX\\/a", "/x' OR '1'='1/a"}) insert(path);
  output({"volume", "offline", "/it's %_\\"});
  EXPECT_THAT(offline(), ElementsAre("/it's %_\\/a"));
  output({"volume", "offline", "/x' OR '1'='1"});
  EXPECT_THAT(offline(), ElementsAre("/it's %_\\/a", "/x' OR '1'='1/a"));
}

TEST_F(Volumes, WithoutARowAreNoSilentNothing) {
  const auto done = run({"volume", "offline", "/volume7"});
  EXPECT_EQ(done.status, 0);
  EXPECT_EQ(done.err, "mediidx: the index holds nothing below /volume7\n");
}

TEST_F(Volumes, NeedAPath) {
  EXPECT_EQ(run({"volume", "offline"}).status, 2);
  EXPECT_EQ(run({"volume"}).status, 2);
  insert("/volume1/a");
  EXPECT_EQ(run({"volume", "offline", ""}).status, 1);
  EXPECT_THAT(offline(), IsEmpty());
}

class Purge : public Volumes {};

TEST_F(Purge, TakesAShareAndLeavesOneWhoseNameBeginsLikewise) {
  for (const char* path : {"/volume1/share/a", "/volume1/shared/a", "/volume2/share/b"}) {
    insert(path, false);
  }
  insert("/volume1/share/online");
  EXPECT_EQ(output({"volume", "purge", "share"}),
            "music\t2\nvideos\t2\nphotos\t2\nplaylists\t2\nfolders\t2\n");
  EXPECT_THAT(paths(), ElementsAre("/volume1/share/online", "/volume1/shared/a"));
}

TEST_F(Purge, WithoutAShareTakesEverythingThatIsOffline) {
  insert("/volume1/share/a", false);
  insert("/elsewhere/a", false);
  insert("/volume1/share/b");
  EXPECT_EQ(json({"volume", "purge"})["music"], 2);
  EXPECT_THAT(paths(), ElementsAre("/volume1/share/b"));
}

TEST_F(Purge, OnlyCountsOnDemand) {
  insert("/volume1/share/a", false);
  insert("/volume1/other/a", false);
  const auto all = json({"volume", "purge", "--dry-run"});
  EXPECT_EQ(all["dry_run"], true);
  EXPECT_EQ(all["folders"], 2);
  const auto one = json({"volume", "purge", "share", "--dry-run"});
  EXPECT_EQ(one["share"], "share");
  EXPECT_EQ(one["music"], 1);
  EXPECT_EQ(paths().size(), 2U);
}

TEST_F(Purge, OfAShareThatNoPathCanBeInIsAnError) {
  insert("/home/x/Music/a", false);
  insert("/volume1/share/a", false);
  for (const bool dry : {false, true}) {
    Words words{"volume", "purge", "Music"};
    if (dry) words.emplace_back("--dry-run");
    const auto done = run(words);
    EXPECT_EQ(done.status, 1);
    EXPECT_EQ(done.out, "");
    EXPECT_EQ(done.err,
              "mediidx: no path of the index looks like /volumeN/Music/..., so a purge of Music "
              "cannot find anything\n");
  }
  EXPECT_EQ(paths().size(), 2U);
}

TEST_F(Purge, RefusesWhatIsNoNameOfAShare) {
  insert("/volume1/share/a", false);
  for (const char* name : {"", ".", "..", "/", "volume1/share", "/volume1/share", "\xE9"}) {
    const auto done = run({"volume", "purge", name});
    EXPECT_EQ(done.status, 2) << name;
    EXPECT_THAT(done.err, HasSubstr("is no name of a share"));
  }
  EXPECT_EQ(paths().size(), 1U);
}

TEST_F(Purge, TakesSpecialCharactersOfANameAsThemselves) {
  for (const char* path :
       {"/volume1/it's %/a", "/volume1/it's all/a", "/volume1/a_b/a", "/volume1/aXb/a"}) {
    insert(path, false);
  }
  EXPECT_EQ(run({"volume", "purge", "%"}).status, 1);
  output({"volume", "purge", "it's %"});
  output({"volume", "purge", "a_b"});
  EXPECT_THAT(paths(), ElementsAre("/volume1/aXb/a", "/volume1/it's all/a"));
}

TEST_F(Purge, OfAShareWithoutOfflineRowsIsNoError) {
  insert("/volume1/share/a");
  EXPECT_EQ(json({"volume", "purge", "share"})["music"], 0);
  EXPECT_EQ(paths().size(), 1U);
}

TEST_F(Purge, OfAKnownShareOnAVolumeIsNoErrorWithoutAnyRow) {
  output({"stats"});  // makes the data folder
  data.write("d/root/usr/tavo/etc/share.conf",
             R"({"gone": {"path": "/volume3/gone", "status": 0},
                 "Music": {"path": "/home/x/Music", "status": 0}})");
  EXPECT_EQ(json({"volume", "purge", "gone"})["music"], 0);
  const auto done = run({"volume", "purge", "Music"});
  EXPECT_EQ(done.status, 1);
  EXPECT_THAT(done.err, HasSubstr("(it lies at /home/x/Music)"));
}

}  // namespace
}  // namespace mediidx::test
