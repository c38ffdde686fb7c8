// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// A connection pooler between a program and a server.
#ifndef MEDIIDX_TESTS_SUPPORT_POOLER_H_
#define MEDIIDX_TESTS_SUPPORT_POOLER_H_

#include <sys/types.h>

#include <filesystem>
#include <string>

namespace mediidx::test {

/// pgbouncer with a session of the server for each session of a client; stopped with the object.
class Pooler {
 public:
  /// In front of the server whose socket is in this folder.
  explicit Pooler(const std::filesystem::path& server);
  ~Pooler();
  Pooler(const Pooler&) = delete;
  Pooler& operator=(const Pooler&) = delete;

  /// The folder of its own socket.
  std::filesystem::path socket_folder() const { return folder_ / "run"; }
  /// From now on in front of another server.
  void turn_to(const std::filesystem::path& server);

 private:
  void configure(const std::filesystem::path& server) const;
  void wait_until_ready();

  std::filesystem::path folder_;
  pid_t process_ = 0;
};

}  // namespace mediidx::test

#endif
