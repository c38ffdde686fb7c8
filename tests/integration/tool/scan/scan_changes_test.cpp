// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// What a scan takes as unchanged, changed, moved and gone.
#include <fcntl.h>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <fstream>

#include "scan_fixture.h"

namespace mediidx::test {
namespace {

class AScan : public ScanTest {
 protected:
  void set_time(const std::string& name, long seconds, long nanoseconds) const {
    const timespec times[2] = {{seconds, nanoseconds}, {seconds, nanoseconds}};
    ASSERT_EQ(utimensat(AT_FDCWD, at(name).c_str(), times, 0), 0);
  }
  std::string title_of(const std::string& name) {
    return value("SELECT title FROM music WHERE path = " + quoted(at(name)));
  }
  /// Transactions of the server so far: outside of them, one a statement.
  long transactions() {
    return std::stol(
        value("SELECT pg_stat_clear_snapshot()::text || xact_commit + xact_rollback "
              "FROM pg_stat_database WHERE datname = 'mediaserver'"));
  }
};

TEST_F(AScan, LeavesUnchangedFilesAlone) {
  song("a.mp3");
  song("sub/b.mp3");
  media.take_sample(kPhoto, "m/c.jpg");
  media.take_sample(kFilm, "m/d.mp4");
  media.write("m/e.m3u", "a.mp3\n");
  index();
  const auto before = rows("SELECT path, id FROM track ORDER BY path");
  expect_scan(0, {});
  EXPECT_EQ(rows("SELECT path, id FROM track ORDER BY path"), before);
}

TEST_F(AScan, NeitherOpensUnchangedFilesNorSpendsStatementsOnThem) {
  const auto statements_of_a_scan = [this] {
    const auto before = transactions();
    EXPECT_EQ(scan().counts, Counts{});
    return transactions() - before;
  };
  for (int i = 0; i < 3; ++i) song("few" + std::to_string(i) + ".mp3");
  index();
  const auto with_three = statements_of_a_scan();
  for (int i = 0; i < 60; ++i) song("many" + std::to_string(i) + ".mp3");
  scan();
  const int watch = inotify_init1(IN_NONBLOCK | IN_CLOEXEC);
  ASSERT_GE(inotify_add_watch(watch, at("").c_str(), IN_OPEN), 0);
  EXPECT_EQ(statements_of_a_scan(), with_three);
  alignas(inotify_event) std::array<char, 65536> events;
  const auto length = read(watch, events.data(), events.size());
  close(watch);
  for (ssize_t at = 0; at < length;) {
    const auto* event = reinterpret_cast<const inotify_event*>(&events[static_cast<size_t>(at)]);
    EXPECT_EQ(event->len, 0U) << event->name;  // the folder itself has to be opened
    at += static_cast<ssize_t>(sizeof(inotify_event) + event->len);
  }
}

TEST_F(AScan, TakesAnyOtherTimeAsAChangeAnOlderOneToo) {
  song("a.mp3");
  index();
  set_time("a.mp3", 1'000'000'000, 5);
  expect_scan(0, {.changed = 1});
  set_time("a.mp3", 1'000'000'000, 4);
  expect_scan(0, {.changed = 1});
  expect_scan(0, {});
}

TEST_F(AScan, TakesAnotherSizeAsAChange) {
  song("a.mp3", {.title = "Old"});
  index();
  struct stat status{};
  ASSERT_EQ(stat(at("a.mp3").c_str(), &status), 0);
  remove("a.mp3");
  song("a.mp3", {.title = "A much longer title than before" + std::string(3000, '!')});
  set_time("a.mp3", status.st_mtim.tv_sec, status.st_mtim.tv_nsec);
  expect_scan(0, {.changed = 1});
  EXPECT_EQ(title_of("a.mp3").substr(0, 6), "A much");
}

TEST_F(AScan, ReadsEverythingAgainWhenAskedTo) {
  song("a.mp3");
  song("b.mp3");
  index();
  expect_scan(0, {.changed = 2}, {"--full"});
}

TEST_F(AScan, ReadsAFileAgainWhoseRowIsGone) {
  song("a.mp3");
  media.take_sample(kPhoto, "m/b.jpg");
  media.take_sample(kFilm, "m/c.mp4");
  media.write("m/d.m3u", "a.mp3\n");
  index();
  const auto before = everything();
  for (const char* table : {"music", "track", "photo", "video", "playlist"}) {
    rows("DELETE FROM " + std::string(table));
    EXPECT_EQ(scan().counts.changed, 1) << table;
    EXPECT_EQ(everything(), before) << table;
  }
  rows("DELETE FROM directory");
  scan();
  EXPECT_EQ(everything(), before);
}

TEST_F(AScan, TakesOverWhatOthersHaveIndexed) {
  song("a.mp3");
  media.take_sample(kPhoto, "m/sub/b.jpg");
  index();
  song("gone/deep/c.mp3");
  expect_scan(0, {.added = 1});
  remove("gone");
  rows("DELETE FROM scan.folder");
  expect_scan(0, {.changed = 2, .removed = 1});
  EXPECT_THAT(stored("music"), ElementsAre("a.mp3"));
  EXPECT_THAT(stored("directory"), ElementsAre(media.at("m"), "sub"));
  expect_scan(0, {});
}

TEST_F(AScan, ForgetsWhatIsNoLongerCovered) {
  song("a.mp3");
  media.take_sample(kPhoto, "m/b.jpg");
  index();
  const auto file = data.at("d/root/usr/tavo/etc/index_folder.conf");
  std::ifstream in(file);
  std::string text((std::istreambuf_iterator<char>(in)), {});
  const auto at_music = text.find("\"music\"");
  text.replace(text.find("true", at_music), 4, "false");
  std::ofstream(file) << text;
  expect_scan(0, {.removed = 1, .skipped = 1});
  EXPECT_THAT(stored("music"), IsEmpty());
  EXPECT_THAT(stored("track"), IsEmpty());
  EXPECT_THAT(stored("photo"), ElementsAre("b.jpg"));
}

TEST_F(AScan, RemovesAFileThatIsGone) {
  song("a.mp3");
  song("b.mp3");
  index();
  remove("b.mp3");
  expect_scan(0, {.removed = 1});
  EXPECT_THAT(stored("music"), ElementsAre("a.mp3"));
  expect_scan(0, {});
}

TEST_F(AScan, RemovesAFolderThatIsGoneWithAllBelow) {
  song("a.mp3");
  song("sub/deep/b.mp3");
  media.take_sample(kPhoto, "m/sub/c.jpg");
  index();
  remove("sub");
  expect_scan(0, {.removed = 2});
  EXPECT_THAT(stored("track"), ElementsAre("a.mp3"));
  EXPECT_THAT(stored("photo"), IsEmpty());
  EXPECT_THAT(stored("directory"), ElementsAre(media.at("m")));
  expect_scan(0, {});
}

TEST_F(AScan, RemovesAFolderThatIsNamedAndGone) {
  song("a.mp3");
  song("sub/b.mp3");
  index();
  remove("sub");
  expect_scan(0, {.removed = 1}, {media.at("m/sub")});
  EXPECT_THAT(stored("track"), ElementsAre("a.mp3"));
}

TEST_F(AScan, LooksOnlyWhereItIsToldTo) {
  song("one/a.mp3");
  song("two/b.mp3");
  index();
  song("one/new.mp3");
  song("two/new.mp3");
  expect_scan(0, {.added = 1}, {media.at("m/two")});
  EXPECT_THAT(stored("music"), ElementsAre("one/a.mp3", "two/b.mp3", "two/new.mp3"));
}

TEST_F(AScan, OfAFolderThatIsNotChosenIsRefused) {
  index();
  fs::create_directory(media.at("other"));
  const auto done = scan({media.at("other")});
  EXPECT_EQ(done.status, 1);
  EXPECT_THAT(done.err, HasSubstr(media.at("other") + " is not chosen for indexing"));
}

TEST_F(AScan, TakesARenamedFileAsMoved) {
  song("a.mp3", {.title = "The same"});
  index();
  move("a.mp3", "sub/b.mp3");
  expect_scan(0, {.moved = 1});
  EXPECT_THAT(stored("music"), ElementsAre("sub/b.mp3"));
  EXPECT_THAT(stored("track"), ElementsAre("sub/b.mp3"));
  expect_scan(0, {});
  expect_as_fresh();
}

TEST_F(AScan, TakesTheFilesOfARenamedFolderAsMoved) {
  song("sub/a.mp3");
  song("sub/b.mp3");
  media.take_sample(kPhoto, "m/sub/c.jpg");
  index();
  move("sub", "other");
  expect_scan(0, {.moved = 3});
  EXPECT_THAT(stored("music"), ElementsAre("other/a.mp3", "other/b.mp3"));
  expect_as_fresh();
}

TEST_F(AScan, TakesTwoSwappedNamesAsTwoChanges) {
  song("a.mp3", {.title = "First"});
  song("b.mp3", {.title = "Second song"});
  index();
  move("a.mp3", "c");
  move("b.mp3", "a.mp3");
  move("c", "b.mp3");
  expect_scan(0, {.changed = 2});
  EXPECT_EQ(title_of("a.mp3"), "Second song");
  EXPECT_EQ(title_of("b.mp3"), "First");
}

TEST_F(AScan, LetsRatingsFollowAMovedFile) {
  song("a.mp3");
  index();
  media.write("m/@eaDir/a.mp3/TAVOAUDIO_SONG_RATING", "0=4\n");
  const auto user = std::to_string(0);
  ASSERT_EQ(scan({"--full"}).status, 0);
  move("a.mp3", "sub/b.mp3");
  expect_scan(0, {.moved = 1});
  EXPECT_TRUE(fs::exists(at("sub/@eaDir/b.mp3/TAVOAUDIO_SONG_RATING")));
  EXPECT_FALSE(fs::exists(at("@eaDir/a.mp3")));
  expect_scan(0, {});
  expect_as_fresh();
}

TEST_F(AScan, CountsInADryRunAndWritesNothing) {
  song("a.mp3");
  song("b.mp3");
  song("c.mp3");
  index();
  const auto before = everything();
  const auto known = rows("SELECT name, size, modified FROM scan.file ORDER BY name");
  song("new.mp3");
  set_time("a.mp3", 1'000'000'000, 0);
  remove("b.mp3");
  move("c.mp3", "d.mp3");
  const Counts counts{.added = 1, .changed = 1, .moved = 1, .removed = 1};
  expect_scan(0, counts, {"--dry-run"});
  EXPECT_EQ(everything(), before);
  EXPECT_EQ(rows("SELECT name, size, modified FROM scan.file ORDER BY name"), known);
  expect_scan(0, counts);
}

TEST_F(AScan, TakesAReplacedFolderAndFileForWhatTheyAreNow) {
  song("thing.mp3");
  song("other/a.mp3");
  index();
  remove("thing.mp3");
  remove("other");
  song("thing.mp3/inside.mp3");
  song("other");
  move("other", "other.mp3");
  EXPECT_EQ(scan().status, 0);
  EXPECT_THAT(stored("music"), ElementsAre("other.mp3", "thing.mp3/inside.mp3"));
  expect_as_fresh();
}

}  // namespace
}  // namespace mediidx::test
