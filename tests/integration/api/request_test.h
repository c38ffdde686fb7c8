// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the tests of the requests have in common.
#ifndef MEDIIDX_TESTS_API_REQUEST_TEST_H_
#define MEDIIDX_TESTS_API_REQUEST_TEST_H_

#include <gmock/gmock.h>
#include <json/value.h>

#include <string>
#include <string_view>
#include <vector>

#include "database.h"
#include "mediidx/request.h"

namespace mediidx::test {

using Info = __tag_TAVO_MEDIA_INFO;
using testing::ElementsAre;
using testing::IsEmpty;

/// What the test program's own platform calls answer; they stand before the platform's and pass on
/// what they are not told to answer.
struct PlatformAnswers {
  std::string remote_mount;       ///< Paths that begin with it are on a remote mount.
  bool home_check_fails = false;  ///< TAVOServiceHomePathCheck gives -1.
  std::string home_user;          ///< The user in whose home every path lies.
};
PlatformAnswers& platform_answers();

Info record(std::string_view path);
DIR_INFO_REC folder_record(std::string_view path);
Json::Value json_record(const std::string& path);

/// Logged lines with the number that a message carries as "N": "mediidx:N Bad parameter".
std::vector<std::string> log_lines();

/// The requests against a real database. A share "media" is indexed for every kind, and nothing
/// else.
class RequestTest : public DatabaseTest {
 protected:
  RequestTest();
  ~RequestTest() override;

  /// A path in the indexed share, its file not made.
  std::string shared(const std::string& name) const { return root.at("volume1/media/" + name); }
  /// A path in no index folder.
  std::string outside(const std::string& name) const { return root.at("volume1/other/" + name); }
  /// Renames a table away, so that statements on it fail.
  void take_away(const std::string& table);
  std::vector<std::string> paths(const std::string& table);
};

/// The helpers that need no database.
class HelperTest : public testing::Test {
 protected:
  HelperTest();
  ~HelperTest() override;

  ScratchRoot root;
};

}  // namespace mediidx::test

#endif
