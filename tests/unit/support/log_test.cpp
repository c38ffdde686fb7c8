// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "support/log.h"

#include <gtest/gtest.h>
#include <syslog.h>

#include <cerrno>
#include <new>
#include <stdexcept>
#include <string>

#include "log_recorder.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

using test::LogLine;

constexpr Log kLog{"module"};

class LogTest : public testing::Test {
 protected:
  LogTest() { test::clear_log(); }

  static LogLine only_line() {
    EXPECT_EQ(test::logged().size(), 1U);
    return test::logged().empty() ? LogLine{-1, ""} : test::logged().front();
  }
};

using ALogLine = LogTest;

TEST_F(ALogLine, HasItsLineBehindAColon) {
  kLog.colon(42, "Failed at [%s] (%d)", "a/b", 7);

  EXPECT_EQ(only_line(), (LogLine{LOG_ERR, "module:42 Failed at [a/b] (7)"}));
}

TEST_F(ALogLine, HasItsLineInParentheses) {
  kLog.parens(42, "Failed at [%s]", "a/b");

  EXPECT_EQ(only_line(), (LogLine{LOG_ERR, "module (42) Failed at [a/b]"}));
}

TEST_F(ALogLine, HasItsLineInTightParentheses) {
  kLog.tight(42, "Failed");

  EXPECT_EQ(only_line(), (LogLine{LOG_ERR, "module(42)Failed"}));
}

TEST_F(ALogLine, MayBeANote) {
  kLog.note(42, "Done %d", 3);

  EXPECT_EQ(only_line(), (LogLine{LOG_INFO, "module:42 Done 3"}));
}

TEST_F(ALogLine, TakesItsShapeAsAValue) {
  kLog.error(LogShape::kTight, 42, "Failed");

  EXPECT_EQ(only_line(), (LogLine{LOG_ERR, "module(42)Failed"}));
}

TEST_F(ALogLine, HoldsValuesOfAnyLengthAsTheyAre) {
  const auto value = std::string(5000, 'x') + "%s%n";

  kLog.colon(1, "[%s]", value.c_str());

  EXPECT_EQ(only_line().text, "module:1 [" + value + "]");
}

TEST_F(ALogLine, LeavesTheErrorNumberAlone) {
  errno = EBUSY;

  kLog.colon(1, "Failed");

  EXPECT_EQ(errno, EBUSY);
}

using TheBorder = LogTest;

TEST_F(TheBorder, ReturnsWhatItsBodyReturns) {
  EXPECT_EQ(no_throw(kLog, -1, [] { return 5; }), 5);
  EXPECT_TRUE(test::logged().empty());
}

TEST_F(TheBorder, LogsAnExceptionOnce) {
  EXPECT_EQ(no_throw(kLog, -1, []() -> int { throw std::runtime_error("100%s"); }), -1);

  EXPECT_EQ(only_line(), (LogLine{LOG_ERR, "module:1 Unexpected failure: 100%s"}));
}

TEST_F(TheBorder, LetsNothingElsePassEither) {
  EXPECT_EQ(no_throw(kLog, -1, []() -> int { throw 7; }), -1);

  EXPECT_EQ(only_line(), (LogLine{LOG_ERR, "module:1 Unexpected failure"}));
}

}  // namespace
}  // namespace mediidx
