// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "workers/sandbox.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <seccomp.h>
#include <signal.h>
#include <sys/ptrace.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <functional>

#include "../command.h"

namespace mediidx::test {
namespace {

/// Whether this holds in a process of its own.
bool holds_in_child(const std::function<bool()>& what) {
  const pid_t child = fork();
  if (child == 0) _exit(what() ? 0 : 1);
  int status = -1;
  waitpid(child, &status, 0);
  return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

bool holds_in_sandbox(const std::function<bool()>& what) {
  return holds_in_child([&what] {
    tool::enter_sandbox();
    return what();
  });
}

bool can_open(const std::string& path, int flags) {
  const int descriptor = open(path.c_str(), flags, 0600);
  if (descriptor >= 0) close(descriptor);
  return descriptor >= 0;
}

/// As on a kernel that knows these calls not.
bool forget_calls(std::initializer_list<int> calls) {
  auto* filter = seccomp_init(SCMP_ACT_ALLOW);
  int error = 0;
  for (const int call : calls) {
    error |= seccomp_rule_add(filter, SCMP_ACT_ERRNO(ENOSYS), call, 0);
  }
  // An older way to the same.
  error |= seccomp_rule_add(filter, SCMP_ACT_ERRNO(EINVAL), SCMP_SYS(prctl), 1,
                            SCMP_A0(SCMP_CMP_EQ, 22 /* PR_SET_SECCOMP */));
  error |= seccomp_load(filter);
  seccomp_release(filter);
  return error == 0;
}

TEST(TheSandbox, LetsFilesBeRead) {
  const OpenFolder folder;
  const auto file = folder.write("a", "text");
  EXPECT_TRUE(holds_in_sandbox([&] {
    char text[4];
    const int descriptor = open(file.c_str(), O_RDONLY | O_CLOEXEC);
    struct stat status{};
    return read(descriptor, text, sizeof(text)) == 4 && std::string(text, 4) == "text" &&
           stat(file.c_str(), &status) == 0 && status.st_size == 4;
  }));
}

TEST(TheSandbox, LetsFoldersBeRead) {
  const OpenFolder folder;
  folder.write("a", "text");
  EXPECT_TRUE(holds_in_sandbox([&] {
    std::error_code error;
    return std::filesystem::directory_iterator(folder.path(), error)->path().filename() == "a";
  }));
}

TEST(TheSandbox, HasNoSockets) {
  for (const int family : {AF_INET, AF_INET6, AF_UNIX, AF_NETLINK}) {
    const auto has_socket = [family] { return socket(family, SOCK_DGRAM, 0) >= 0; };
    EXPECT_FALSE(holds_in_sandbox(has_socket)) << family;
  }
  EXPECT_TRUE(holds_in_child([] { return socket(AF_UNIX, SOCK_DGRAM, 0) >= 0; }));
  int ends[2];
  EXPECT_FALSE(holds_in_sandbox([&] { return socketpair(AF_UNIX, SOCK_STREAM, 0, ends) == 0; }));
}

TEST(TheSandbox, LetsNoFileBeWritten) {
  const OpenFolder folder;
  const auto file = folder.write("a", "text");
  for (const int flags : {O_WRONLY, O_RDWR, O_WRONLY | O_APPEND, O_RDONLY | O_TRUNC}) {
    EXPECT_FALSE(holds_in_sandbox([&] { return can_open(file, flags); })) << flags;
  }
  EXPECT_FALSE(holds_in_sandbox([&] { return can_open(folder.at("b"), O_RDONLY | O_CREAT); }));
  EXPECT_FALSE(holds_in_sandbox([&] { return truncate(file.c_str(), 0) == 0; }));
  EXPECT_FALSE(holds_in_sandbox([&] { return unlink(file.c_str()) == 0; }));
  EXPECT_FALSE(holds_in_sandbox([&] { return rename(file.c_str(), folder.at("b").c_str()) == 0; }));
  EXPECT_FALSE(holds_in_sandbox([&] { return link(file.c_str(), folder.at("b").c_str()) == 0; }));
  EXPECT_FALSE(holds_in_sandbox([&] { return mkdir(folder.at("b").c_str(), 0700) == 0; }));
  EXPECT_FALSE(holds_in_sandbox([&] { return chmod(file.c_str(), 0777) == 0; }));
  EXPECT_EQ(std::filesystem::file_size(file), 4U);
  EXPECT_FALSE(std::filesystem::exists(folder.at("b")));
}

TEST(TheSandbox, HasNoOtherProcesses) {
  EXPECT_FALSE(holds_in_sandbox([] {
    const pid_t child = fork();
    if (child == 0) _exit(0);
    return child > 0;
  }));
  EXPECT_FALSE(holds_in_sandbox([] { return execl("/bin/true", "true", nullptr) == 0; }));
  EXPECT_FALSE(holds_in_child([] {
    tool::enter_sandbox();
    execl("/bin/true", "true", nullptr);
    return false;
  }));
  EXPECT_FALSE(holds_in_sandbox([] { return kill(getppid(), 0) == 0; }));
  EXPECT_FALSE(holds_in_sandbox([] { return ptrace(PTRACE_TRACEME, 0, nullptr, nullptr) == 0; }));
  EXPECT_FALSE(holds_in_sandbox([] { return unshare(CLONE_NEWNS) == 0; }));
}

TEST(TheSandbox, StillLetsAProcessAbort) {
  const pid_t child = fork();
  if (child == 0) {
    tool::limit_process(1UL << 30U);
    tool::enter_sandbox();
    std::abort();
  }
  int status = 0;
  waitpid(child, &status, 0);
  EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGABRT) << status;
}

TEST(TheSandbox, SaysWhatHolds) {
  EXPECT_TRUE(holds_in_child([] {
    const auto text = tool::enter_sandbox();
    return text.starts_with("no new privileges, no capabilities") &&
           text.find("seccomp") != std::string::npos;
  }));
}

TEST(TheSandbox, IsAsGoodAsTheKernelLetsIt) {
  const OpenFolder folder;
  const auto file = folder.write("a", "text");
  EXPECT_TRUE(holds_in_child([&] {
    if (!forget_calls({SCMP_SYS(seccomp)})) return false;
    const auto text = tool::enter_sandbox();
    const bool has_landlock = text.find("Landlock") < text.find("refused");
    return text.find("seccomp (") > text.find("refused") && can_open(file, O_RDONLY) &&
           can_open(file, O_WRONLY) != has_landlock;
  }));
  EXPECT_TRUE(holds_in_child([&] {
    if (!forget_calls({SCMP_SYS(landlock_create_ruleset)})) return false;
    const auto text = tool::enter_sandbox();
    return text.find("refused: Landlock (Function not implemented)") != std::string::npos &&
           can_open(file, O_RDONLY);
  }));
}

TEST(TheLimits, HoldForTheProcess) {
  EXPECT_TRUE(holds_in_child([] {
    tool::limit_process(1UL << 30U);
    rlimit files{};
    rlimit core{};
    rlimit size{};
    getrlimit(RLIMIT_NOFILE, &files);
    getrlimit(RLIMIT_CORE, &core);
    getrlimit(RLIMIT_FSIZE, &size);
    return files.rlim_max == 64 && core.rlim_max == 0 && size.rlim_max == 0;
  }));
}

TEST(ProcessorTime, IsGivenAnewForEachFile) {
  EXPECT_TRUE(holds_in_child([] {
    rlimit before{};
    rlimit after{};
    tool::limit_processor_time(std::chrono::seconds(5));
    getrlimit(RLIMIT_CPU, &before);
    while (std::clock() < CLOCKS_PER_SEC * 11 / 10) {
    }
    tool::limit_processor_time(std::chrono::seconds(5));
    getrlimit(RLIMIT_CPU, &after);
    return before.rlim_cur >= 6 && after.rlim_cur > before.rlim_cur;
  }));
}

}  // namespace
}  // namespace mediidx::test
