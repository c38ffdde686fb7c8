// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "scan/indexer.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <tavoindex.h>

#include <filesystem>
#include <memory>
#include <stdexcept>

#include "mediidx/request.h"
#include "support/text.h"
#include "tags/file_times.h"
#include "tags/volume_id.h"

namespace mediidx::tool {
namespace {

enum class Round { kMedia, kPlaylists, kCueSheets };

Round round_of(Kind kind) {
  if (kind == Kind::kCueSheet) return Round::kCueSheets;
  return kind == Kind::kPlaylist ? Round::kPlaylists : Round::kMedia;
}

std::unique_ptr<DIR_INFO_REC> folder_record(const std::string& path) {
  auto record = std::make_unique<DIR_INFO_REC>();
  copy_text(record->path, path);
  copy_text(record->title, std::filesystem::path(path).filename().native());
  copy_text(record->fs_uuid, volume_id(path));
  struct statx status{};
  if (statx(AT_FDCWD, path.c_str(), 0, STATX_BASIC_STATS | STATX_BTIME, &status) == 0) {
    const auto times = file_times(status);
    copy_text(record->date, times.created);
    copy_text(record->mdate, times.modified);
  }
  return record;
}

}  // namespace

IndexReport Indexer::run(const Found& found) {
  report_ = {};
  report_.failures = found.failures;
  for (const auto& folder : found.folders) {
    if (asks_to_stop(folder)) return std::move(report_);
    add_folder(folder);
  }
  for (const auto round : {Round::kMedia, Round::kPlaylists, Round::kCueSheets}) {
    for (const auto& file : found.files) {
      if (round_of(file.kind) != round) continue;
      if (asks_to_stop(file.path)) return std::move(report_);
      add_file(file);
    }
  }
  return std::move(report_);
}

bool Indexer::asks_to_stop(const std::string& path) {
  report_.stopped = !go_on_(path);
  return report_.stopped;
}

void Indexer::add_folder(const std::string& path) {
  if (TAVOMediaIndexIsIndexPath(path.c_str(), MEDIA_TABLE_DIRECTORY) <= 0) return;
  const auto record = folder_record(path);
  if (TAVOMediaIndexDirAdd(record.get()) == 0) {
    ++report_.folders;
  } else {
    take_failure(path, "it is no longer there");
  }
}

void Indexer::add_file(const FoundFile& file) {
  if (TAVOMediaIndexIsIndexPath(file.path.c_str(), table_of(file.kind)) <= 0) {
    ++report_.switched_off;
    return;
  }
  try {
    save(read_media_file(file.path, file.kind));
  } catch (const ReadError& error) {
    report_.failures.push_back({file.path, error.what()});
  }
}

void Indexer::save(const MediaFile& file) {
  const auto json = to_json(file);
  const auto table = table_of(file.kind);
  int result = 0;
  // Only the JSON request takes replay gain.
  if (file.gain.track_gain) {
    result = TAVOMediaIndexAdd_Json(json, table);
  } else {
    const auto record = std::make_unique<__tag_TAVO_MEDIA_INFO>();
    result =
        MediaInfoJson2Object(json, record.get()) == 0 ? TAVOMediaIndexAdd(record.get(), table) : -1;
  }
  if (result == 0) {
    ++report_.files[static_cast<std::size_t>(file.kind)];
  } else {
    const bool is_cue_sheet = file.kind == Kind::kCueSheet;
    take_failure(file.path,
                 is_cue_sheet ? "the cue sheet cannot be understood" : "it could not be saved",
                 is_cue_sheet ? "the sheet's tracks: " : "");
  }
}

void Indexer::take_failure(const std::string& path, const std::string& fallback,
                           const std::string& about) {
  const auto reason = database_.last_error();
  if (!database_.answers()) {
    throw std::runtime_error("the database no longer answers" +
                             (reason.empty() ? "" : ": " + reason));
  }
  report_.failures.push_back({path, reason.empty() ? fallback : about + reason});
}

}  // namespace mediidx::tool
