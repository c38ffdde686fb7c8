// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The steps of adding a file.
#ifndef MEDIIDX_API_ADD_FILE_H_
#define MEDIIDX_API_ADD_FILE_H_

#include <array>
#include <optional>

#include "mediidx/record.h"

namespace mediidx {

/// The result for a path that nothing is saved of: a folder (logged), or one that does not belong
/// in the index. Empty when the file is to be saved.
std::optional<int> result_without_save(const char* path, MEDIA_TABLE_TYPE type);

/// Saves a file; the replay gain is a song's, the virtual tracks are a cue sheet's.
int save_file(__tag_TAVO_MEDIA_INFO& info, MEDIA_TABLE_TYPE type,
              const std::optional<std::array<float, 4>>& gains = std::nullopt);

/// -1, logged.
int add_bad_parameter();
int file_not_saved();

}  // namespace mediidx

#endif
