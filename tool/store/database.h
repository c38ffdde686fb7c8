// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The database of one command, ready for use.
#ifndef MEDIIDX_TOOL_STORE_DATABASE_H_
#define MEDIIDX_TOOL_STORE_DATABASE_H_

#include <tavodb.h>

#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

#include "store/data_folder.h"
#include "store/private_server.h"

namespace mediidx::tool {

/// There is no database to work with.
struct NoDatabase : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// True when the environment names a server of the user's.
bool has_configured_server();

/// The rows of a query, walked once.
class Rows {
 public:
  explicit Rows(tavodb_result* result) : result_(result) {}

  /// Moves to the first row, then to the next one; false behind the last.
  bool next();
  /// Empty for null.
  std::string text(const char* column) const;
  /// 0 for null.
  std::int64_t number(const char* column) const;
  bool flag(const char* column) const { return text(column) == "t"; }
  bool is_null(const char* column) const;

 private:
  struct Free {
    void operator()(tavodb_result* result) const { TAVODBFreeResult(result); }
  };
  std::unique_ptr<tavodb_result, Free> result_;
  std::uint32_t row_ = 0;
};

/// The database "mediaserver" on the user's server or the private one: made and brought up to this
/// version's schema when it is not there, reached over the library's shared connection, which is
/// closed with the object.
class Database {
 public:
  /// Throws NoDatabase.
  explicit Database(const DataFolder& folder);
  ~Database();
  Database(const Database&) = delete;
  Database& operator=(const Database&) = delete;

  /// Runs one query. Throws std::runtime_error with the server's message.
  Rows query(const std::string& sql);
  /// Runs statements; throws likewise. The rows that the last one touched.
  int run(const std::string& sql);
  /// False when the server no longer answers.
  bool answers();
  /// Connects anew, starting the private server again if it is down; false when that fails.
  bool reconnect();
  /// Why the last statement failed; empty when it did not.
  std::string last_error() const;
  /// "mediaserver on the server at …", for people.
  std::string where() const;
  /// The version of the schema.
  int version();
  /// True when this object made the tables or brought them up to date.
  bool was_changed() const { return was_changed_; }

 private:
  void connect();
  void make_database();
  void apply_schema();

  void start_server();

  std::filesystem::path folder_;
  std::unique_ptr<PrivateServer> server_;
  bool was_changed_ = false;
};

/// The statements of the schema without the comments between them.
std::string schema_statements(std::string_view schema);

}  // namespace mediidx::tool

#endif
