// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What a process gives up before it reads files that strangers made.
#ifndef MEDIIDX_TOOL_WORKERS_SANDBOX_H_
#define MEDIIDX_TOOL_WORKERS_SANDBOX_H_

#include <chrono>
#include <cstdint>
#include <string>

namespace mediidx::tool {

/// The limits of the process: memory of its own, no files written, no memory images, few
/// descriptors; sooner to go when the machine is short of memory, and gone with the thread that
/// started it.
void limit_process(std::uint64_t memory_bytes);

/// From now on so much processor time is left, give or take a second; then SIGXCPU.
void limit_processor_time(std::chrono::seconds time);

/// Leaves the process able to read files and to go on with the descriptors that it has, and little
/// else: no network, no programs, no processes, no writing. Each measure is taken as far as the
/// kernel knows it. Returns those that hold and, behind "refused:", those that do not and why.
std::string enter_sandbox();

}  // namespace mediidx::tool

#endif
