// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// PostgreSQL servers beside the one that the tests share, as if on machines of their own.
#ifndef MEDIIDX_TESTS_SUPPORT_MACHINE_H_
#define MEDIIDX_TESTS_SUPPORT_MACHINE_H_

#include <filesystem>
#include <memory>
#include <string>

namespace mediidx::test {

/// A server with a cluster of its own, gone with the object.
class Machine {
 public:
  /// One that holds nothing.
  static std::unique_ptr<Machine> alone();
  /// A hot standby of the server whose socket is in this folder: a copy, then what that one writes.
  static std::unique_ptr<Machine> standby_of(const std::filesystem::path& primary);
  ~Machine();
  Machine(const Machine&) = delete;
  Machine& operator=(const Machine&) = delete;

  const std::filesystem::path& socket_folder() const;
  /// Ends the server at once, as a loss of power does to it.
  void crash();
  /// Lets a standby fall behind: it takes nothing more from its primary.
  void follow_nobody();
  /// Makes a standby the primary, and waits for it.
  void promote();

 private:
  Machine();
  struct Parts;
  std::unique_ptr<Parts> parts_;
};

}  // namespace mediidx::test

#endif
