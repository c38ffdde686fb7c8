// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "process.h"

#include <fcntl.h>
#include <grp.h>
#include <pwd.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>

namespace mediidx::tool {
namespace {

constexpr int kCannotExec = 127;

[[noreturn]] void become_program(char* const* arguments, const char* log,
                                 const std::optional<Account>& account) {
  setsid();
  if (account && (initgroups(account->name.c_str(), account->gid) != 0 ||
                  setgid(account->gid) != 0 || setuid(account->uid) != 0)) {
    _exit(kCannotExec);
  }
  // A folder that the account may not enter would make programs complain.
  if (chdir("/") != 0) _exit(kCannotExec);
  const int input = open("/dev/null", O_RDONLY);
  const int output = open(log, O_WRONLY | O_CREAT | O_APPEND, 0600);
  if (input < 0 || output < 0) _exit(kCannotExec);
  dup2(input, STDIN_FILENO);
  dup2(output, STDOUT_FILENO);
  dup2(output, STDERR_FILENO);
  close_range(STDERR_FILENO + 1, ~0U, 0);
  execv(arguments[0], arguments);
  _exit(kCannotExec);
}

}  // namespace

std::optional<Account> find_account(const std::string& name) {
  const passwd* entry = getpwnam(name.c_str());
  if (!entry) return std::nullopt;
  return Account{entry->pw_uid, entry->pw_gid, name};
}

pid_t start_program(const std::vector<std::string>& arguments, const std::string& log,
                    const std::optional<Account>& account) {
  std::vector<char*> pointers;
  pointers.reserve(arguments.size() + 1);
  for (const auto& argument : arguments) pointers.push_back(const_cast<char*>(argument.c_str()));
  pointers.push_back(nullptr);
  const pid_t child = fork();
  if (child < 0) throw std::system_error(errno, std::generic_category(), "fork");
  if (child == 0) become_program(pointers.data(), log.c_str(), account);
  return child;
}

int run_program(const std::vector<std::string>& arguments, const std::string& log,
                const std::optional<Account>& account) {
  const pid_t child = start_program(arguments, log, account);
  int status = 0;
  while (waitpid(child, &status, 0) < 0) {
    if (errno != EINTR) throw std::system_error(errno, std::generic_category(), "waitpid");
  }
  return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

}  // namespace mediidx::tool
