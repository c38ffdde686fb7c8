// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The steps of adding a folder.
#ifndef MEDIIDX_API_ADD_FOLDER_H_
#define MEDIIDX_API_ADD_FOLDER_H_

#include <optional>

#include "mediidx/record.h"

namespace mediidx {

/// The result for a folder that is not there (logged), or does not belong in the index. Empty when
/// it is to be saved.
std::optional<int> result_without_save(const DIR_INFO_REC& folder);

int save_folder(const DIR_INFO_REC& folder);

}  // namespace mediidx

#endif
