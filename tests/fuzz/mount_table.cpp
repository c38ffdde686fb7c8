// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mount_table.h"

#include "fuzz.h"

/// The id of a mount, and the kernel's table.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  fuzz::Input input(data, size);
  const int id = static_cast<int>(std::strtol(input.text().c_str(), nullptr, 10));
  const auto table = input.rest();
  const auto type = platform::find_mount_type(table, id);
  fuzz::check(type.empty() || (type.data() >= table.data() &&
                               type.data() + type.size() <= table.data() + table.size()));
  fuzz::check(type.find_first_of(" \n") == type.npos);
  // Other mounts before it make no difference.
  const auto other = id == 1 ? std::string("2 0 0:1 / / rw - nfs a rw\n")
                             : std::string("1 0 0:1 / / rw - nfs a rw\n");
  const auto longer = other + std::string(table);
  fuzz::check(platform::find_mount_type(longer, id) == type);
  platform::RemoteMounts mounts;
  fuzz::check(mounts.learn(7, type) == platform::is_remote_type(type));
  fuzz::check(mounts.find(7).value_or(false) == platform::is_remote_type(type));
  return 0;
}
