// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The kinds of batches. Each saves all of its records, or throws and has saved none.
#ifndef MEDIIDX_DATABASE_MANY_KINDS_H_
#define MEDIIDX_DATABASE_MANY_KINDS_H_

#include <functional>
#include <map>
#include <span>
#include <string_view>

#include "database/many.h"

namespace mediidx::many {

void save_songs(std::span<File> files);
void save_videos(std::span<File> files);
void save_photos(std::span<File> files);
void save_playlists(std::span<File> files);
void save_directories(std::span<const DIR_INFO_REC* const> folders);

/// The last of the files of each path, which is the one whose rows stay.
std::map<std::string_view, const File*> last_of_each_path(std::span<const File> files);

}  // namespace mediidx::many

#endif
