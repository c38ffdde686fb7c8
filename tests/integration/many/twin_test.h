// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Two databases with one content: what is added together to one is added one by one to the other.
#ifndef MEDIIDX_TESTS_MANY_TWIN_TEST_H_
#define MEDIIDX_TESTS_MANY_TWIN_TEST_H_

#include <gmock/gmock.h>
#include <json/value.h>

#include <array>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "database.h"
#include "mediidx/request.h"

namespace mediidx::test {

using Info = __tag_TAVO_MEDIA_INFO;

/// Which database the library is on: the server's "mediaserver", or its twin.
enum class Side { kTogether, kOneByOne };

/// What the test program does to the platform's calls that it stands before.
struct PlatformCalls {
  int connects = 0;
  int statements = 0;  ///< Sent by any of the calls.
  /// Called with each statement before it is sent; false makes it fail.
  std::function<bool(std::string_view sql)> before_statement;
};
PlatformCalls& platform_calls();

Info record(std::string_view path);
DIR_INFO_REC folder_record(std::string_view path);

template <std::size_t kSize>
void set(char (&field)[kSize], std::string_view text) {
  field[text.copy(field, kSize - 1)] = '\0';
}

/// What one way of adding gave back.
struct Given {
  std::vector<int> results;
  int result = 0;
  std::vector<std::string> log;  ///< Sorted: a batch says the same in another order.
};

/// A share "media" is indexed for every kind, and so is the music folder of the user ann. Files
/// named remote.mp3 are on a remote mount.
class TwinTest : public DatabaseTest {
 protected:
  TwinTest();
  ~TwinTest() override;

  std::string shared(const std::string& name) const { return root.at("volume1/media/" + name); }
  std::string personal(const std::string& name) const { return root.at("homes/ann/music/" + name); }
  std::string outside(const std::string& name) const { return root.at("volume1/other/" + name); }

  /// From here on the library is on this database.
  void use(Side side);
  /// Every row of every table without its ids, sorted.
  std::vector<std::string> content(Side side);
  /// Deletes every row of both.
  void empty_both();

  /// Adds records to both sides, and checks that results and records are the same.
  Given add_to_both(std::vector<Info>& records, MEDIA_TABLE_TYPE type);
  Given add_to_both(const Json::Value& array, MEDIA_TABLE_TYPE type);
  Given add_to_both(const std::vector<DIR_INFO_REC>& folders);
  void expect_same_content();

  static bool fell_back(const Given& given);

 private:
  /// Runs both ways, each on its side, and compares.
  Given run_both(std::size_t count, const std::function<int(int*)>& together,
                 const std::function<int(std::size_t)>& one);
  std::vector<std::string> select(Side side, const char* sql);

  Side side_ = Side::kTogether;
  std::array<struct tavodb_connection*, 2> connections_{};
};

}  // namespace mediidx::test

#endif
