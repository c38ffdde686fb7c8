// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <array>
#include <chrono>
#include <cstring>
#include <fstream>
#include <functional>
#include <random>
#include <thread>

#include "integration/tool/scan/scan_fixture.h"

namespace mediidx::test {
namespace {

constexpr auto kSoon = std::chrono::milliseconds(20);

/// Where a service tells its manager how it is.
class NotifySocket {
 public:
  explicit NotifySocket(std::string path)
      : path_(std::move(path)), descriptor_(socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0)) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strncpy(address.sun_path, path_.c_str(), sizeof(address.sun_path) - 1);
    if (bind(descriptor_, reinterpret_cast<sockaddr*>(&address), sizeof(address)) != 0) {
      throw std::runtime_error("no socket at " + path_);
    }
  }
  ~NotifySocket() { close(descriptor_); }
  NotifySocket(const NotifySocket&) = delete;
  NotifySocket& operator=(const NotifySocket&) = delete;

  const std::string& path() const { return path_; }
  /// Waits a minute for a message with this line.
  bool hears(const std::string& line) const {
    std::array<char, 4096> text;
    pollfd polled{descriptor_, POLLIN, 0};
    while (poll(&polled, 1, 60'000) == 1) {
      const auto length = recv(descriptor_, text.data(), text.size(), 0);
      const std::string message(text.data(),
                                static_cast<std::size_t>(std::max<ssize_t>(0, length)));
      if (("\n" + message + "\n").find("\n" + line + "\n") != std::string::npos) return true;
    }
    return false;
  }

 private:
  std::string path_;
  int descriptor_;
};

class AWatch : public ScanTest {
 protected:
  /// Runs `mediidx watch`, and `meanwhile` once it watches; then ends it.
  Outcome watch(const std::function<void(pid_t)>& meanwhile, Words words = {}) {
    const NotifySocket notify(media.at("notify"));
    words.insert(words.begin(), {"watch", "--full-speed", "--settle", "200"});
    Setting setting;
    setting.environment["NOTIFY_SOCKET"] = notify.path();
    setting.meanwhile = [&](pid_t pid) {
      EXPECT_TRUE(notify.hears("READY=1"));
      meanwhile(pid);
      kill(pid, SIGTERM);
    };
    auto done = run(words, setting);
    EXPECT_EQ(done.status, 128 + SIGTERM) << done.err;
    return done;
  }
  /// Waits a minute at most.
  static bool becomes(const std::function<bool()>& condition) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::minutes(1);
    while (std::chrono::steady_clock::now() < end) {
      if (condition()) return true;
      std::this_thread::sleep_for(kSoon);
    }
    return false;
  }
  bool becomes_stored(const std::string& table, const std::vector<std::string>& names) {
    return becomes([&] { return stored(table) == names; });
  }
};

TEST_F(AWatch, ScansFirstAndSaysWhenItIsReady) {
  song("a.mp3");
  index();
  song("b.mp3");
  const auto done = watch([this](pid_t) { EXPECT_EQ(count("music"), 2); });
  EXPECT_EQ(done.out, "Watching.\n");
}

TEST_F(AWatch, FollowsFilesThatComeChangeMoveAndGo) {
  index();
  watch([this](pid_t) {
    song("a.mp3", {.title = "First"});
    EXPECT_TRUE(becomes_stored("music", {"a.mp3"}));
    song("new/folder/b.mp3");
    EXPECT_TRUE(becomes_stored("music", {"a.mp3", "new/folder/b.mp3"}));
    remove("a.mp3");
    song("a.mp3", {.title = "Second"});
    EXPECT_TRUE(becomes([this] {
      return count("music", "title = 'Second'") == 1 && count("music", "title = 'First'") == 0;
    }));
    move("a.mp3", "new/c.mp3");
    EXPECT_TRUE(becomes_stored("music", {"new/c.mp3", "new/folder/b.mp3"}));
    move("new", "old");
    EXPECT_TRUE(becomes_stored("music", {"old/c.mp3", "old/folder/b.mp3"}));
    song("old/folder/d.mp3");
    EXPECT_TRUE(becomes_stored("music", {"old/c.mp3", "old/folder/b.mp3", "old/folder/d.mp3"}));
    remove("old/folder");
    EXPECT_TRUE(becomes_stored("music", {"old/c.mp3"}));
    fs::create_hard_link(at("old/c.mp3"), at("d.mp3"));
    remove("old/c.mp3");
    EXPECT_TRUE(becomes_stored("music", {"d.mp3"}));
  });
  expect_as_fresh();
}

TEST_F(AWatch, WaitsUntilAFileIsClosed) {
  index();
  watch([this](pid_t) {
    std::ifstream in(fs::path(MEDIIDX_SAMPLE_LIBRARY) / kSong, std::ios::binary);
    const std::string content((std::istreambuf_iterator<char>(in)), {});
    const int out = open(at("slow.mp3").c_str(), O_WRONLY | O_CREAT, 0644);
    ASSERT_EQ(write(out, content.data(), content.size() / 2),
              static_cast<ssize_t>(content.size() / 2));
    std::this_thread::sleep_for(std::chrono::seconds(1));
    EXPECT_EQ(count("scan.file"), 0);
    const auto rest = content.substr(content.size() / 2);
    ASSERT_EQ(write(out, rest.data(), rest.size()), static_cast<ssize_t>(rest.size()));
    close(out);
    EXPECT_TRUE(becomes_stored("music", {"slow.mp3"}));
  });
  EXPECT_EQ(count("scan.file", "failure IS NOT NULL"), 0);
}

TEST_F(AWatch, FollowsThousandsOfChanges) {
  constexpr int kChanges = 3000;
  const auto seed = std::random_device()();
  SCOPED_TRACE("seed " + std::to_string(seed));
  for (int i = 0; i < 30; ++i) song("d" + std::to_string(i % 5) + "/" + std::to_string(i) + ".mp3");
  index();
  watch([&](pid_t) {
    std::mt19937 random(seed);
    const auto name = [&random] {
      return "d" + std::to_string(random() % 6) + "/" + std::to_string(random() % 40) + ".mp3";
    };
    for (int i = 0; i < kChanges; ++i) {
      const auto file = at(name());
      std::error_code ignored;
      switch (random() % 12) {
        case 0:
          fs::remove_all(fs::path(file).parent_path(), ignored);
          break;
        case 1:
          fs::rename(fs::path(file).parent_path(), at("d" + std::to_string(random() % 6)), ignored);
          break;
        case 2:
        case 3:
          fs::remove(file, ignored);
          break;
        case 4:
        case 5: {
          const fs::path to = at(name());
          fs::create_directories(to.parent_path());
          fs::rename(file, to, ignored);
          break;
        }
        case 6:
          utimensat(AT_FDCWD, file.c_str(), nullptr, 0);
          break;
        default:
          fs::create_directories(fs::path(file).parent_path());
          fs::copy_file(fs::path(MEDIIDX_SAMPLE_LIBRARY) / kSong, file,
                        fs::copy_options::overwrite_existing, ignored);
      }
      if (i % 100 == 0) std::this_thread::sleep_for(std::chrono::milliseconds(50));
    }
    // Nothing is left to be done once it has caught up.
    EXPECT_TRUE(becomes([this] {
      const auto look = scan({"--dry-run"});
      return look.status == 0 && look.counts == Counts{};
    }));
  });
  EXPECT_EQ(count("music"), count("scan.file"));
  expect_as_fresh();
}

TEST_F(AWatch, ScansEverythingWhenMoreHappenedThanTheKernelTells) {
  song("a.mp3");
  song("b.mp3");
  index();
  const auto done = watch([this](pid_t pid) {
    long limit = 0;
    std::ifstream("/proc/sys/fs/inotify/max_queued_events") >> limit;
    ASSERT_GT(limit, 0);
    kill(pid, SIGSTOP);
    for (long i = 0; i <= limit; ++i) {
      utimensat(AT_FDCWD, at(i % 2 ? "a.mp3" : "b.mp3").c_str(), nullptr, 0);
    }
    song("sub/c.mp3");
    kill(pid, SIGCONT);
    EXPECT_TRUE(becomes_stored("music", {"a.mp3", "b.mp3", "sub/c.mp3"}));
  });
  EXPECT_THAT(done.err, HasSubstr("more happened than the kernel could tell"));
}

TEST_F(AWatch, ScansByTheClockWhereThereAreTooManyFolders) {
  for (int i = 0; i < 5; ++i) song(std::to_string(i) + "/a.mp3");
  index();
  const auto done = watch(
      [this](pid_t) {
        song("new/b.mp3");
        EXPECT_TRUE(becomes([this] { return count("music") == 6; }));
      },
      {"--most-folders", "4", "--interval", "1"});
  EXPECT_THAT(done.err,
              HasSubstr("there are 6 folders, but no more than 4 can be watched (sysctl "
                        "fs.inotify.max_user_watches): scanning every 1 seconds instead"));
}

TEST_F(AWatch, ScansEverythingAtAnInterval) {
  song("a.mp3");
  index();
  watch(
      [this](pid_t) {
        // Nobody tells of what happens to the index itself.
        rows("DELETE FROM music");
        EXPECT_TRUE(becomes_stored("music", {"a.mp3"}));
      },
      {"--interval", "1"});
}

TEST_F(AWatch, TellsHowFarItIsWhenAsked) {
  song("sub/a.mp3");
  index();
  const auto done = watch([](pid_t pid) {
    kill(pid, SIGUSR1);
    std::this_thread::sleep_for(std::chrono::seconds(1));
  });
  EXPECT_THAT(done.err, HasSubstr("watching 3 folders, 0 not yet settled; 1 scans: added 0"));
}

TEST_F(AWatch, FollowsTheConfiguration) {
  song("a.mp3");
  fs::create_directory(media.at("n"));
  media.take_sample(kSong, "n/b.mp3");
  index();
  watch([this](pid_t) {
    EXPECT_EQ(run({"folder", "add", media.at("n")}).status, 0);
    EXPECT_EQ(count("music"), 2);
    media.take_sample(kSong, "n/c.mp3");
    EXPECT_TRUE(becomes([this] { return count("music") == 3; }));
    EXPECT_EQ(run({"folder", "set", media.at("n"), "--no-music"}).status, 0);
    EXPECT_TRUE(becomes([this] { return count("music") == 1; }));
  });
}

TEST_F(AWatch, ReadsTheConfigurationAgainOnHangup) {
  song("a.mp3");
  index();
  watch([this](pid_t pid) {
    rows("DELETE FROM music");
    kill(pid, SIGHUP);
    EXPECT_TRUE(becomes_stored("music", {"a.mp3"}));
  });
}

TEST_F(AWatch, NoticesThatARootWentAndCameBack) {
  song("a.mp3");
  index();
  watch([this](pid_t) {
    fs::rename(media.at("m"), media.at("away"));
    EXPECT_TRUE(becomes([this] { return count("music", "fs_online = false") == 1; }));
    fs::rename(media.at("away"), media.at("m"));
    EXPECT_TRUE(becomes([this] { return count("music", "fs_online = true") == 1; }));
    song("b.mp3");
    EXPECT_TRUE(becomes_stored("music", {"a.mp3", "b.mp3"}));
  });
}

TEST_F(AWatch, FollowsIgnoreFiles) {
  song("sub/a.mp3");
  index();
  watch([this](pid_t) {
    media.write("m/.mediidxignore", "a.*\n");
    EXPECT_TRUE(becomes_stored("music", {}));
    remove(".mediidxignore");
    EXPECT_TRUE(becomes_stored("music", {"sub/a.mp3"}));
  });
}

TEST_F(AWatch, LetsOthersScanBetween) {
  song("a.mp3");
  index();
  watch([this](pid_t) {
    EXPECT_TRUE(becomes([this] { return scan().status == 0; }));
    song("b.mp3");
    EXPECT_TRUE(becomes_stored("music", {"a.mp3", "b.mp3"}));
  });
}

TEST_F(AWatch, RefusesNumbersThatAreNone) {
  for (const char* option : {"--interval", "--settle", "--most-folders"}) {
    for (const char* number : {"0", "-1", "x", "1x", ""}) {
      EXPECT_EQ(run({"watch", option, number}).status, 2) << option << " " << number;
    }
  }
}

}  // namespace
}  // namespace mediidx::test
