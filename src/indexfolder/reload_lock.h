// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Deferring reloads of the in-memory copy for the length of a block.
#ifndef MEDIIDX_INDEXFOLDER_RELOAD_LOCK_H_
#define MEDIIDX_INDEXFOLDER_RELOAD_LOCK_H_

#include "indexfolder/folder_index.h"
#include "mediidx/index_folder.h"

namespace mediidx {

/// Ends the deferral, and does the reload that was asked for meanwhile.
void let_reloads_through();

/// Does not nest: the first to end lets reloads through.
class ReloadLock {
 public:
  ReloadLock() {
    // Locked already: by a caller, who may be changing entries.
    if (gIsBlockUpdate) forget_folder_index();
    gIsBlockUpdate = 1;
  }
  ~ReloadLock() { let_reloads_through(); }
  ReloadLock(const ReloadLock&) = delete;
  ReloadLock& operator=(const ReloadLock&) = delete;
};

}  // namespace mediidx

#endif
