// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Deferring reloads of the in-memory copy for the length of a block.
#ifndef MEDIIDX_INDEXFOLDER_RELOAD_LOCK_H_
#define MEDIIDX_INDEXFOLDER_RELOAD_LOCK_H_

#include "mediidx/index_folder.h"

namespace mediidx {

/// Does not nest: the first to end lets reloads through.
class ReloadLock {
 public:
  ReloadLock() { IndexFolderConfLock(); }
  ~ReloadLock() { IndexFolderConfUnLock(); }
  ReloadLock(const ReloadLock&) = delete;
  ReloadLock& operator=(const ReloadLock&) = delete;
};

}  // namespace mediidx

#endif
