// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "mount_table.h"

#include "fuzz.h"

/// A path, and the kernel's table.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  fuzz::Input input(data, size);
  const auto path = input.text();
  const auto mounts = platform::parse_mounts(input.rest());
  for (const auto& mount : mounts) {
    fuzz::check(mount.point.starts_with('/') && !mount.type.empty());
  }
  const auto* mount = platform::find_mount(mounts, path);
  fuzz::check(!mount || path.starts_with(mount->point));
  fuzz::check(platform::is_remote(input.rest(), path) ==
              (mount && platform::is_remote_type(mount->type)));
  return 0;
}
