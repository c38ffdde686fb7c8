// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Runs the tests of a program. A skipped test fails the run unless tests/allowed_skips.txt names
// it: a line "Suite.Test reason".
#include <gtest/gtest.h>

#include <cstdio>
#include <fstream>
#include <string>

namespace {

bool may_be_skipped(const std::string& name) {
  std::ifstream list(MEDIIDX_ALLOWED_SKIPS);
  for (std::string line; std::getline(list, line);) {
    if (line.starts_with(name + " ")) return true;
  }
  return false;
}

}  // namespace

int main(int argc, char** argv) {
  testing::InitGoogleTest(&argc, argv);
  int result = RUN_ALL_TESTS();
  const auto& run = *testing::UnitTest::GetInstance();
  for (int s = 0; s < run.total_test_suite_count(); ++s) {
    const auto& suite = *run.GetTestSuite(s);
    for (int t = 0; t < suite.total_test_count(); ++t) {
      const auto& test = *suite.GetTestInfo(t);
      const auto name = std::string(suite.name()) + "." + test.name();
      const bool left_out = (test.should_run() && test.result()->Skipped()) ||
                            name.find("DISABLED_") != std::string::npos;
      if (!left_out || may_be_skipped(name)) continue;
      std::fprintf(stderr, "skipped, and not among the allowed skips: %s\n", name.c_str());
      result = 1;
    }
  }
  return result;
}
