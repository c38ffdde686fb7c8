// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The database server that the command runs for itself.
#ifndef MEDIIDX_TOOL_STORE_PRIVATE_SERVER_H_
#define MEDIIDX_TOOL_STORE_PRIVATE_SERVER_H_

#include <filesystem>
#include <string>

#include "postgres_server.h"
#include "store/data_folder.h"

namespace mediidx::tool {

/// The folder for the server's socket: `folder`/run where a socket's address has room for it, else
/// a folder of the user's own below $XDG_RUNTIME_DIR or /tmp, named after `folder`.
std::filesystem::path socket_folder_for(const std::filesystem::path& folder);

/// One command's use of the private server. It is made and started when needed. Every user holds a
/// shared lock on "server.lock"; the last one out stops the server if a mediidx started it (then
/// "server.started" is there), also when the one that started it was killed. "start.lock" is held
/// while that is decided.
class PrivateServer {
 public:
  /// Throws std::runtime_error.
  explicit PrivateServer(const std::filesystem::path& data_folder);
  ~PrivateServer();
  PrivateServer(const PrivateServer&) = delete;
  PrivateServer& operator=(const PrivateServer&) = delete;

  const std::filesystem::path& socket_folder() const { return server_.socket_folder(); }

 private:
  void check_account_enters(const std::filesystem::path& data_folder) const;
  void leave();

  FileLock start_lock_;
  FileLock use_lock_;
  std::filesystem::path started_marker_;
  PostgresServer server_;
};

}  // namespace mediidx::tool

#endif
