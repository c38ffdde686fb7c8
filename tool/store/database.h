// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The database of one command, ready for use.
#ifndef MEDIIDX_TOOL_STORE_DATABASE_H_
#define MEDIIDX_TOOL_STORE_DATABASE_H_

#include <tavodb.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "store/data_folder.h"
#include "store/private_server.h"

namespace mediidx::tool {

/// True when the environment names a server of the user's.
bool has_configured_server();

/// The rows of a query, walked once.
class Rows {
 public:
  explicit Rows(tavodb_result* result) : result_(result) {}

  bool next();
  /// Empty for null.
  std::string text(const char* column) const;

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
  /// Throws std::runtime_error.
  explicit Database(const DataFolder& folder);
  ~Database();
  Database(const Database&) = delete;
  Database& operator=(const Database&) = delete;

  /// Runs one query. Throws std::runtime_error with the server's message.
  Rows query(const std::string& sql);
  /// Runs statements; throws likewise.
  void run(const std::string& sql);
  /// False when the server no longer answers.
  bool answers();
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

  std::unique_ptr<PrivateServer> server_;
  bool was_changed_ = false;
};

/// The statements of the schema without the comments between them.
std::string schema_statements(std::string_view schema);

}  // namespace mediidx::tool

#endif
