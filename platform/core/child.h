// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Child processes: started without a shell, waited for to the end.
#ifndef TAVOCORE_CHILD_H_
#define TAVOCORE_CHILD_H_

#include <sys/types.h>

#include <vector>

namespace mediidx::platform {

/// What a child's standard streams are connected to; -1 leaves one as it is.
struct ChildStreams {
  int output = -1;
  int input = -1;  ///< Read from nowhere when `input_from_nowhere`.
  bool input_from_nowhere = false;
};

struct StartedChild {
  pid_t pid = -1;
  int error = 0;  ///< errno of the start; 0 when the program runs.
};

/// Starts `arguments[0]`, a path. The child has default signal handling, no signal blocked, and no
/// descriptor but its three streams. An `exec` that fails is an error here, not in the child.
StartedChild start_child(const std::vector<const char*>& arguments, const ChildStreams& streams);

/// Waits for a child; its exit status, 128 + signal when one ended it, -1 when the status is lost
/// (a process that ignores SIGCHLD is not told).
int wait_for_child(pid_t pid);

}  // namespace mediidx::platform

#endif
