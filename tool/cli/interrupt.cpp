// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "cli/interrupt.h"

#include <signal.h>

#include <initializer_list>

namespace mediidx::tool {
namespace {

volatile sig_atomic_t first_signal = 0;
volatile sig_atomic_t hangup = 0;
volatile sig_atomic_t user_signal = 0;

void note(int number) {
  if (first_signal == 0) first_signal = number;
}

void note_hangup(int) { hangup = 1; }
void note_question(int) { user_signal = 1; }

}  // namespace

void note_signals() {
  struct sigaction action{};
  action.sa_handler = note;
  action.sa_flags = SA_RESTART;
  for (const int number : {SIGINT, SIGTERM, SIGHUP}) {
    // What is ignored, as nohup does, stays ignored.
    struct sigaction current{};
    if (sigaction(number, nullptr, &current) == 0 && current.sa_handler == SIG_IGN) continue;
    sigaction(number, &action, nullptr);
  }
  signal(SIGPIPE, SIG_IGN);
  // Somebody wants to write a file on which there was a lease for a moment.
  signal(SIGIO, SIG_IGN);
}

int noted_signal() { return first_signal; }

void reload_on_hangup() {
  struct sigaction action{};
  action.sa_handler = note_hangup;
  action.sa_flags = SA_RESTART;
  sigaction(SIGHUP, &action, nullptr);
}

void answer_user_signal() {
  struct sigaction action{};
  action.sa_handler = note_question;
  action.sa_flags = SA_RESTART;
  sigaction(SIGUSR1, &action, nullptr);
}

bool take_user_signal() {
  if (user_signal == 0) return false;
  user_signal = 0;
  return true;
}

bool take_hangup() {
  if (hangup == 0) return false;
  hangup = 0;
  return true;
}

}  // namespace mediidx::tool
