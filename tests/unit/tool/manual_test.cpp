// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// mediidx(1) tells of everything that the command line takes and gives.
#include <gtest/gtest.h>

#include <fstream>
#include <set>
#include <sstream>
#include <string>

#include "cli/verbs.h"

namespace mediidx::tool {
namespace {

std::string manual() {
  std::ostringstream out;
  out << std::ifstream(MEDIIDX_MANUAL).rdbuf();
  return out.str();
}

/// From the line that is `heading`, as far as it goes, to the next that begins with `next`.
std::string part(const std::string& text, const std::string& heading, const std::string& next) {
  const auto begin = text.find("\n" + heading);
  if (begin == std::string::npos) return {};
  const auto end = text.find("\n" + next, begin + heading.size());
  return text.substr(begin, end - begin);
}

/// What the manual says of a verb, its first line included.
std::string entry_of(const Verb& verb) {
  const auto text = part(manual(), ".Sh VERBS\n", ".Sh ") + "\n";
  for (const char* end : {"\n", " "}) {
    const auto entry = part(text, std::string(".It Cm ") + verb.name + end, ".It Cm ");
    if (!entry.empty()) return entry;
  }
  return {};
}

bool has_word(const std::string& text, const std::string& words) {
  const auto at = text.find(words);
  if (at == std::string::npos) return false;
  const auto end = at + words.size();
  return end == text.size() || text[end] == ' ' || text[end] == '\n';
}

TEST(TheManual, TellsOfEveryVerb) {
  for (const auto& verb : verbs()) {
    EXPECT_FALSE(entry_of(verb).empty()) << verb.name << " is missing in docs/man/mediidx.1";
  }
}

TEST(TheManual, TellsOfNoVerbThatIsNotThere) {
  std::istringstream lines(part(manual(), ".Sh VERBS\n", ".Sh "));
  std::set<std::string> named;
  for (std::string line; std::getline(lines, line);) {
    if (line.starts_with(".It Cm ")) named.insert(line.substr(7));
  }
  EXPECT_EQ(named.size(), verbs().size());
}

TEST(TheManual, TellsOfEveryOptionWithItsVerb) {
  for (const auto& verb : verbs()) {
    for (const auto& option : verb.options) {
      EXPECT_TRUE(has_word(entry_of(verb), std::string("Fl ") + (option.name + 1)))
          << verb.name << " " << option.name << " is missing in docs/man/mediidx.1";
    }
  }
  for (const auto& option : common_options()) {
    EXPECT_TRUE(has_word(part(manual(), ".Sh DESCRIPTION\n", ".Sh "),
                         std::string(".It Fl ") + (option.name + 1)))
        << option.name;
  }
}

TEST(TheManual, TellsOfEveryExitStatus) {
  const auto statuses = part(manual(), ".Sh EXIT STATUS\n", ".Sh ");
  for (int status = kExitDone; status <= kExitAlreadyRunning; ++status) {
    EXPECT_TRUE(has_word(statuses, ".It " + std::to_string(status))) << status;
  }
  EXPECT_TRUE(has_word(statuses, ".It " + std::to_string(kExitSignal) + " + Ar n"));
}

TEST(TheManual, TellsWhichVariablesNameAServer) {
  for (const auto* name : {"PGHOST", "PGHOSTADDR", "PGPORT", "PGSERVICE", "PGDATABASE"}) {
    EXPECT_TRUE(has_word(part(manual(), ".Sh ENVIRONMENT\n", ".Sh "), name)) << name;
  }
}

}  // namespace
}  // namespace mediidx::tool
