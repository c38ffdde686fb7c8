// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Looking shares up.
#ifndef MEDIIDX_SUPPORT_SHARE_H_
#define MEDIIDX_SUPPORT_SHARE_H_

#include "support/owned.h"

namespace mediidx {

/// The share of this name; null when there is none.
inline OwnedShare find_share(const char* name) {
  OwnedShare share;
  const int result = TAVOShareGet(name, out(share));
  if (result != 0) share.reset();
  return share;
}

}  // namespace mediidx

#endif
