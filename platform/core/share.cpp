// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

#include "border.h"
#include "share_file.h"

namespace platform = mediidx::platform;

extern "C" int TLIBShareUpdate(const TAVOSHARE* share) {
  if (!share) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "share.cpp", 1);
  return platform::no_throw(-1, "share.cpp", 2,
                            [&] { return platform::write_share(*share) ? 0 : -1; });
}
