// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The index on a primary and its standby: the primary ends during a scan, the standby is promoted,
// and the scan goes on there.
#include <signal.h>

#include <chrono>
#include <functional>
#include <memory>
#include <string>
#include <thread>

#include "index_rows.h"
#include "machine.h"
#include "pooler.h"
#include "scan_claims.h"
#include "scan_fixture.h"

namespace mediidx::test {
namespace {

void pause(int milliseconds) {
  std::this_thread::sleep_for(std::chrono::milliseconds(milliseconds));
}

/// Waits for what is to come about soon.
void wait_for(const std::function<bool()>& is_so) {
  const auto limit = std::chrono::steady_clock::now() + std::chrono::minutes(2);
  while (!is_so()) {
    ASSERT_LT(std::chrono::steady_clock::now(), limit);
    pause(5);
  }
}

long rows_in(const fs::path& server, const std::string& table) {
  return std::stol(rows_at(server, "SELECT count(*) FROM " + table)[0][0]);
}

/// An index on the test's server, which is the primary here, with some files of every kind still to
/// be read.
class AReplicatedIndex : public ScanTest {
 protected:
  AReplicatedIndex() { index(); }
  ~AReplicatedIndex() override {
    // The next test finds it as it was.
    TestServer::get().start();
  }

  void add_media() {
    for (int i = 0; i < kSongs; ++i) {
      const auto name = "album " + std::to_string(i % 7) + "/" + std::to_string(i);
      media.take_sample(kSong, "m/" + name + ".mp3");
    }
    media.take_sample(kPhoto, "m/a.jpg");
    media.take_sample(kFilm, "m/a.mp4");
    media.write("m/album 1/a.m3u", "1.mp3\n8.mp3\n");
    media.write("m/album 2/a.cue", "FILE \"2.mp3\" WAVE\nTRACK 01 AUDIO\nINDEX 01 00:00:00\n");
    media.write("m/bad.jpg", "no picture");
    // A file that was written just now would be read twice.
    pause(60);
  }

  const fs::path& primary() { return TestServer::get().socket_folder(); }
  /// A scan through these sockets. `meanwhile` begins when files have been saved, and the scan
  /// stands still for it.
  ScanOutcome scan_through(const std::string& hosts, const std::function<void(pid_t)>& meanwhile) {
    Setting setting;
    setting.environment = {{"PGHOST", hosts}, {"PGTARGETSESSIONATTRS", "read-write"}};
    setting.meanwhile = [&](pid_t scan) {
      wait_for([&] { return rows_in(primary(), "music") > 0; });
      kill(scan, SIGSTOP);
      EXPECT_LT(rows_in(primary(), "music"), kSongs);
      meanwhile(scan);
      kill(scan, SIGCONT);
    };
    return scan({}, setting);
  }

  /// Every file is indexed, or named; and the index is what an undisturbed scan leaves.
  void expect_whole(const ScanOutcome& done, const fs::path& server) {
    EXPECT_EQ(done.status, 3) << done.err;
    EXPECT_THAT(done.err, HasSubstr("waiting for it"));
    EXPECT_THAT(done.err, HasSubstr("the database is back"));
    EXPECT_THAT(done.err, HasSubstr("not indexed: " + at("bad.jpg") + ": "));
    EXPECT_EQ(rows_in(server, "music"), kSongs);
    const auto replicated = index_rows(server);
    TestServer::get().start();
    TestServer::get().fresh_database();
    EXPECT_EQ(scan().status, 3);
    EXPECT_EQ(replicated, index_rows());
  }

  static constexpr int kSongs = 2000;
};

TEST_F(AReplicatedIndex, IsFinishedOnTheStandbyWhenThePrimaryEnds) {
  const auto standby = Machine::standby_of(primary());
  add_media();
  const auto hosts = primary().string() + "," + standby->socket_folder().string();
  const auto done = scan_through(hosts, [&](pid_t scan) {
    TestServer::get().crash();
    // For a while there is only a server that takes no writes.
    kill(scan, SIGCONT);
    pause(1200);
    standby->promote();
  });
  expect_whole(done, standby->socket_folder());
}

TEST_F(AReplicatedIndex, LosesRowsAndTheScansStateTogether) {
  const auto standby = Machine::standby_of(primary());
  add_media();
  long held = 0;
  long kept = 0;
  const auto hosts = primary().string() + "," + standby->socket_folder().string();
  const auto done = scan_through(hosts, [&](pid_t scan) {
    // The standby falls behind: what is committed from now on will be lost.
    wait_for([&] { return rows_in(standby->socket_folder(), "music") > 0; });
    standby->follow_nobody();
    const auto before = rows_in(primary(), "music");
    kill(scan, SIGCONT);
    wait_for([&] { return rows_in(primary(), "music") > before; });
    kill(scan, SIGSTOP);
    held = rows_in(primary(), "music");
    TestServer::get().crash();
    standby->promote();
    kept = rows_in(standby->socket_folder(), "music");
    EXPECT_THAT(false_claims(standby->socket_folder()), IsEmpty());
    EXPECT_EQ(kept, std::stol(rows_at(standby->socket_folder(),
                                      "SELECT count(*) FROM scan.file WHERE kind = 0")[0][0]));
  });
  EXPECT_GT(kept, 0);
  EXPECT_LT(kept, held);
  expect_whole(done, standby->socket_folder());
}

TEST_F(AReplicatedIndex, IsReadFromTheStandby) {
  song("a.mp3", {.title = "Low Tide"});
  EXPECT_EQ(scan().status, 0);
  const auto standby = Machine::standby_of(primary());
  Setting setting;
  setting.environment["PGHOST"] = standby->socket_folder();
  const auto listed = run({"list", "music"}, setting);
  EXPECT_EQ(listed.status, 0) << listed.err;
  EXPECT_THAT(listed.out, HasSubstr("Low Tide"));
  EXPECT_EQ(listed.out, run({"list", "music"}).out);
  // What writes says why it cannot.
  const auto refused = scan({}, setting);
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.err, HasSubstr("during recovery"));
}

TEST_F(AReplicatedIndex, IsFinishedThroughAPoolerThatTurnsToTheStandby) {
  const auto standby = Machine::standby_of(primary());
  Pooler pooler(primary());
  add_media();
  const auto done = scan_through(pooler.socket_folder(), [&](pid_t) {
    TestServer::get().crash();
    standby->promote();
    pooler.turn_to(standby->socket_folder());
  });
  expect_whole(done, standby->socket_folder());
}

}  // namespace
}  // namespace mediidx::test
