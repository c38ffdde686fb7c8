// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <tavocore.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <iterator>
#include <string>

#include "temporary_folder.h"

namespace {

using mediidx::test::TemporaryFolder;
using testing::HasSubstr;
using testing::Not;

int shell(const char* script) { return TLIBCExec("/bin/sh", "-c", script, nullptr, nullptr); }

std::string read_all(FILE* stream) {
  std::string text;
  for (int c = std::fgetc(stream); c != EOF; c = std::fgetc(stream)) text += static_cast<char>(c);
  return text;
}

/// Sets a signal's handling while it lives.
class SignalHandling {
 public:
  SignalHandling(int signal, void (*handler)(int)) : signal_(signal) {
    struct sigaction action{};
    action.sa_handler = handler;
    sigaction(signal_, &action, &before_);
  }
  ~SignalHandling() { sigaction(signal_, &before_, nullptr); }
  SignalHandling(const SignalHandling&) = delete;
  SignalHandling& operator=(const SignalHandling&) = delete;

 private:
  int signal_;
  struct sigaction before_;
};

TEST(AProgram, GivesItsExitStatus) {
  EXPECT_EQ(TLIBCExec("/bin/true", nullptr, nullptr, nullptr, nullptr), 0);
  EXPECT_EQ(TLIBCExec("/bin/false", nullptr, nullptr, nullptr, nullptr), 1);
  EXPECT_EQ(shell("exit 42"), 42);
}

TEST(AProgram, GivesTheSignalThatEndedIt) { EXPECT_EQ(shell("kill -TERM $$"), 128 + SIGTERM); }

TEST(AProgram, GetsItsArgumentsAsTheyAre) {
  const TemporaryFolder folder;
  const auto file = folder.at("it's \"$(touch x)\" ;&|*");
  EXPECT_EQ(TLIBCExec("/bin/touch", "--", file.c_str(), nullptr, nullptr), 0);
  EXPECT_EQ(TLIBCFileExist(file.c_str()), 1);
}

TEST(AProgram, GetsTheArgumentsBehindAnAbsentOne) {
  EXPECT_EQ(TLIBCExec("/usr/bin/test", nullptr, "a", "=", "a"), 0);
  EXPECT_EQ(TLIBCExec("/usr/bin/test", "a", nullptr, "=", "b"), 1);
}

TEST(AProgram, ReadsFromNowhere) {
  EXPECT_EQ(TLIBCExec("/bin/cat", nullptr, nullptr, nullptr, nullptr), 0);
  EXPECT_EQ(shell("test \"$(readlink /proc/self/fd/0)\" = /dev/null"), 0);
}

TEST(AProgram, ThatCannotBeStartedIsAFailure) {
  const TemporaryFolder folder;
  const auto no_program = folder.write("text", "just text\n");
  EXPECT_EQ(TLIBCExec(folder.at("missing").c_str(), nullptr, nullptr, nullptr, nullptr), -1);
  EXPECT_EQ(TLIBCExec(no_program.c_str(), nullptr, nullptr, nullptr, nullptr), -1);
  EXPECT_EQ(TLIBCExec(folder.at("").c_str(), nullptr, nullptr, nullptr, nullptr), -1);
  EXPECT_EQ(TLIBCExec("", nullptr, nullptr, nullptr, nullptr), -1);
  EXPECT_EQ(TLIBCExec(nullptr, nullptr, nullptr, nullptr, nullptr), -1);
}

TEST(AProgram, IsNoScriptForAShell) {
  const TemporaryFolder folder;
  const auto script = folder.write("script", "exit 0\n");
  ASSERT_EQ(chmod(script.c_str(), 0755), 0);
  EXPECT_EQ(TLIBCExec(script.c_str(), nullptr, nullptr, nullptr, nullptr), -1);
}

TEST(AProgram, IsNotLookedForOnThePath) {
  EXPECT_EQ(TLIBCExec("true", nullptr, nullptr, nullptr, nullptr), -1);
}

TEST(AProgram, HasDefaultSignalHandling) {
  const SignalHandling ignored(SIGHUP, SIG_IGN);
  sigset_t blocked;
  sigset_t before;
  sigemptyset(&blocked);
  sigaddset(&blocked, SIGHUP);
  pthread_sigmask(SIG_BLOCK, &blocked, &before);
  const int status = shell("kill -HUP $$; exit 0");
  pthread_sigmask(SIG_SETMASK, &before, nullptr);
  EXPECT_EQ(status, 128 + SIGHUP);
}

TEST(AProgram, LeavesTheCallersSignalsAsTheyWere) {
  sigset_t before;
  sigset_t after;
  pthread_sigmask(SIG_SETMASK, nullptr, &before);
  shell("exit 0");
  pthread_sigmask(SIG_SETMASK, nullptr, &after);
  EXPECT_EQ(sigismember(&before, SIGCHLD), sigismember(&after, SIGCHLD));
}

int children_reaped = 0;
void reap_children(int) {
  const int error = errno;
  while (waitpid(-1, nullptr, WNOHANG) > 0) ++children_reaped;
  errno = error;
}

TEST(AProgram, KeepsItsStatusFromAHandlerThatReapsChildren) {
  const SignalHandling reaping(SIGCHLD, reap_children);
  children_reaped = 0;
  EXPECT_EQ(shell("exit 7"), 7);
  EXPECT_EQ(children_reaped, 0);
}

void do_nothing(int) {}

TEST(AProgram, IsWaitedForThroughInterruptions) {
  const SignalHandling interrupted(SIGUSR1, do_nothing);
  EXPECT_EQ(shell("for i in 1 2 3 4 5; do kill -USR1 $PPID; done; exit 9"), 9);
}

TEST(AProgram, InheritsNoDescriptor) {
  const int open_file = fcntl(STDERR_FILENO, F_DUPFD, 100);
  ASSERT_GE(open_file, 100);
  FILE* stream = TLIBCPopen("/bin/ls", "r", "/proc/self/fd", nullptr);
  ASSERT_NE(stream, nullptr);
  EXPECT_EQ(read_all(stream), "0\n1\n2\n3\n");  // the last is the folder that ls reads
  EXPECT_EQ(TLIBCPclose(stream), 0);
  close(open_file);
}

TEST(AnOpenProgram, IsReadFrom) {
  FILE* stream = TLIBCPopen("/bin/echo", "r", "-n", "a  b", "$HOME", nullptr);
  ASSERT_NE(stream, nullptr);
  EXPECT_EQ(read_all(stream), "a  b $HOME");
  EXPECT_EQ(TLIBCPclose(stream), 0);
}

TEST(AnOpenProgram, MayHaveNoArguments) {
  FILE* stream = TLIBCPopen("/bin/pwd", "r", nullptr, nullptr);
  ASSERT_NE(stream, nullptr);
  EXPECT_THAT(read_all(stream), HasSubstr("/"));
  EXPECT_EQ(TLIBCPclose(stream), 0);
}

TEST(AnOpenProgram, IsWrittenTo) {
  const TemporaryFolder folder;
  const auto target = "of=" + folder.at("copy");
  FILE* stream = TLIBCPopen("/bin/dd", "w", target.c_str(), "status=none", nullptr);
  ASSERT_NE(stream, nullptr);
  std::fputs("written", stream);
  EXPECT_EQ(TLIBCPclose(stream), 0);
  EXPECT_EQ(folder.read("copy"), "written");
}

TEST(AnOpenProgram, GivesItsStatusWhenItIsClosed) {
  EXPECT_EQ(TLIBCPclose(TLIBCPopen("/bin/sh", "r", "-c", "exit 3", nullptr)), 3);
  EXPECT_EQ(TLIBCPclose(TLIBCPopen("/bin/sh", "r", "-c", "kill -KILL $$", nullptr)), 128 + SIGKILL);
}

TEST(AnOpenProgram, EndsWhenItIsClosedEarly) {
  FILE* stream = TLIBCPopen("/usr/bin/yes", "r", nullptr, nullptr);
  ASSERT_NE(stream, nullptr);
  EXPECT_EQ(std::fgetc(stream), 'y');
  EXPECT_EQ(TLIBCPclose(stream), 128 + SIGPIPE);
}

TEST(AnOpenProgram, MayBeOneOfSeveral) {
  FILE* first = TLIBCPopen("/bin/cat", "w", "-", nullptr);
  FILE* second = TLIBCPopen("/bin/sh", "r", "-c", "echo second; exit 2", nullptr);
  ASSERT_NE(first, nullptr);
  ASSERT_NE(second, nullptr);
  // The second must not hold the first one's pipe open, or this would wait for ever.
  EXPECT_EQ(TLIBCPclose(first), 0);
  EXPECT_EQ(read_all(second), "second\n");
  EXPECT_EQ(TLIBCPclose(second), 2);
}

TEST(AnOpenProgram, ThatCannotBeStartedIsEmpty) {
  const TemporaryFolder folder;
  FILE* stream = TLIBCPopen(folder.at("missing").c_str(), "r", "x", nullptr);
  ASSERT_NE(stream, nullptr);
  EXPECT_EQ(std::fgetc(stream), EOF);
  EXPECT_NE(std::feof(stream), 0);
  EXPECT_EQ(TLIBCPclose(stream), -1);
}

TEST(AnOpenProgram, ThatCannotBeStartedSwallowsWhatIsWritten) {
  const TemporaryFolder folder;
  FILE* stream = TLIBCPopen(folder.at("missing").c_str(), "w", "x", nullptr);
  ASSERT_NE(stream, nullptr);
  EXPECT_GE(std::fputs("lost", stream), 0);
  EXPECT_EQ(std::fflush(stream), 0);
  EXPECT_EQ(TLIBCPclose(stream), -1);
}

TEST(AnOpenProgram, NeedsAProgramAndAMode) {
  EXPECT_EQ(TLIBCPopen(nullptr, "r", "x", nullptr), nullptr);
  EXPECT_EQ(TLIBCPopen("/bin/true", nullptr, "x", nullptr), nullptr);
  EXPECT_EQ(TLIBCPopen("/bin/true", "rw", "x", nullptr), nullptr);
  EXPECT_EQ(TLIBCPopen("/bin/true", "", "x", nullptr), nullptr);
}

TEST(AnOpenProgram, IsNotJustAnyStream) {
  FILE* other = std::fopen("/dev/null", "r");
  ASSERT_NE(other, nullptr);
  EXPECT_EQ(TLIBCPclose(other), -1);
  EXPECT_EQ(std::fclose(other), 0);
  EXPECT_EQ(TLIBCPclose(nullptr), -1);
}

/// A program that waits until a signal ends it.
class WaitingProgram {
 public:
  WaitingProgram() : pid_(fork()) {
    if (pid_ == 0) {
      execl("/bin/sleep", "sleep", "600", static_cast<char*>(nullptr));
      _exit(127);
    }
  }
  ~WaitingProgram() {
    if (pid_ <= 0) return;
    kill(pid_, SIGKILL);
    waitpid(pid_, nullptr, 0);
  }
  WaitingProgram(const WaitingProgram&) = delete;
  WaitingProgram& operator=(const WaitingProgram&) = delete;

  std::string pid() const { return std::to_string(pid_); }
  int signal_that_ended_it() {
    int status = 0;
    waitpid(pid_, &status, 0);
    pid_ = -1;
    return WIFSIGNALED(status) ? WTERMSIG(status) : 0;
  }

 private:
  pid_t pid_;
};

TEST(APidFile, LeadsASignalToItsProcess) {
  const TemporaryFolder folder;
  WaitingProgram program;
  const auto file = folder.write("x.pid", program.pid() + " \r\n");
  EXPECT_EQ(TLIBCProcSignalByPidFile(file.c_str(), SIGTERM), 0);
  EXPECT_EQ(program.signal_that_ended_it(), SIGTERM);
}

TEST(APidFile, OfAProcessThatIsGoneIsAFailure) {
  const TemporaryFolder folder;
  WaitingProgram program;
  const auto file = folder.write("x.pid", program.pid());
  ASSERT_EQ(TLIBCProcSignalByPidFile(file.c_str(), SIGKILL), 0);
  ASSERT_EQ(program.signal_that_ended_it(), SIGKILL);
  EXPECT_EQ(TLIBCProcSignalByPidFile(file.c_str(), 0), -1);
}

TEST(APidFile, TakesNoSignalThatThereIsNot) {
  const TemporaryFolder folder;
  WaitingProgram program;
  EXPECT_EQ(TLIBCProcSignalByPidFile(folder.write("x.pid", program.pid()).c_str(), 9999), -1);
}

struct BadPidCase {
  const char* name;
  std::string text;
};

class ABadPidFile : public testing::TestWithParam<BadPidCase> {};

// Signal 0 would only ask whether the process is there: the answer for each of these would be yes
// if the id were taken for the one that it looks like.
TEST_P(ABadPidFile, SignalsNobody) {
  const TemporaryFolder folder;
  const auto file = folder.write("x.pid", GetParam().text);
  EXPECT_EQ(TLIBCProcSignalByPidFile(file.c_str(), 0), -1);
}

const std::string kOwn = std::to_string(getpid());

INSTANTIATE_TEST_SUITE_P(
    Cases, ABadPidFile,
    testing::Values(BadPidCase{"Zero", "0"}, BadPidCase{"One", "1\n"}, BadPidCase{"MinusOne", "-1"},
                    BadPidCase{"OwnGroup", "-" + kOwn}, BadPidCase{"Empty", ""},
                    BadPidCase{"OnlyWhiteSpace", " \n"}, BadPidCase{"Plus", "+" + kOwn},
                    BadPidCase{"BlankBefore", " " + kOwn}, BadPidCase{"Trailer", kOwn + "x"},
                    BadPidCase{"TwoNumbers", kOwn + " 5"}, BadPidCase{"Fraction", kOwn + ".0"},
                    BadPidCase{"Hexadecimal", "0x10"},
                    BadPidCase{"WrapsTo32Bits", std::to_string(4294967296 + getpid())},
                    BadPidCase{"BeyondEverything", std::string(40, '9')},
                    BadPidCase{"NullByte", kOwn + std::string(1, '\0')},
                    BadPidCase{"LongFile", kOwn + std::string(100000, '\n')}),
    [](const auto& test) { return test.param.name; });

TEST(APidFile, HasToExist) {
  const TemporaryFolder folder;
  EXPECT_EQ(TLIBCProcSignalByPidFile(folder.at("missing").c_str(), 0), -1);
  EXPECT_EQ(TLIBCProcSignalByPidFile(folder.at("").c_str(), 0), -1);
  EXPECT_EQ(TLIBCProcSignalByPidFile(nullptr, 0), -1);
}

}  // namespace
