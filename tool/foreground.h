// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Programs that take over the terminal for a while.
#ifndef MEDIIDX_TOOL_FOREGROUND_H_
#define MEDIIDX_TOOL_FOREGROUND_H_

#include <string>
#include <vector>

namespace mediidx::tool {

/// Runs a program of the PATH to its end, on this process's own input and outputs and without a
/// shell; its exit status, 128 + signal when one ended it. Throws std::system_error when it cannot
/// be started.
int run_in_foreground(const std::vector<std::string>& arguments);

}  // namespace mediidx::tool

#endif
