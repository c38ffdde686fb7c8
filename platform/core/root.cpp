// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

#include <array>
#include <cstring>

#include "border.h"

namespace {

std::array<char, 4096> platform_root{};

}  // namespace

extern "C" int TAVOPlatformRootSet(const char* root) {
  const char* text = root ? root : "";
  const std::size_t length = std::strlen(text);
  if (length >= platform_root.size()) {
    return mediidx::platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "root.cpp", 1);
  }
  // The text may be the buffer itself: TAVOPlatformRootSet(TAVOPlatformRootGet()).
  std::memmove(platform_root.data(), text, length + 1);
  return 0;
}

extern "C" const char* TAVOPlatformRootGet(void) { return platform_root.data(); }
