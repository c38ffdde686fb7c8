// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The worker's side: the command itself, started anew to read tags and nothing else.
#ifndef MEDIIDX_TOOL_WORKERS_WORKER_MAIN_H_
#define MEDIIDX_TOOL_WORKERS_WORKER_MAIN_H_

#include <string>
#include <vector>

namespace mediidx::tool {

/// The command's first word for a worker, no verb of people; behind it stand the memory in bytes
/// and the processor seconds of a file.
inline constexpr const char* kWorkerWord = "--tag-worker";
/// The socket to the parent.
inline constexpr int kWorkerChannel = 3;

bool is_tag_worker(const std::vector<std::string>& words);

/// Reads files until the parent closes the channel. Leaves without the usual end of a program.
[[noreturn]] void run_tag_worker(const std::vector<std::string>& words);

}  // namespace mediidx::tool

#endif
