// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// mediidx: the media index on the command line.
#include <clocale>
#include <string>
#include <vector>

#include "cli/interrupt.h"
#include "cli/verbs.h"

int main(int argc, char** argv) {
  // Only for the width of characters; everything else stays as programs read it.
  std::setlocale(LC_CTYPE, "C.UTF-8");
  mediidx::tool::note_signals();
  return mediidx::tool::run_command(std::vector<std::string>(argv + 1, argv + argc));
}
