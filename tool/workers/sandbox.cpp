// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

#include "workers/sandbox.h"

#include <fcntl.h>
#include <linux/capability.h>
#include <linux/landlock.h>
#include <sched.h>
#include <seccomp.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstddef>
#include <cstring>
#include <ctime>
#include <initializer_list>
#include <memory>
#include <string_view>

namespace mediidx::tool {
namespace {

void limit(__rlimit_resource resource, rlim_t value) {
  rlimit now{};
  if (getrlimit(resource, &now) != 0) return;
  const rlimit wanted{std::min(value, now.rlim_max), std::min(value, now.rlim_max)};
  setrlimit(resource, &wanted);
}

/// Each measure returns 0, or the error that kept it from being taken.
int refuse_new_privileges() { return prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0) == 0 ? 0 : errno; }

/// Of root's powers only the one to read everything stays.
int drop_capabilities() {
  __user_cap_header_struct header{_LINUX_CAPABILITY_VERSION_3, 0};
  std::array<__user_cap_data_struct, _LINUX_CAPABILITY_U32S_3> sets{};
  if (syscall(SYS_capget, &header, sets.data()) != 0) return errno;
  const auto kept = sets[0].permitted & (1U << CAP_DAC_READ_SEARCH);
  sets = {};
  sets[0].effective = sets[0].permitted = kept;
  return syscall(SYS_capset, &header, sets.data()) == 0 ? 0 : errno;
}

/// As the newest kernels take it; older headers know only its beginning.
struct Ruleset {
  std::uint64_t files;
  std::uint64_t network;
  std::uint64_t scopes;
};

/// The rights that a version of Landlock handles: all but reading, and without a rule none is left.
Ruleset rights_of(int version) {
  constexpr std::uint64_t kFirst = (1U << 13U) - 1;  // LANDLOCK_ACCESS_FS_EXECUTE … _MAKE_SYM
  constexpr std::uint64_t kReading = LANDLOCK_ACCESS_FS_READ_FILE | LANDLOCK_ACCESS_FS_READ_DIR;
  constexpr std::uint64_t kRefer = 1U << 13U;
  constexpr std::uint64_t kTruncate = 1U << 14U;
  constexpr std::uint64_t kDeviceControl = 1U << 15U;
  constexpr std::uint64_t kBindAndConnect = 3;
  constexpr std::uint64_t kAbstractSocketsAndSignals = 3;
  return {(kFirst & ~kReading) | (version >= 2 ? kRefer : 0) | (version >= 3 ? kTruncate : 0) |
              (version >= 5 ? kDeviceControl : 0),
          version >= 4 ? kBindAndConnect : 0, version >= 6 ? kAbstractSocketsAndSignals : 0};
}

int enter_landlock() {
  const auto version =
      syscall(SYS_landlock_create_ruleset, nullptr, 0, LANDLOCK_CREATE_RULESET_VERSION);
  if (version < 0) return errno;
  const auto rights = rights_of(static_cast<int>(version));
  const std::size_t size = version >= 6   ? sizeof(Ruleset)
                           : version >= 4 ? offsetof(Ruleset, scopes)
                                          : offsetof(Ruleset, network);
  const auto ruleset = syscall(SYS_landlock_create_ruleset, &rights, size, 0);
  if (ruleset < 0) return errno;
  const int error = syscall(SYS_landlock_restrict_self, ruleset, 0) == 0 ? 0 : errno;
  close(static_cast<int>(ruleset));
  return error;
}

/// What readers of files ask of the kernel, under its names on all machines.
constexpr int kAllowed[] = {
    // Files that are open already, and what is known of others.
    SCMP_SYS(read),
    SCMP_SYS(pread64),
    SCMP_SYS(readv),
    SCMP_SYS(preadv),
    SCMP_SYS(write),
    SCMP_SYS(writev),
    SCMP_SYS(close),
    SCMP_SYS(lseek),
    SCMP_SYS(_llseek),
    SCMP_SYS(fadvise64),
    SCMP_SYS(fadvise64_64),
    SCMP_SYS(readahead),
    SCMP_SYS(dup),
    SCMP_SYS(stat),
    SCMP_SYS(stat64),
    SCMP_SYS(lstat),
    SCMP_SYS(lstat64),
    SCMP_SYS(fstat),
    SCMP_SYS(fstat64),
    SCMP_SYS(newfstatat),
    SCMP_SYS(fstatat64),
    SCMP_SYS(statx),
    SCMP_SYS(statfs),
    SCMP_SYS(statfs64),
    SCMP_SYS(fstatfs),
    SCMP_SYS(fstatfs64),
    SCMP_SYS(access),
    SCMP_SYS(faccessat),
    SCMP_SYS(faccessat2),
    SCMP_SYS(readlink),
    SCMP_SYS(readlinkat),
    SCMP_SYS(getcwd),
    SCMP_SYS(getdents),
    SCMP_SYS(getdents64),
    SCMP_SYS(poll),
    SCMP_SYS(ppoll),
    SCMP_SYS(ppoll_time64),
    // Memory.
    SCMP_SYS(brk),
    SCMP_SYS(mmap),
    SCMP_SYS(mmap2),
    SCMP_SYS(munmap),
    SCMP_SYS(mremap),
    SCMP_SYS(mprotect),
    SCMP_SYS(madvise),
    // By a pipe the sanitizers find out whether memory can be read.
    SCMP_SYS(pipe),
    SCMP_SYS(pipe2),
    // Time and the process itself.
    SCMP_SYS(clock_gettime),
    SCMP_SYS(clock_gettime64),
    SCMP_SYS(clock_getres),
    SCMP_SYS(clock_getres_time64),
    SCMP_SYS(gettimeofday),
    SCMP_SYS(time),
    SCMP_SYS(nanosleep),
    SCMP_SYS(clock_nanosleep),
    SCMP_SYS(clock_nanosleep_time64),
    SCMP_SYS(futex),
    SCMP_SYS(futex_time64),
    SCMP_SYS(sched_yield),
    SCMP_SYS(sched_getaffinity),
    SCMP_SYS(getcpu),
    SCMP_SYS(sysinfo),
    SCMP_SYS(uname),
    SCMP_SYS(getrandom),
    SCMP_SYS(getpid),
    SCMP_SYS(gettid),
    SCMP_SYS(getuid),
    SCMP_SYS(geteuid),
    SCMP_SYS(getgid),
    SCMP_SYS(getegid),
    SCMP_SYS(getrusage),
    SCMP_SYS(getrlimit),
    SCMP_SYS(ugetrlimit),
    SCMP_SYS(setrlimit),
    SCMP_SYS(rt_sigaction),
    SCMP_SYS(rt_sigprocmask),
    SCMP_SYS(rt_sigreturn),
    SCMP_SYS(sigreturn),
    SCMP_SYS(sigaltstack),
    SCMP_SYS(restart_syscall),
    SCMP_SYS(exit),
    SCMP_SYS(exit_group),
};

int add_rules(scmp_filter_ctx filter) {
  constexpr scmp_datum_t kWriting = O_ACCMODE | O_CREAT | O_TRUNC;
  const auto allow = [filter](int call, auto... conditions) {
    return seccomp_rule_add(filter, SCMP_ACT_ALLOW, call, sizeof...(conditions), conditions...);
  };
  for (const int call : kAllowed) {
    if (const int error = allow(call); error != 0) return error;
  }
  for (const int command : {F_GETFD, F_SETFD, F_GETFL, F_DUPFD_CLOEXEC}) {
    for (const int call : {SCMP_SYS(fcntl), SCMP_SYS(fcntl64)}) {
      const auto number = static_cast<scmp_datum_t>(command);
      if (const int error = allow(call, SCMP_A1(SCMP_CMP_EQ, number)); error != 0) return error;
    }
  }
  const auto self = static_cast<scmp_datum_t>(getpid());
  for (const int error : {allow(SCMP_SYS(open), SCMP_A1(SCMP_CMP_MASKED_EQ, kWriting, O_RDONLY)),
                          allow(SCMP_SYS(openat), SCMP_A2(SCMP_CMP_MASKED_EQ, kWriting, O_RDONLY)),
                          allow(SCMP_SYS(prlimit64), SCMP_A0(SCMP_CMP_EQ, 0)),
                          // How a process aborts.
                          allow(SCMP_SYS(tgkill), SCMP_A0(SCMP_CMP_EQ, self))}) {
    if (error != 0) return error;
  }
  return 0;
}

int enter_filter() {
  // As an old kernel answers what it does not know: libraries then fall back to older calls.
  const std::unique_ptr<void, decltype(&seccomp_release)> filter(
      seccomp_init(SCMP_ACT_ERRNO(ENOSYS)), seccomp_release);
  if (!filter) return ENOMEM;
  // A search instead of a walk for each call; older libraries only walk.
  constexpr std::uint32_t kSearch = 2;
  seccomp_attr_set(filter.get(), SCMP_FLTATR_CTL_OPTIMIZE, kSearch);
  int error = add_rules(filter.get());
  if (error == 0) error = seccomp_load(filter.get());
  return -error;
}

int leave_network() { return unshare(CLONE_NEWNET) == 0 ? 0 : errno; }

/// Collects what holds and what does not.
class Measures {
 public:
  bool take(const char* name, int error) {
    if (error == 0) {
      held_ += (held_.empty() ? "" : ", ") + std::string(name);
    } else {
      refused_ +=
          (refused_.empty() ? "" : ", ") + std::string(name) + " (" + std::strerror(error) + ")";
    }
    return error == 0;
  }
  std::string text() const {
    if (refused_.empty()) return held_;
    return held_ + (held_.empty() ? "" : "; ") + "refused: " + refused_;
  }

 private:
  std::string held_;
  std::string refused_;
};

}  // namespace

void limit_process(std::uint64_t memory_bytes) {
  // Files that a library maps are no memory of the process, so its address space tells nothing.
  // The sanitizers' own memory is terabytes.
#ifndef __SANITIZE_ADDRESS__
  limit(RLIMIT_DATA, memory_bytes);
#else
  static_cast<void>(memory_bytes);
#endif
  constexpr rlim_t kDescriptors = 64;
  limit(RLIMIT_NOFILE, kDescriptors);
  limit(RLIMIT_CORE, 0);
  limit(RLIMIT_FSIZE, 0);
  limit(RLIMIT_NPROC, 0);
  const int score = open("/proc/self/oom_score_adj", O_WRONLY | O_CLOEXEC);
  if (score >= 0) {
    constexpr std::string_view kSooner = "300";
    static_cast<void>(!write(score, kSooner.data(), kSooner.size()));
    close(score);
  }
  prctl(PR_SET_PDEATHSIG, SIGKILL, 0, 0, 0);
}

void limit_processor_time(std::chrono::seconds time) {
  // Most files take next to none.
  static rlim_t last = 0;
  timespec used{};
  rlimit now{};
  if (clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &used) != 0) return;
  const auto wanted = static_cast<rlim_t>(used.tv_sec + time.count() + 1);
  if (wanted == last || getrlimit(RLIMIT_CPU, &now) != 0) return;
  now.rlim_cur = std::min(wanted, now.rlim_max);
  if (setrlimit(RLIMIT_CPU, &now) == 0) last = wanted;
}

std::string enter_sandbox() {
  Measures measures;
  measures.take("no new privileges", refuse_new_privileges());
  measures.take("no capabilities", drop_capabilities());
  measures.take("Landlock", enter_landlock());
  if (!measures.take("seccomp", enter_filter())) {
    measures.take("no network", leave_network());
  }
  return measures.text();
}

}  // namespace mediidx::tool
