// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The root of this program's own system paths. The code that it shares with the library names them
// the same way, but the library's root is inside the library.
#include "store/root.h"

#include "support/root.h"

namespace mediidx {
namespace {

std::string& own_root() {
  static std::string root;
  return root;
}

}  // namespace

std::string below_root(const char* path) { return own_root() + path; }

namespace tool {

void set_own_root(const std::string& root) { own_root() = root; }

}  // namespace tool
}  // namespace mediidx
