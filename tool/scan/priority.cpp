// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/priority.h"

#include <sched.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace mediidx::tool {
namespace {

// As ioprio_set(2) has them; no header of the C library does.
constexpr int kWhoProcess = 1;
constexpr int kClassIdle = 3;
constexpr int kClassShift = 13;

}  // namespace

void become_idle() {
  const sched_param none{};
  sched_setscheduler(0, SCHED_IDLE, &none);
  syscall(SYS_ioprio_set, kWhoProcess, 0, kClassIdle << kClassShift);
}

}  // namespace mediidx::tool
