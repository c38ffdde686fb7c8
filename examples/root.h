/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/* Away from an appliance its system files stand below a folder: that of "mediidx" is
 * ~/.local/share/mediidx/root. */
#ifndef EXAMPLES_ROOT_H_
#define EXAMPLES_ROOT_H_

#include <mediidx/root.h>
#include <stdlib.h>
#include <tavocore.h>

/* 0, or -1 when the name is too long. */
static inline int use_root(void) {
  const char* root = getenv("MEDIIDX_ROOT");
  if (TAVOMediaIndexRootSet(root) != 0) return -1;
  return TAVOPlatformRootSet(root);
}

#endif
