// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Looking after the database: vacuum, reset, and a way in.
#include <poll.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>

#include "cli/interrupt.h"
#include "cli/output.h"
#include "cli/verbs.h"
#include "foreground.h"
#include "mediidx/database.h"
#include "store/data_folder.h"
#include "store/database.h"

namespace mediidx::tool {
namespace {

/// A line of standard input without its end; what there is of it when the input ends or a signal
/// came.
std::string read_line() {
  std::string line;
  for (;;) {
    pollfd input{STDIN_FILENO, POLLIN, 0};
    // Unlike a read, a poll is ended by a signal.
    if (poll(&input, 1, -1) < 0) return errno == EINTR ? "" : line;
    char c = 0;
    if (read(STDIN_FILENO, &c, 1) != 1 || c == '\n') return line;
    line += c;
  }
}

bool is_confirmed(const Database& database) {
  std::fprintf(stderr,
               "This empties the index %s; media files and personal libraries stay.\n"
               "Type yes to go on: ",
               database.where().c_str());
  return read_line() == "yes";
}

[[noreturn]] void fail(const std::string& what, const Database& database) {
  const auto reason = database.last_error();
  throw std::runtime_error(what + (reason.empty() ? "" : ": " + reason));
}

}  // namespace

int run_db_vacuum(const Arguments& arguments) {
  const DataFolder folder(arguments.value("--data-dir"));
  const Database database(folder);
  if (MediaDBVacuum() != 0) fail("the database could not be vacuumed", database);
  return kExitDone;
}

int run_db_reset(const Arguments& arguments) {
  const DataFolder folder(arguments.value("--data-dir"));
  const Database database(folder);
  if (!arguments.has("--yes") && !is_confirmed(database)) {
    throw std::runtime_error("nothing was changed");
  }
  if (MediaInfoDBDeleteAll() != 0) fail("the database could not be emptied", database);
  return kExitDone;
}

int run_db_shell(const Arguments& arguments) {
  const DataFolder folder(arguments.value("--data-dir"));
  // Keeps a private server running for as long as psql does.
  const Database database(folder);
  std::vector<std::string> words{"psql", "--username=postgres", "--dbname=mediaserver"};
  if (const char* host = std::getenv("PGHOST")) words.push_back(std::string("--host=") + host);
  return run_in_foreground(words);
}

}  // namespace mediidx::tool
