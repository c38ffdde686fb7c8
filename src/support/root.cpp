// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "support/root.h"

#include <climits>
#include <cstring>

#include "mediidx/root.h"

namespace {

// Fixed storage: set once by a program's start, and no destructor may run before the last request.
char g_root[PATH_MAX];

}  // namespace

extern "C" int TAVOMediaIndexRootSet(const char* root) {
  if (!root) root = "";
  const auto length = std::strlen(root);
  if (length >= sizeof(g_root)) return -1;
  std::memcpy(g_root, root, length + 1);
  return 0;
}

namespace mediidx {

std::string below_root(const char* path) { return std::string(g_root) + path; }

}  // namespace mediidx
