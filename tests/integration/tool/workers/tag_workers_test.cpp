// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "workers/tag_workers.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <limits.h>
#include <seccomp.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <fstream>
#include <functional>
#include <map>
#include <set>
#include <thread>

#include "../command.h"
#include "workers/worker_process.h"

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;
using testing::HasSubstr;
using tool::Kind;
using tool::TagAnswer;
using tool::TagOrder;
using tool::TagWorkers;
using tool::WorkerLimits;
using Outcome = TagAnswer::Outcome;
using std::chrono::seconds;

constexpr auto kPatience = seconds(60);
const std::string kSampleFlac = "music/Harbour Lights/Low Tide/03 - A Long Ebb.flac";

WorkerLimits with_time(seconds time) {
  WorkerLimits limits;
  limits.time = time;
  return limits;
}

TagWorkers start(unsigned count, const WorkerLimits& limits = {}) {
  return TagWorkers(count, limits, MEDIIDX_COMMAND);
}

/// All answers that are to come, by ticket.
std::map<std::uint64_t, TagAnswer> take_all(TagWorkers& workers) {
  std::map<std::uint64_t, TagAnswer> answers;
  while (workers.outstanding() > 0) {
    const auto answer = workers.take(kPatience);
    if (!answer) break;
    answers[answer->ticket] = *answer;
  }
  return answers;
}

TagAnswer read(const std::string& path, Kind kind, const WorkerLimits& limits = {}) {
  auto workers = start(1, limits);
  workers.submit({1, path, kind});
  return take_all(workers)[1];
}

std::string sample(const std::string& name) {
  return (fs::path(MEDIIDX_SAMPLE_LIBRARY) / name).string();
}

/// Orders for one file under the tickets 0 to count - 1.
void submit_many(TagWorkers& workers, std::uint64_t count) {
  const auto file = sample(kSampleFlac);
  for (std::uint64_t i = 0; i < count; ++i) workers.submit({i, file, Kind::kMusic});
}

std::map<Outcome, int> count_outcomes(const std::map<std::uint64_t, TagAnswer>& answers) {
  std::map<Outcome, int> counts;
  for (const auto& [ticket, answer] : answers) ++counts[answer.outcome];
  return counts;
}

std::set<std::string> open_descriptors(const std::string& process) {
  std::set<std::string> found;
  for (const auto& entry : fs::directory_iterator("/proc/" + process + "/fd")) {
    std::error_code ignored;
    const auto target = fs::read_symlink(entry, ignored).string();
    found.insert(entry.path().filename().string() + " " + target.substr(0, target.find('[')));
  }
  return found;
}

/// A file of this length without content but its beginning.
std::string make_sparse(const OpenFolder& folder, const std::string& name,
                        const std::string& beginning, std::uintmax_t size) {
  auto file = folder.write(name, beginning);
  fs::resize_file(file, size);
  return file;
}

TEST(TagWorkers, ReadEverySampleAsItIsReadWithoutThem) {
  auto workers = start(2);
  std::map<std::uint64_t, TagOrder> orders;
  std::set<Kind> kinds;
  for (const auto& entry : fs::recursive_directory_iterator(MEDIIDX_SAMPLE_LIBRARY)) {
    const auto kind = tool::kind_of(entry.path());
    if (!entry.is_regular_file() || !kind) continue;
    const auto ticket = orders.size();
    orders[ticket] = {ticket, entry.path(), *kind};
    kinds.insert(*kind);
    workers.submit(orders[ticket]);
  }
  EXPECT_EQ(kinds.size(), tool::kKinds);
  const auto answers = take_all(workers);
  ASSERT_EQ(answers.size(), orders.size());
  for (const auto& [ticket, answer] : answers) {
    const auto& order = orders[ticket];
    try {
      const auto expected = tool::read_media_file(order.path, order.kind);
      ASSERT_EQ(answer.outcome, Outcome::kRead) << order.path << answer.reason;
      EXPECT_EQ(to_json(answer.file), to_json(expected)) << order.path;
      EXPECT_EQ(answer.file.kind, expected.kind);
      EXPECT_EQ(answer.before, answer.after);
    } catch (const tool::ReadError& error) {
      EXPECT_EQ(answer.outcome, Outcome::kDamaged) << order.path;
      EXPECT_EQ(answer.reason, error.what()) << order.path;
    }
  }
}

TEST(TagWorkers, TellTheVolumeOfAFile) {
  const auto answer = read(sample(kSampleFlac), Kind::kMusic);
  EXPECT_NE(answer.file.fs_uuid, "");
  EXPECT_EQ(answer.file.fs_uuid, tool::read_media_file(sample(kSampleFlac), Kind::kMusic).fs_uuid);
}

TEST(TagWorkers, TellSizeAndTimeOfAFile) {
  const OpenFolder folder;
  const auto file = folder.take_sample(kSampleFlac, "a.flac");
  const timespec times[] = {{1, 1}, {1'234'567'890, 123'456'789}};
  ASSERT_EQ(utimensat(AT_FDCWD, file.c_str(), times, 0), 0);
  const auto answer = read(file, Kind::kMusic);
  const auto size = static_cast<std::int64_t>(fs::file_size(file));
  EXPECT_EQ(answer.before, (tool::FileStamp{size, 1'234'567'890, 123'456'789}));
  EXPECT_EQ(answer.after, answer.before);
}

TEST(TagWorkers, TellThatAFileWasStillChanging) {
  const OpenFolder folder;
  // The search for a first frame takes a while.
  const auto file = make_sparse(folder, "a.mp3", "", 4UL << 30U);
  auto workers = start(1);
  workers.submit({1, file, Kind::kMusic});
  const auto worker = std::to_string(workers.pids()[0]);
  const auto is_open = [&] {
    return std::ranges::any_of(open_descriptors(worker),
                               [&](const auto& entry) { return entry.ends_with(file); });
  };
  while (!is_open()) ASSERT_FALSE(workers.take(std::chrono::milliseconds(1)));
  fs::resize_file(file, 1);
  const auto answer = take_all(workers)[1];
  EXPECT_EQ(answer.outcome, Outcome::kDamaged);
  EXPECT_EQ(answer.before.size, 4LL << 30);
  EXPECT_EQ(answer.after.size, 1);
}

TEST(TagWorkers, ReadAnyPath) {
  const OpenFolder folder;
  std::string deep = folder.path().string();
  while (deep.size() + 200 < PATH_MAX - 1) deep += "/" + std::string(190, 'd');
  // Beyond what one call takes, folders are made one by one.
  deep += "/" + std::string(PATH_MAX - 1 - deep.size() - 1 - 5, 'f') + ".flac";
  ASSERT_EQ(deep.size(), PATH_MAX - 1U);
  fs::create_directories(fs::path(deep).parent_path());
  fs::copy_file(sample(kSampleFlac), deep);
  const auto odd = folder.take_sample(kSampleFlac, "a\nb \xFF\x01\"'$.flac");
  for (const auto& path : {deep, odd}) {
    const auto answer = read(path, Kind::kMusic);
    EXPECT_EQ(answer.outcome, Outcome::kRead) << answer.reason;
    EXPECT_EQ(answer.file.path, path);
    EXPECT_EQ(answer.file.title, "A Long Ebb");
  }
}

TEST(TagWorkers, CallAPathThatIsTooLongUnreadable) {
  const auto answer = read("/" + std::string(1'000'000, 'x'), Kind::kMusic);
  EXPECT_EQ(answer.outcome, Outcome::kUnreadable);
  EXPECT_EQ(answer.error, ENAMETOOLONG);
}

TEST(TagWorkers, CallAMissingFileUnreadable) {
  const auto answer = read("/nowhere/a.mp3", Kind::kMusic);
  EXPECT_EQ(answer.outcome, Outcome::kUnreadable);
  EXPECT_EQ(answer.error, ENOENT);
  EXPECT_EQ(answer.reason, "No such file or directory");
}

/// Reads nothing at its beginning, with an error.
TEST(TagWorkers, CallAFileOnABadDiskUnreadable) {
  const OpenFolder folder;
  fs::create_symlink("/proc/self/mem", folder.at("a.mp3"));
  const auto answer = read(folder.at("a.mp3"), Kind::kMusic);
  EXPECT_EQ(answer.outcome, Outcome::kUnreadable);
  EXPECT_EQ(answer.error, EIO);
}

TEST(TagWorkers, CallAFileOfNonsenseDamaged) {
  const auto answer = read(sample("damaged/not a picture.jpg"), Kind::kPhoto);
  EXPECT_EQ(answer.outcome, Outcome::kDamaged);
  EXPECT_NE(answer.reason, "");
}

TEST(TagWorkers, DoNotWaitForTheOtherEndOfAPipe) {
  const OpenFolder folder;
  ASSERT_EQ(mkfifo(folder.at("a.mp3").c_str(), 0600), 0);
  const auto answer = read(folder.at("a.mp3"), Kind::kMusic);
  EXPECT_EQ(answer.outcome, Outcome::kDamaged);
  EXPECT_EQ(answer.reason, "it is no regular file");
}

/// Whether this holds in a process of its own, as nobody where this one is root's.
bool holds_for_user(const std::function<bool()>& what) {
  constexpr uid_t kNobody = 65534;
  const pid_t child = fork();
  if (child == 0) {
    const bool is_user = getuid() != 0 || (setgid(kNobody) == 0 && setuid(kNobody) == 0);
    _exit(is_user && what() ? 0 : 1);
  }
  int status = -1;
  waitpid(child, &status, 0);
  return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

TEST(TagWorkers, WorkForAnOrdinaryUser) {
  const OpenFolder folder;
  const auto file = folder.take_sample(kSampleFlac, "a.flac");
  EXPECT_TRUE(holds_for_user([&] { return read(file, Kind::kMusic).outcome == Outcome::kRead; }));
}

TEST(TagWorkers, CallAFileOfSomebodyElseUnreadable) {
  const OpenFolder folder;
  const auto file = folder.take_sample(kSampleFlac, "a.flac");
  fs::permissions(file, fs::perms::none);
  EXPECT_TRUE(holds_for_user([&] {
    const auto answer = read(file, Kind::kMusic);
    return answer.outcome == Outcome::kUnreadable && answer.error == EACCES &&
           answer.before.size > 0;
  }));
}

/// As in a container whose kernel knows no sandbox.
TEST(TagWorkers, WorkWithoutASandbox) {
  const auto file = sample(kSampleFlac);
  const pid_t child = fork();
  if (child == 0) {
    auto* filter = seccomp_init(SCMP_ACT_ALLOW);
    int error = 0;
    for (const int call : {SCMP_SYS(landlock_create_ruleset), SCMP_SYS(seccomp), SCMP_SYS(unshare),
                           SCMP_SYS(capset)}) {
      error |= seccomp_rule_add(filter, SCMP_ACT_ERRNO(EPERM), call, 0);
    }
    error |= seccomp_rule_add(filter, SCMP_ACT_ERRNO(EINVAL), SCMP_SYS(prctl), 1,
                              SCMP_A0(SCMP_CMP_EQ, PR_SET_SECCOMP));
    error |= seccomp_load(filter);
    auto workers = start(1);
    workers.submit({1, file, Kind::kMusic});
    const bool is_read = take_all(workers)[1].outcome == Outcome::kRead;
    const bool says_so = workers.sandbox().starts_with("no new privileges; refused: ");
    _exit(error == 0 && is_read && says_so ? 0 : 1);
  }
  int status = -1;
  waitpid(child, &status, 0);
  EXPECT_EQ(status, 0);
}

TEST(TagWorkers, SayWhatTheirSandboxIs) {
  auto workers = start(1);
  EXPECT_THAT(workers.sandbox(), HasSubstr("no new privileges"));
}

TEST(TagWorkers, AnswerManyOrdersOfSeveralWorkers) {
  auto workers = start(3);
  submit_many(workers, 500);
  EXPECT_EQ(workers.outstanding(), 500U);
  EXPECT_EQ(count_outcomes(take_all(workers)), (std::map<Outcome, int>{{Outcome::kRead, 500}}));
  EXPECT_EQ(workers.outstanding(), 0U);
  EXPECT_FALSE(workers.take(kPatience));
}

TEST(TagWorkers, AreStartedWhenThereIsSomethingToDo) {
  auto workers = start(2);
  EXPECT_THAT(workers.pids(), testing::IsEmpty());
  workers.submit({1, "/nowhere", Kind::kMusic});
  EXPECT_THAT(workers.pids(), testing::SizeIs(2));
}

TEST(TagWorkers, AreReplacedWhenTheyDieWithNothingToDo) {
  auto workers = start(1);
  ASSERT_NE(workers.sandbox(), "");
  const pid_t first = workers.pids()[0];
  kill(first, SIGKILL);
  submit_many(workers, 0);
  while (workers.pids() == std::vector{first}) {
    workers.submit({1, "/nowhere", Kind::kMusic});
    workers.take(kPatience);
  }
  submit_many(workers, 20);
  EXPECT_EQ(count_outcomes(take_all(workers))[Outcome::kRead], 20);
}

/// A stopped worker holds its orders; the first of them is the file in its hand.
class AStoppedWorker : public testing::Test {
 protected:
  void submit(const WorkerLimits& limits) {
    workers = std::make_unique<TagWorkers>(1, limits, MEDIIDX_COMMAND);
    ASSERT_NE(workers->sandbox(), "");
    pid = workers->pids()[0];
    kill(pid, SIGSTOP);
    submit_many(*workers, 30);
  }

  std::unique_ptr<TagWorkers> workers;
  pid_t pid = 0;
};

TEST_F(AStoppedWorker, ThatCrashesCostsTheFileInItsHand) {
  submit({});
  kill(pid, SIGABRT);
  kill(pid, SIGCONT);
  auto answers = take_all(*workers);
  EXPECT_EQ(answers[0].outcome, Outcome::kLost);
  EXPECT_EQ(answers[0].reason, "its reader died of SIGABRT");
  EXPECT_EQ(count_outcomes(answers),
            (std::map<Outcome, int>{{Outcome::kRead, 29}, {Outcome::kLost, 1}}));
}

TEST_F(AStoppedWorker, IsKilledWhenItsTimeIsUp) {
  submit(with_time(seconds(1)));
  auto answers = take_all(*workers);
  EXPECT_EQ(answers[0].outcome, Outcome::kLost);
  EXPECT_EQ(answers[0].reason, "its reader took more than 1 s");
  EXPECT_EQ(count_outcomes(answers),
            (std::map<Outcome, int>{{Outcome::kRead, 29}, {Outcome::kLost, 1}}));
  EXPECT_EQ(kill(pid, 0), -1);
}

TEST_F(AStoppedWorker, IsDeafToTheSignalsThatEndAProgram) {
  submit({});
  for (const int number : {SIGINT, SIGTERM, SIGHUP, SIGQUIT}) kill(pid, number);
  kill(pid, SIGCONT);
  EXPECT_EQ(count_outcomes(take_all(*workers))[Outcome::kRead], 30);
  EXPECT_EQ(workers->pids(), std::vector{pid});
}

TEST_F(AStoppedWorker, EndsWithItsParent) {
  submit({});
  workers.reset();
  EXPECT_EQ(waitpid(-1, nullptr, WNOHANG), -1);
  EXPECT_EQ(errno, ECHILD);
}

TEST(TagWorkers, EndWhenTheirParentIsKilled) {
  prctl(PR_SET_CHILD_SUBREAPER, 1, 0, 0, 0);
  int ends[2];
  ASSERT_EQ(pipe(ends), 0);
  const pid_t parent = fork();
  if (parent == 0) {
    auto workers = start(1);
    static_cast<void>(workers.sandbox());
    const pid_t worker = workers.pids()[0];
    kill(worker, SIGSTOP);
    static_cast<void>(!write(ends[1], &worker, sizeof(worker)));
    pause();
  }
  pid_t worker = 0;
  ASSERT_EQ(::read(ends[0], &worker, sizeof(worker)), static_cast<ssize_t>(sizeof(worker)));
  kill(parent, SIGKILL);
  waitpid(parent, nullptr, 0);
  int status = 0;
  EXPECT_EQ(waitpid(worker, &status, 0), worker);
  EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGKILL);
  close(ends[0]);
  close(ends[1]);
  prctl(PR_SET_CHILD_SUBREAPER, 0, 0, 0, 0);
}

TEST(TagWorkers, LeaveNoChildAndNoDescriptor) {
  const auto before = open_descriptors("self").size();
  {
    auto workers = start(3, with_time(seconds(1)));
    submit_many(workers, 100);
    kill(workers.pids()[0], SIGKILL);
    kill(workers.pids()[1], SIGSTOP);
    EXPECT_EQ(take_all(workers).size(), 100U);
    submit_many(workers, 100);
  }
  EXPECT_EQ(open_descriptors("self").size(), before);
  EXPECT_EQ(waitpid(-1, nullptr, WNOHANG), -1);
  EXPECT_EQ(errno, ECHILD);
}

TEST(AProcess, IsRunnableWhileItComputes) {
  EXPECT_TRUE(tool::is_runnable(getpid()));
  const pid_t child = fork();
  if (child == 0) {
    pause();
    _exit(0);
  }
  while (tool::is_runnable(child)) std::this_thread::sleep_for(std::chrono::milliseconds(1));
  kill(child, SIGKILL);
  waitpid(child, nullptr, 0);
  EXPECT_FALSE(tool::is_runnable(child)) << "ended";
}

TEST(AWorker, HasItsChannelAndNothingElse) {
  const int kept = open("/etc/passwd", O_RDONLY);  // Not closed on exec.
  ASSERT_GE(kept, 0);
  auto workers = start(1);
  ASSERT_NE(workers.sandbox(), "");
  const pid_t worker = workers.pids()[0];
  EXPECT_EQ(open_descriptors(std::to_string(worker)),
            (std::set<std::string>{"0 /dev/null", "1 /dev/null", "2 /dev/null", "3 socket:"}));
  EXPECT_EQ(getsid(worker), worker);
  close(kept);
}

TEST(AFileThatAsksForTooMuch, ProcessorTimeIsLost) {
  const OpenFolder folder;
  const auto file = make_sparse(folder, "a.mp3", "", 1UL << 40U);
  WorkerLimits limits;
  limits.processor_time = seconds(1);
  auto workers = start(1, limits);
  workers.submit({1, file, Kind::kMusic});
  workers.submit({2, sample(kSampleFlac), Kind::kMusic});
  auto answers = take_all(workers);
  EXPECT_EQ(answers[1].outcome, Outcome::kLost);
  EXPECT_EQ(answers[1].reason, "its reader took more than 1 s of processor time");
  EXPECT_EQ(answers[2].outcome, Outcome::kRead);
}

// The sanitizers' allocator knows no such limit.
#ifndef __SANITIZE_ADDRESS__
TEST(AFileThatAsksForTooMuch, MemoryIsDamaged) {
  const OpenFolder folder;
  // A tag of 250 MiB with a picture that fills it.
  const std::string tag(
      "ID3\x04\x00\x00\x7D\x00\x00\x00"
      "APIC\x7C\x7F\x7F\x76\x00\x00\x00image/png\x00\x03\x00",
      35);
  const auto file = make_sparse(folder, "a.mp3", tag, 260UL << 20U);
  WorkerLimits limits;
  limits.memory_bytes = 200UL << 20U;
  EXPECT_THAT(read(file, Kind::kMusic, limits).reason, HasSubstr("more memory than there is"));
  limits.memory_bytes = 2000UL << 20U;
  EXPECT_THAT(read(file, Kind::kMusic, limits).reason, testing::Not(HasSubstr("memory")));
}
#endif

struct HostileCase {
  const char* name;
  const char* path;
  const char* reason;
};
class AHostileWorker : public testing::TestWithParam<HostileCase> {};

TEST_P(AHostileWorker, CostsItsFileOnly) {
  TagWorkers workers(1, with_time(seconds(2)), MEDIIDX_HOSTILE_WORKER);
  workers.submit({1, "/good", Kind::kMusic});
  workers.submit({2, GetParam().path, Kind::kMusic});
  workers.submit({3, "/also good", Kind::kMusic});
  auto answers = take_all(workers);
  EXPECT_EQ(answers[1].file.title, "title of /good");
  EXPECT_EQ(answers[2].outcome, Outcome::kLost);
  EXPECT_EQ(answers[2].reason, GetParam().reason);
  EXPECT_EQ(answers[3].file.title, "title of /also good");
}

constexpr const char* kNonsense = "its reader gave an answer that makes no sense";
INSTANTIATE_TEST_SUITE_P(
    Cases, AHostileWorker,
    testing::Values(HostileCase{"AnswersAnotherOrder", "/other ticket", kNonsense},
                    HostileCase{"SendsAnEndlessMessage", "/endless", kNonsense},
                    HostileCase{"SendsGarbage", "/garbage", kNonsense},
                    HostileCase{"StopsAmidAnAnswer", "/half", "its reader took more than 2 s"},
                    HostileCase{"Ends", "/ends", "its reader ended with status 7"},
                    HostileCase{"Aborts", "/aborts", "its reader died of SIGABRT"},
                    HostileCase{"ClosesItsChannel", "/closes", "its reader died of SIGKILL"}),
    [](const auto& test) { return test.param.name; });

TEST(AHostileWorker, ThatAnswersTwiceIsReplaced) {
  TagWorkers workers(1, {}, MEDIIDX_HOSTILE_WORKER);
  ASSERT_EQ(workers.sandbox(), "none");
  const auto pids = workers.pids();
  workers.submit({1, "/twice", Kind::kMusic});
  EXPECT_EQ(workers.take(kPatience)->outcome, Outcome::kRead);
  workers.submit({2, "/good", Kind::kMusic});
  EXPECT_EQ(take_all(workers).size(), 1U);
  EXPECT_NE(workers.pids(), pids);
}

TEST(AWorkerThatDoesNotStart, EndsTheReading) {
  TagWorkers missing(1, {}, "/nowhere/mediidx");
  EXPECT_THROW(missing.submit({1, sample(kSampleFlac), Kind::kMusic}), std::system_error);
  EXPECT_EQ(missing.outstanding(), 0U);
  TagWorkers workers(2, {}, "/bin/true");
  workers.submit({1, sample(kSampleFlac), Kind::kMusic});
  EXPECT_THROW(take_all(workers), std::runtime_error);
  EXPECT_EQ(workers.outstanding(), 1U);
}

}  // namespace
}  // namespace mediidx::test
