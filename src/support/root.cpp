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
  if (std::strlen(root) >= sizeof(g_root)) return -1;
  std::strcpy(g_root, root);
  return 0;
}

namespace mediidx {

std::string below_root(const char* path) { return std::string(g_root) + path; }

}  // namespace mediidx
