// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// How a scan goes on, ends and tells of it: bad files, signals, a second scan, a lost database.
#include <json/reader.h>
#include <sched.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <fstream>
#include <sstream>
#include <thread>

#include "scan_fixture.h"

namespace mediidx::test {
namespace {

class ARunningScan : public ScanTest {
 protected:
  void fill(int songs) const {
    for (int i = 0; i < songs; ++i) {
      fs::copy_file(fs::path(MEDIIDX_SAMPLE_LIBRARY) / kSong, at(std::to_string(i) + ".mp3"));
    }
  }
  /// The folder is chosen, and holds nothing yet.
  void choose() { index(); }
  /// The readers of tags of a running scan.
  static std::vector<pid_t> workers_of(pid_t scan) {
    const auto task = "/proc/" + std::to_string(scan) + "/task/" + std::to_string(scan);
    std::ifstream in(task + "/children");
    std::vector<pid_t> out;
    for (pid_t pid = 0; in >> pid;) out.push_back(pid);
    return out;
  }
  /// By how many transactions, or parts of them, the rows were written.
  long transactions_of(const std::string& table) {
    return std::stol(value("SELECT count(DISTINCT xmin::text) FROM " + table));
  }
  /// Waits until the running scan has saved something.
  void wait_for_rows() {
    for (int i = 0; i < 6000 && count("track") == 0; ++i) {
      std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    ASSERT_GT(count("track"), 0);
  }
};

TEST_F(ARunningScan, NamesABadFileOnceAndLeavesItAloneUntilItChanges) {
  choose();
  song("good.mp3");
  media.write("m/bad.jpg", "no picture at all");
  auto done = scan();
  EXPECT_EQ(done.status, 3);
  EXPECT_EQ(done.counts, (Counts{.added = 1, .failed = 1}));
  EXPECT_THAT(done.err, HasSubstr("not indexed: " + at("bad.jpg") + ": "));
  done = scan();
  EXPECT_EQ(done.status, 0);
  EXPECT_EQ(done.counts, Counts{.skipped = 1});
  EXPECT_EQ(done.err, "");
  EXPECT_EQ(value("SELECT failure IS NULL FROM scan.file WHERE name = 'bad.jpg'"), "f");
  media.write("m/bad.jpg", "still no picture at all");
  EXPECT_EQ(scan().counts, Counts{.failed = 1});
}

TEST_F(ARunningScan, ForgetsAFileThatHasBecomeBad) {
  media.take_sample(kPhoto, "m/a.jpg");
  index();
  media.write("m/a.jpg", "no picture any more");
  EXPECT_EQ(scan().counts, Counts{.failed = 1});
  EXPECT_THAT(stored("photo"), IsEmpty());
  remove("a.jpg");
  expect_scan(0, {});
  EXPECT_EQ(count("scan.file"), 0);
}

TEST_F(ARunningScan, OutlivesAFileThatKillsItsReader) {
  choose();
  fill(50);
  Setting setting;
  setting.meanwhile = [this](pid_t scan) {
    // Whatever a worker reads when this comes, its death costs that file alone.
    wait_for_rows();
    for (const auto pid : workers_of(scan)) kill(pid, SIGABRT);
  };
  fill(0);
  for (int i = 100; i < 2500; ++i) {
    fs::copy_file(fs::path(MEDIIDX_SAMPLE_LIBRARY) / kSong, at(std::to_string(i) + ".mp3"));
  }
  const auto done = scan({}, setting);
  EXPECT_TRUE(done.status == 0 || done.status == 3) << done.err;
  EXPECT_EQ(done.counts.added + done.counts.failed, 2450) << done.err;
  EXPECT_EQ(count("track"), done.counts.added);
}

TEST_F(ARunningScan, LetsAFailedStatementCostItsFileOnly) {
  choose();
  fill(5);
  rows("ALTER TABLE music ADD CHECK (path NOT LIKE '%/3.mp3')");
  const auto done = scan();
  EXPECT_EQ(done.status, 3);
  EXPECT_EQ(done.counts, (Counts{.added = 4, .failed = 1}));
  EXPECT_THAT(done.err, HasSubstr(at("3.mp3") + ": ERROR:  new row for relation \"music\""));
  EXPECT_THAT(stored("music"), ElementsAre("0.mp3", "1.mp3", "2.mp3", "4.mp3"));
}

TEST_F(ARunningScan, SavesManyFilesAndFoldersTogether) {
  choose();
  fill(200);
  for (int i = 0; i < 50; ++i) fs::create_directory(at(std::to_string(i)));
  EXPECT_EQ(scan().counts, Counts{.added = 200});
  for (const char* table : {"track", "music", "directory"}) {
    EXPECT_LE(transactions_of(table), 2) << table << ", with what was there before";
  }
  EXPECT_EQ(count("track", "xmin::text IN (SELECT xmin::text FROM scan.file)"), 0)
      << "one by one they would be in the scan's own transaction";
}

TEST_F(ARunningScan, SavesTheOthersOfABadFileTogetherAllTheSame) {
  choose();
  fill(200);
  rows("ALTER TABLE music ADD CHECK (path NOT LIKE '%/77.mp3')");
  EXPECT_EQ(scan().counts, (Counts{.added = 199, .failed = 1}));
  EXPECT_LE(transactions_of("music"), 10);
}

TEST_F(ARunningScan, TellsWhereTheTimeWent) {
  choose();
  fill(3);
  auto done = scan({"--timings"});
  EXPECT_EQ(done.counts, Counts{.added = 3});
  EXPECT_THAT(done.out, AllOf(HasSubstr("PHASE"), HasSubstr("\nlibrary  ")));
  song("another.mp3");
  done = scan({"--timings", "--json"});
  Json::Value report;
  std::istringstream(done.out) >> report;
  const auto& timings = report["timings"];
  EXPECT_THAT(
      timings.getMemberNames(),
      UnorderedElementsAre("start", "look", "known", "compare", "plan", "removals", "folders",
                           "tags", "library", "note", "commit", "settle", "other"));
  double sum = 0;
  for (const auto& seconds : timings) sum += seconds.asDouble();
  EXPECT_LE(sum, report["seconds"].asDouble()) << "every moment counts once";
  EXPECT_GT(timings["library"].asDouble(), 0);
  EXPECT_THAT(run({"scan", "--json"}).out, Not(HasSubstr("timings")));
}

TEST_F(ARunningScan, TriesAFileAgainThatTheDatabaseRefused) {
  choose();
  fill(1);
  rows("ALTER TABLE music ADD CONSTRAINT none CHECK (false) NOT VALID");
  EXPECT_EQ(scan().counts, Counts{.failed = 1});
  rows("ALTER TABLE music DROP CONSTRAINT none");
  EXPECT_EQ(scan().status, 0);
  EXPECT_THAT(stored("music"), ElementsAre("0.mp3"));
}

TEST_F(ARunningScan, ListsANameThatIsNotUtf8Escaped) {
  choose();
  media.take_sample(kSong, "m/caf\xE9.mp3");
  media.take_sample(kSong, "m/good.mp3");
  const auto done = scan();
  EXPECT_EQ(done.status, 3);
  EXPECT_EQ(done.err,
            "mediidx: not indexed: " + at("caf\\xE9.mp3") + ": its name is not valid UTF-8\n");
  EXPECT_EQ(done.counts, (Counts{.added = 1, .skipped = 1}));
}

TEST_F(ARunningScan, CleansTagsThatNoDatabaseTakes) {
  choose();
  song("a.mp3", {.title = "Title", .artist = "Artist"});
  // The text of a frame, in Latin-1 as ID3 has it, with a zero byte and a control character.
  std::fstream file(at("a.mp3"), std::ios::in | std::ios::out | std::ios::binary);
  std::string text((std::istreambuf_iterator<char>(file)), {});
  const auto where = text.find("Title");
  ASSERT_NE(where, text.npos);
  file.clear();
  file.seekp(static_cast<std::streamoff>(where));
  file.write("Ti\x01\xFF\0", 5);
  file.close();
  EXPECT_EQ(scan().status, 0);
  EXPECT_EQ(count("music"), 1);
}

TEST_F(ARunningScan, PassesOverWhatIsNoMediaOfTheUsers) {
  choose();
  for (const char* name : {".hidden.mp3", "._a.mp3", "@eaDir/b.mp3", "#recycle/c.mp3",
                           "#snapshot/d.mp3", "lost+found/e.mp3", ".dir/f.mp3"}) {
    media.take_sample(kSong, std::string("m/") + name);
  }
  media.write("m/empty.mp3", "");
  media.write("m/notes.txt", "text");
  fs::create_directory_symlink(at(""), at("loop"));
  expect_scan(0, {});
  EXPECT_THAT(stored("track"), IsEmpty());
}

TEST_F(ARunningScan, IndexesARealFileOnce) {
  choose();
  song("z/a.mp3");
  fs::create_hard_link(at("z/a.mp3"), at("z/b.mp3"));
  fs::create_symlink(at("z/a.mp3"), at("link.mp3"));
  fs::create_directory_symlink(at("z"), at("y"));
  media.take_sample(kSong, "elsewhere/c.mp3");
  fs::create_directory_symlink(media.at("elsewhere"), at("first"));
  fs::create_directory_symlink(media.at("elsewhere"), at("second"));
  expect_scan(0, {.added = 2});
  EXPECT_THAT(stored("music"), ElementsAre("first/c.mp3", "z/a.mp3"));
  expect_scan(0, {});
  remove("z/a.mp3");
  expect_scan(0, {.moved = 1});
  EXPECT_THAT(stored("music"), ElementsAre("first/c.mp3", "z/b.mp3"));
}

TEST_F(ARunningScan, KeepsOutWhatAnIgnoreFileNames) {
  choose();
  media.write("m/.mediidxignore", "# mine\ndrafts/\n*.wav\n!keep.wav\n");
  for (const char* name : {"a.mp3", "drafts/b.mp3", "sub/c.mp3", "sub/drafts/d.mp3"}) song(name);
  media.take_sample("music/Паром/parom.wav", "m/e.wav");
  media.take_sample("music/Паром/parom.wav", "m/keep.wav");
  expect_scan(0, {.added = 3});
  EXPECT_THAT(stored("music"), ElementsAre("a.mp3", "keep.wav", "sub/c.mp3"));
  media.write("m/sub/.mediidxignore", "c.*\n");
  media.write("m/.mediidxignore", "*.wav\n");
  expect_scan(0, {.added = 2, .removed = 2});
  EXPECT_THAT(stored("music"), ElementsAre("a.mp3", "drafts/b.mp3", "sub/drafts/d.mp3"));
  expect_as_fresh();
}

TEST_F(ARunningScan, TakesPlaylistsAfterMediaAndSheetsAfterThose) {
  choose();
  media.write("m/a.cue", "FILE \"z/z.mp3\" WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n");
  media.write("m/b.m3u", "z/z.mp3\n");
  song("z/z.mp3");
  media.take_sample(kPhoto, "m/z/z.jpg");
  expect_scan(0, {.added = 4});
  EXPECT_EQ(count("track", "is_virtual = 'TRUE' AND duration LIKE '-%'"), 0);
  EXPECT_EQ(value("SELECT frequency IS NULL FROM track WHERE is_virtual = 'TRUE'"), "f");
}

TEST_F(ARunningScan, EndsAfterTheBatchInHandWhenItIsToldTo) {
  fill(3000);
  choose();
  rows("DELETE FROM scan.folder");
  rows("DELETE FROM track; DELETE FROM music");
  for (const int number : {SIGINT, SIGTERM}) {
    Setting setting;
    setting.meanwhile = [&](pid_t pid) {
      const auto before = count("music");
      while (count("music") == before) std::this_thread::sleep_for(std::chrono::milliseconds(5));
      kill(pid, number);
    };
    const auto done = scan({}, setting);
    EXPECT_EQ(done.status, 128 + number) << done.err;
    EXPECT_GT(done.counts.added, 0);
    EXPECT_LT(count("music"), 3000);
    EXPECT_EQ(count("music"), count("scan.file"));
  }
  const auto before = count("music");
  EXPECT_EQ(scan().counts.added, 3000 - before);
  EXPECT_EQ(count("music"), 3000);
}

TEST_F(ARunningScan, SaysThatAnotherOneRuns) {
  fill(1500);
  choose();
  Setting setting;
  pid_t first = 0;
  Outcome second{};
  setting.meanwhile = [&](pid_t pid) {
    first = pid;
    const auto file = data.at("d/root/var/run/tavoindexd.pid");
    while (!fs::exists(file) || fs::is_empty(file)) std::this_thread::yield();
    kill(pid, SIGSTOP);
    second = run({"scan"});
    kill(pid, SIGCONT);
  };
  const auto done = scan({"--full"}, setting);
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_EQ(second.status, 6);
  EXPECT_EQ(second.err,
            "mediidx: a scan is already running: process " + std::to_string(first) + "\n");
}

TEST_F(ARunningScan, IsTheOnlyOneOfItsDatabaseFromOtherDataFoldersToo) {
  fill(1500);
  choose();
  const OpenFolder elsewhere;
  Setting setting;
  pid_t first = 0;
  Outcome second{};
  setting.meanwhile = [&](pid_t pid) {
    first = pid;
    while (count("pg_locks", "locktype = 'advisory' AND objid = 6334281 AND granted") == 0)
      usleep(1000);
    kill(pid, SIGSTOP);
    second = run_mediidx({"--data-dir", elsewhere.at("d"), "index", media.at("m")});
    kill(pid, SIGCONT);
  };
  EXPECT_EQ(scan({"--full"}, setting).status, 0);
  EXPECT_EQ(second.status, 6);
  EXPECT_THAT(second.err, HasSubstr("a scan is already running: mediidx, process " +
                                    std::to_string(first) + " on "));
}

TEST_F(ARunningScan, WithoutADatabaseEndsWithFive) {
  Setting setting;
  setting.environment["PGHOST"] = media.at("nothing-here");
  EXPECT_EQ(scan({}, setting).status, 5);
}

TEST_F(ARunningScan, WaitsForADatabaseThatRestarts) {
  fill(2000);
  choose();
  rows("DELETE FROM scan.folder");
  rows("DELETE FROM track; DELETE FROM music");
  Setting setting;
  setting.meanwhile = [&](pid_t) {
    wait_for_rows();
    TestServer::get().stop();
    std::this_thread::sleep_for(std::chrono::milliseconds(700));
    TestServer::get().start();
  };
  const auto done = scan({}, setting);
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_THAT(done.err, HasSubstr("the database does not answer: waiting for it"));
  EXPECT_THAT(done.err, HasSubstr("the database is back"));
  EXPECT_EQ(done.counts.added, 2000);
  EXPECT_EQ(count("music"), 2000);
  EXPECT_EQ(count("track"), 2000);
}

TEST_F(ARunningScan, GoesOnWhenItsConnectionIsCut) {
  fill(1500);
  choose();
  rows("DELETE FROM scan.folder");
  rows("DELETE FROM track; DELETE FROM music");
  Setting setting;
  setting.meanwhile = [&](pid_t) {
    wait_for_rows();
    for (int i = 0; i < 3; ++i) {
      cut_connections();
      std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
  };
  const auto done = scan({}, setting);
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_EQ(count("music"), 1500);
}

TEST_F(ARunningScan, ReadsAgainWhatWasInATransactionThatWasCut) {
  constexpr int kSongs = 150;
  const auto make_songs = [&](const SongTags& tags) {
    for (int i = 0; i < kSongs; ++i) {
      const auto name = std::to_string(i) + ".mp3";
      remove(name);
      song(name, tags);
    }
    remove("film.mp4");
    media.take_sample(kFilm, "m/film.mp4");
  };
  make_songs({"Before", "Album", "A", ""});
  index();
  make_songs({"Afterwards", "Album", "B", ""});
  // It is held within a batch, when the songs are written and the film is next, and stands still
  // while its session is cut: the film is saved over a new connection, the songs are gone.
  const std::jthread holder([this] {
    EXPECT_ANY_THROW(rows("BEGIN; LOCK TABLE video IN SHARE MODE; SELECT pg_sleep(60)"));
  });
  const auto wait_for_one = [this](const char* table, const char* where) {
    while (count(table, where) == 0) usleep(1000);
  };
  wait_for_one("pg_locks", "relation = 'video'::regclass AND mode = 'ShareLock' AND granted");
  std::size_t cuts = 0;
  Setting setting;
  setting.meanwhile = [&](pid_t pid) {
    wait_for_one("pg_stat_activity",
                 "application_name LIKE 'mediidx, process %' AND wait_event_type = 'Lock'");
    kill(pid, SIGSTOP);
    rows("SELECT pg_cancel_backend(pid) FROM pg_stat_activity WHERE wait_event = 'PgSleep'");
    wait_for_one("pg_stat_activity",
                 "application_name LIKE 'mediidx, process %' AND state = 'idle in transaction'");
    cuts = rows(
               "SELECT pg_terminate_backend(pid, 10000) FROM pg_stat_activity "
               "WHERE application_name LIKE 'mediidx, process %'")
               .size();
    kill(pid, SIGCONT);
  };
  const auto done = scan({}, setting);
  EXPECT_EQ(done.status, 0) << done.err;
  EXPECT_EQ(cuts, 1U);
  EXPECT_EQ(count("track", "title = 'Afterwards'"), kSongs);
  EXPECT_EQ(count("music", "title = 'Afterwards'"), kSongs);
}

TEST_F(ARunningScan, ThatWasKilledIsFinishedByTheNext) {
  fill(1500);
  choose();
  rows("DELETE FROM scan.folder");
  rows("DELETE FROM track; DELETE FROM music");
  Setting setting;
  setting.meanwhile = [&](pid_t pid) {
    wait_for_rows();
    kill(pid, SIGKILL);
  };
  EXPECT_EQ(scan({}, setting).status, 128 + SIGKILL);
  EXPECT_EQ(scan().status, 0);
  EXPECT_EQ(count("music"), 1500);
  EXPECT_EQ(count("track"), 1500);
  expect_scan(0, {});
}

TEST_F(ARunningScan, RunsIdleUnlessItShallNot) {
  fill(800);
  const auto policy_of = [&](Words words) {
    int policy = -1;
    Setting setting;
    setting.meanwhile = [&](pid_t pid) {
      for (int i = 0; i < 3000 && workers_of(pid).empty(); ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
      }
      policy = sched_getscheduler(pid);
    };
    words.insert(words.begin(), "scan");
    EXPECT_EQ(run(words, setting).status, 0);
    return policy;
  };
  choose();
  EXPECT_EQ(policy_of({"--full"}), SCHED_IDLE);
  EXPECT_EQ(policy_of({"--full", "--full-speed"}), SCHED_OTHER);
}

TEST_F(ARunningScan, TellsItsProgressAsLinesOfJson) {
  choose();
  fill(30);
  const auto done = scan({"--progress", "json"});
  std::istringstream lines(done.err);
  std::string line;
  int told = 0;
  for (; std::getline(lines, line); ++told) {
    Json::Value object;
    std::istringstream in(line);
    EXPECT_TRUE(Json::parseFromStream(Json::CharReaderBuilder(), in, &object, nullptr)) << line;
    EXPECT_TRUE(object.isMember("looking") || object.isMember("done")) << line;
  }
  EXPECT_GE(told, 2);
}

TEST_F(ARunningScan, PrintsItsLastLineAsJson) {
  choose();
  fill(2);
  const auto done = run({"scan", "--full-speed", "--json"});
  Json::Value object;
  std::istringstream in(done.out);
  ASSERT_TRUE(Json::parseFromStream(Json::CharReaderBuilder(), in, &object, nullptr)) << done.out;
  EXPECT_EQ(object["added"].asInt(), 2);
  EXPECT_EQ(object["failed"].asInt(), 0);
  EXPECT_FALSE(object["stopped"].asBool());
}

TEST_F(ARunningScan, ShowsABarOnATerminalAndCleansItUp) {
  choose();
  fill(5);
  Setting setting;
  setting.on_terminal = true;
  const auto done = run({"scan", "--full-speed"}, setting);
  EXPECT_THAT(done.out, HasSubstr("]   0%  0/"));
  EXPECT_THAT(done.out, HasSubstr("?/s  ? left  "));
  EXPECT_THAT(done.out, HasSubstr("\x1B[Kadded 5, changed 0, moved 0, removed 0, offline 0"));
}

TEST_F(ARunningScan, RefusesAProgressThatItDoesNotKnow) {
  EXPECT_EQ(scan({"--progress", "xml"}).status, 2);
}

}  // namespace
}  // namespace mediidx::test
