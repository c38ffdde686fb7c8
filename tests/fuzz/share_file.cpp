// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "share_file.h"

#include <tavosdk.h>

#include <array>
#include <memory>

#include "fuzz.h"
#include "scratch.h"

/// A path or name, and the file of shares.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace mediidx;
  static const test::ScratchRoot root;
  fuzz::Input input(data, size);
  const auto wanted = input.text();
  root.write("usr/tavo/etc/share.conf", input.rest());
  const auto shares = platform::read_shares();
  for (const auto& share : shares) {
    fuzz::check(fuzz::is_terminated(share.name) && share.name[0] != '\0');
    fuzz::check(fuzz::is_terminated(share.path) && share.path[0] == '/');
    TAVOSHARE* found = nullptr;
    fuzz::check(TAVOShareGet(share.name, &found) == 0);
    const std::unique_ptr<TAVOSHARE, decltype(&TAVOShareFree)> owner(found, TAVOShareFree);
    fuzz::check(std::string_view(found->path) == share.path);
  }
  std::array<char, 32> volume;
  volume.fill('x');
  const int result = TAVOShareBinPathGet(wanted.c_str(), volume.data(), volume.size());
  if (result == 0) fuzz::check(wanted.starts_with(volume.data()));
  if (shares.empty()) return 0;

  // One share's record is written back, and nothing else changes.
  auto changed = shares.front();
  changed.status ^= TAVOSHARE_STATUS_INDEXED;
  fuzz::check(TLIBShareUpdate(&changed) == 0);
  const auto after = platform::read_shares();
  fuzz::check(after.size() == shares.size());
  for (std::size_t i = 0; i < shares.size(); ++i) {
    fuzz::check(std::string_view(after[i].path) == shares[i].path);
    fuzz::check(after[i].status == (i == 0 ? changed.status : shares[i].status));
  }
  return 0;
}
