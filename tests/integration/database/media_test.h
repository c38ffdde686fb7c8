// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What the tests of the media database have in common.
#ifndef MEDIIDX_TESTS_DATABASE_MEDIA_TEST_H_
#define MEDIIDX_TESTS_DATABASE_MEDIA_TEST_H_

#include <gmock/gmock.h>
#include <tavodb.h>

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "faults.h"
#include "mediidx/database.h"
#include "support/database.h"

namespace mediidx::test {

using Info = __tag_TAVO_MEDIA_INFO;
using Handle = std::unique_ptr<MEDIA_DB_HANDLE, decltype(&MediaInfoDBClose)>;

using testing::ElementsAre;
using testing::IsEmpty;

/// Writes a text into a field of a record, cut to it.
template <std::size_t Size>
void set(char (&field)[Size], std::string_view text) {
  field[text.copy(field, Size - 1)] = '\0';
}

/// A record that carries only a path.
Info record(std::string_view path);
DIR_INFO_REC folder(std::string_view path);

/// Logged lines with the number that a message carries as "N": "mediidx_database (N) Bad
/// parameter".
std::vector<std::string> log_lines();
/// The last of them; empty when nothing was logged.
std::string last_log_line();
/// The text that was sent last; empty when none was.
std::string last_statement();
/// Such a line as the database module logs it, in its two shapes.
std::string parens(const std::string& message);
std::string colon(const std::string& message);
/// The parens line of a statement that failed last on the shared connection.
std::string failed_statement(const std::string& sql);

class MediaTest : public DatabaseTest {
 protected:
  MediaTest();

  /// Renames a table away, so that statements on it fail.
  void take_away(const std::string& table);
  bool marked() const { return root.exists("tmp/tavoindexdaapd_checkin"); }
  void unmark() const;

  /// A path in a share that is indexed for everything, its file not made.
  std::string shared(const std::string& name);
  /// A path in the personal music library of the user 1026.
  std::string personal(const std::string& name);

 private:
  bool has_share_ = false;
  bool has_user_ = false;
};

/// While it lives no server is to be reached, and the shared connection is closed.
class NoServer {
 public:
  NoServer();
  ~NoServer();
  NoServer(const NoServer&) = delete;
  NoServer& operator=(const NoServer&) = delete;

 private:
  ScratchFolder empty_;
  std::string host_;
};

Handle open(MEDIA_TABLE_TYPE type, const char* columns = nullptr, const char* where = nullptr,
            const char* group_by = nullptr, const char* order_by = nullptr, uint32_t range_a = 0,
            uint32_t range_b = 0, int escape_where = 0);
/// The "path" of every row of a handle.
std::vector<std::string> paths(MEDIA_DB_HANDLE* handle);

}  // namespace mediidx::test

#endif
