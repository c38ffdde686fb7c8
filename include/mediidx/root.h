/* SPDX-FileCopyrightText: The mediidx developers
 * SPDX-License-Identifier: MIT */

/// Where the library looks for the system's files.
#ifndef MEDIIDX_ROOT_H_
#define MEDIIDX_ROOT_H_

#include "mediidx/types.h"

#ifdef __cplusplus
extern "C" {
#endif

/// Looks up every absolute system path that the library itself opens (configuration, settings,
/// marker file, service links, pid files, programs) below this directory. Null or empty, the
/// default, means the real paths. Paths of callers, stored paths, statements and messages are the
/// same either way. A root that does not fit 4,095 bytes is refused with -1; otherwise 0.
MEDIIDX_EXPORT int TAVOMediaIndexRootSet(const char* root);

#ifdef __cplusplus
}
#endif

#endif
