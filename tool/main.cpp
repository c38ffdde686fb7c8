// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// mediidx: the media index on the command line.
#include <clocale>
#include <string>
#include <vector>

#include "cli/interrupt.h"
#include "cli/verbs.h"
#include "folders/programs.h"
#include "workers/worker_main.h"

int main(int argc, char** argv) {
  // Only for the width of characters; everything else stays as programs read it.
  std::setlocale(LC_CTYPE, "C.UTF-8");
  const std::vector<std::string> words(argv + (argc > 0 ? 1 : 0), argv + argc);
  if (mediidx::tool::is_tag_worker(words)) mediidx::tool::run_tag_worker(words);
  mediidx::tool::note_signals();
  const std::string program = argc > 0 ? argv[0] : "";
  if (const auto run = mediidx::tool::program_named(program)) {
    return mediidx::tool::run_guarded([&] { return run(program, words); });
  }
  return mediidx::tool::run_command(words);
}
