// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Work that others should not notice.
#ifndef MEDIIDX_TOOL_SCAN_PRIORITY_H_
#define MEDIIDX_TOOL_SCAN_PRIORITY_H_

namespace mediidx::tool {

/// This process, and those that it starts from now on, get the processor and the disks when nobody
/// else wants them. What the kernel refuses is left as it is.
void become_idle();

}  // namespace mediidx::tool

#endif
