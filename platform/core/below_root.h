// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Where the system files that the platform names itself are looked up.
#ifndef TAVOCORE_BELOW_ROOT_H_
#define TAVOCORE_BELOW_ROOT_H_

#include <tavocore.h>

#include <string>
#include <string_view>

namespace mediidx::platform {

/// An absolute system path below the root that was set.
inline std::string below_root(std::string_view path) {
  return std::string(TAVOPlatformRootGet()).append(path);
}

}  // namespace mediidx::platform

#endif
