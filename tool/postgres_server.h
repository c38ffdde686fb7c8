// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A private PostgreSQL server: a cluster in a folder of its own, reached by a Unix socket only.
#ifndef MEDIIDX_TOOL_POSTGRES_SERVER_H_
#define MEDIIDX_TOOL_POSTGRES_SERVER_H_

#include <sys/types.h>

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "process.h"

namespace mediidx::tool {

/// The folder of the newest server programs below /usr/lib/postgresql. Throws std::runtime_error
/// when none are installed.
std::filesystem::path find_server_programs();

/// One cluster. PostgreSQL refuses to run as root, so root runs it as the system's `postgres` user.
class PostgresServer {
 public:
  /// `folder` holds everything: the cluster in "data", the socket in "run" (or in `socket_folder`,
  /// where one is given), messages in "server.log". It is created when missing.
  explicit PostgresServer(std::filesystem::path folder, std::filesystem::path socket_folder = {});

  /// Makes the cluster unless it is there: UTF-8, collation C, character types C.UTF-8, superuser
  /// `postgres`, trust inside the socket's folder. `quick` skips flushing it to disk. Throws
  /// std::runtime_error when it cannot, and when something else is in its place.
  void create(bool quick);
  /// Starts the server with these settings ("name=value") unless it runs. True when it was started.
  /// A server that runs tells where its socket is; that is then the socket folder. Throws
  /// std::runtime_error, also for a socket folder that others than its owner may enter.
  bool start(const std::vector<std::string>& settings);
  /// Ends sessions and stops the server; nothing happens when it does not run. Throws
  /// std::runtime_error when it goes on running.
  void stop();
  /// The process that serves the cluster, if it runs.
  std::optional<pid_t> running() const;
  /// The folder of the socket: libpq's host.
  const std::filesystem::path& socket_folder() const { return socket_folder_; }

  /// The longest name of a folder that the address of a socket in it can hold.
  static std::size_t longest_socket_folder();

 private:
  void make_folder(const std::filesystem::path& folder) const;
  /// What "postmaster.pid" tells of a server that runs.
  struct Status {
    pid_t pid = 0;
    bool ready = false;  ///< It accepts connections.
    std::filesystem::path socket_folder;
  };
  std::optional<Status> status() const;
  bool serves_cluster(pid_t pid) const;
  void launch(const std::vector<std::string>& settings);
  void wait_until_ready();

  std::filesystem::path folder_;
  std::filesystem::path data_;
  std::filesystem::path socket_folder_;
  std::filesystem::path log_;
  std::optional<Account> account_;
  pid_t child_ = 0;  ///< The server, when this object started it.
};

}  // namespace mediidx::tool

#endif
