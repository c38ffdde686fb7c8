// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/many.h"

#include "database/many_batch.h"
#include "database/many_kinds.h"
#include "support/no_throw.h"

namespace mediidx::many {
namespace {

constexpr const char* kSelectDurations =
    "SELECT music.path, duration FROM music JOIN unnest($1::text[]) AS given(path) "
    "ON music.path ~>=~ given.path AND music.path ~<=~ given.path";

constexpr int kGivenUp = 730;

/// False when the batch was given up, for whatever reason.
template <class Body>
bool whole(Body body) {
  return no_throw(kDatabaseLog, false, [&] {
    try {
      body();
      return true;
    } catch (const GivenUp& reason) {
      kDatabaseLog.note(kGivenUp, "Nothing is saved together: %s", reason.what());
      return false;
    }
  });
}

}  // namespace

bool is_available() { return true; }

bool save_files(MEDIA_TABLE_TYPE type, std::span<File> files) {
  return whole([&] {
    switch (type) {
      case MEDIA_TABLE_MUSIC:
        return save_songs(files);
      case MEDIA_TABLE_VIDEO:
        return save_videos(files);
      case MEDIA_TABLE_PHOTO:
        return save_photos(files);
      case MEDIA_TABLE_PLAYLIST:
        return save_playlists(files);
      default:
        throw GivenUp("no table of files");
    }
  });
}

bool save_folders(std::span<const DIR_INFO_REC* const> folders) {
  return whole([&] { save_directories(folders); });
}

std::optional<std::map<std::string, std::string>> find_durations(
    const std::set<std::string>& paths) {
  std::map<std::string, std::string> durations;
  if (paths.empty()) return durations;
  const bool asked = whole([&] {
    Batch batch;
    ArrayText wanted(paths);
    for_each_row(batch.select(kSelectDurations, {wanted.value()}), [&](auto field) {
      const char* duration = field("duration");
      durations.try_emplace(field("path"), duration ? duration : "");
    });
  });
  if (!asked) return std::nullopt;
  return durations;
}

}  // namespace mediidx::many
