// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Programs run without a shell, as another user where that is asked for.
#ifndef MEDIIDX_TOOL_PROCESS_H_
#define MEDIIDX_TOOL_PROCESS_H_

#include <sys/types.h>

#include <optional>
#include <string>
#include <vector>

namespace mediidx::tool {

/// A user of this system.
struct Account {
  uid_t uid;
  gid_t gid;
  std::string name;
};

/// The account of a name; empty when there is none.
std::optional<Account> find_account(const std::string& name);

/// Starts `arguments[0]` in a session of its own, standard input from nowhere and both outputs
/// appended to `log` (owned by whom the program runs as), as `account` when there is one. Returns
/// the process id. Throws std::system_error.
pid_t start_program(const std::vector<std::string>& arguments, const std::string& log,
                    const std::optional<Account>& account);

/// Runs such a program to its end; its exit status, 128 + signal when one ended it.
int run_program(const std::vector<std::string>& arguments, const std::string& log,
                const std::optional<Account>& account);

}  // namespace mediidx::tool

#endif
