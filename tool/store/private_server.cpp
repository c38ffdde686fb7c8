// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "store/private_server.h"

#include <unistd.h>

#include <array>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <fstream>
#include <stdexcept>

#include "process.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

/// An index can be made again from the media: no commit waits for the disk. What is on disk is
/// consistent all the same.
const std::vector<std::string> kSettings{
    "synchronous_commit=off",
    "jit=off",
};

/// FNV-1a: the same name for the same folder in every version.
std::uint64_t hash_of(const std::string& text) {
  std::uint64_t hash = 14695981039346656037ULL;
  for (const char c : text) {
    hash = (hash ^ static_cast<unsigned char>(c)) * 1099511628211ULL;
  }
  return hash;
}

}  // namespace

fs::path socket_folder_for(const fs::path& folder) {
  const auto usual = folder / "run";
  if (usual.native().size() <= PostgresServer::longest_socket_folder()) return usual;
  std::array<char, 64> name;
  std::snprintf(name.data(), name.size(), "mediidx-%u-%016llx", geteuid(),
                static_cast<unsigned long long>(hash_of(folder.string())));
  // The user that root's server runs as may not enter root's own runtime folder.
  const char* runtime = geteuid() == 0 ? nullptr : std::getenv("XDG_RUNTIME_DIR");
  std::error_code ignored;
  const bool usable = runtime && runtime[0] == '/' && fs::is_directory(runtime, ignored);
  const auto below = fs::path(usable ? runtime : "/tmp") / name.data();
  if (below.native().size() <= PostgresServer::longest_socket_folder()) return below;
  return fs::path("/tmp") / name.data();
}

PrivateServer::PrivateServer(const fs::path& data_folder)
    : start_lock_(data_folder / "start.lock"),
      use_lock_(data_folder / "server.lock"),
      started_marker_(data_folder / "server.started"),
      server_(data_folder / "postgres", socket_folder_for(data_folder / "postgres")) {
  start_lock_.own();
  use_lock_.share();
  try {
    if (!server_.running()) {
      check_account_enters(data_folder);
      server_.create(/*quick=*/false);
      std::ofstream(started_marker_) << "A mediidx started the server that runs.\n";
    }
    server_.start(kSettings);
  } catch (...) {
    leave();
    throw;
  }
  start_lock_.release();
}

PrivateServer::~PrivateServer() {
  try {
    start_lock_.own();
    leave();
  } catch (const std::exception& error) {
    std::fprintf(stderr, "mediidx: %s\n", error.what());
  }
}

void PrivateServer::check_account_enters(const fs::path& data_folder) const {
  const auto account = geteuid() == 0 ? find_account("postgres") : std::nullopt;
  if (!account) return;
  if (run_program({"/usr/bin/test", "-x", data_folder}, "/dev/null", account) == 0) return;
  throw std::runtime_error("the user postgres, which runs root's database server, may not enter " +
                           data_folder.string() +
                           ": choose another --data-dir or open the folders above it");
}

/// With the start lock held.
void PrivateServer::leave() {
  use_lock_.release();
  if (!use_lock_.try_own() || !fs::exists(started_marker_)) return;
  server_.stop();
  fs::remove(started_marker_);
}

}  // namespace mediidx::tool
