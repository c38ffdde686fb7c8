// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Videos, photos and folders: one row each.
#include "database/many_batch.h"
#include "database/many_kinds.h"
#include "database/record.h"
#include "mediidx/database.h"

namespace mediidx::many {
namespace {

using Info = __tag_TAVO_MEDIA_INFO;

constexpr const char* kDeleteVideos =
    "DELETE FROM video USING unnest($1::text[]) AS given(path) "
    "WHERE video.path ~>=~ given.path AND video.path ~<=~ given.path";
constexpr const char* kDeletePhotos =
    "DELETE FROM photo USING unnest($1::text[]) AS given(path) "
    "WHERE photo.path ~>=~ given.path AND photo.path ~<=~ given.path";
constexpr const char* kUpdateDirectories =
    "UPDATE directory "
    "SET title = given.title, date = given.date, mdate = given.mdate, fs_uuid = given.fs_uuid "
    "FROM unnest($1::text[], $2::text[], $3::timestamp[], $4::timestamp[], $5::text[]) "
    "AS given(path, title, date, mdate, fs_uuid) "
    "WHERE directory.path ~>=~ given.path AND directory.path ~<=~ given.path "
    "RETURNING directory.path AS path";
constexpr const char* kUpdatePersonalDirectories =
    "UPDATE personal_directory "
    "SET userid = given.userid, title = given.title, date = given.date, mdate = given.mdate, "
    "fs_uuid = given.fs_uuid, updated = '1' "
    "FROM unnest($1::text[], $2::text[], $3::timestamp[], $4::timestamp[], $5::text[], "
    "$6::bigint[]) AS given(path, title, date, mdate, fs_uuid, userid) "
    "WHERE personal_directory.path = given.path "
    "RETURNING personal_directory.path AS path";

/// Replaces the rows of all paths by those of the last file of each.
template <class AddRow>
void replace_rows(std::span<File> files, const char* target, const char* delete_rows,
                  AddRow add_row) {
  for (auto& file : files) trim_texts(*file.info);
  const auto last = last_of_each_path(files);
  ArrayText paths;
  for (const auto& [path, file] : last) paths.add(path);
  CopyRows rows(target);
  CopyRows replaced(target);
  for (const auto& file : files) {
    add_row(last.at(file.info->path) == &file ? rows : replaced, *file.info);
  }
  Batch batch;
  batch.copy(replaced);
  batch.run(delete_rows, {paths.value()});
  batch.copy(rows);
  batch.commit();
}

/// Takes values as the tables would, and fails where they would.
constexpr const char* kCheckFolders =
    "SELECT count(*) FROM unnest($1::text[], $2::text[], $3::timestamp[], $4::timestamp[], "
    "$5::text[])";

/// The folders of one table by path, the last of each path.
using Folders = std::map<std::string_view, const DIR_INFO_REC*>;

/// One array for each column.
struct FolderColumns {
  FolderColumns() = default;
  explicit FolderColumns(const Folders& folders) {
    for (const auto& [path, folder] : folders) add(*folder);
  }
  void add(const DIR_INFO_REC& folder) {
    paths.add(folder.path);
    titles.add(folder.title);
    dates.add(date_or_epoch(folder.date));
    mdates.add(date_or_epoch(folder.mdate));
    fs_uuids.add(folder.fs_uuid);
  }
  ArrayText paths;
  ArrayText titles;
  ArrayText dates;
  ArrayText mdates;
  ArrayText fs_uuids;
};

/// Takes out those that have a row, which was brought up to date.
void drop_updated(const OwnedResult& rows, Folders& folders) {
  for_each_row(rows, [&](auto field) { folders.erase(field("path")); });
}

void save_shared(Batch& batch, Folders folders) {
  if (folders.empty()) return;
  FolderColumns columns(folders);
  drop_updated(batch.select(kUpdateDirectories,
                            {columns.paths.value(), columns.titles.value(), columns.dates.value(),
                             columns.mdates.value(), columns.fs_uuids.value()}),
               folders);
  CopyRows rows("directory(path, title, date, mdate, fs_uuid)");
  for (const auto& [path, folder] : folders) {
    rows.add(path, folder->title, date_or_epoch(folder->date), date_or_epoch(folder->mdate),
             folder->fs_uuid);
  }
  batch.copy(rows);
}

void save_personal(Batch& batch, Folders folders,
                   const std::map<std::string_view, std::int64_t>& owners) {
  if (folders.empty()) return;
  FolderColumns columns(folders);
  ArrayText userids;
  for (const auto& [path, folder] : folders) userids.add(std::to_string(owners.at(path)));
  drop_updated(batch.select(kUpdatePersonalDirectories,
                            {columns.paths.value(), columns.titles.value(), columns.dates.value(),
                             columns.mdates.value(), columns.fs_uuids.value(), userids.value()}),
               folders);
  CopyRows rows("personal_directory(userid, path, title, date, mdate, fs_uuid, updated)");
  for (const auto& [path, folder] : folders) {
    rows.add(owners.at(path), path, folder->title, date_or_epoch(folder->date),
             date_or_epoch(folder->mdate), folder->fs_uuid, 1);
  }
  batch.copy(rows);
}

}  // namespace

std::map<std::string_view, const File*> last_of_each_path(std::span<const File> files) {
  std::map<std::string_view, const File*> last;
  for (const auto& file : files) last[file.info->path] = &file;
  return last;
}

void save_videos(std::span<File> files) {
  constexpr const char* kTarget =
      "video(path, filesize, title, album, frame_bitrate, duration, resolutionx, resolutiony, "
      "audio_bitrate, frequency, channel, date, mdate, fs_uuid, video_codec, audio_codec, "
      "video_profile, video_level, container_type, frame_rate_num, frame_rate_den, "
      "video_bitrate)";
  replace_rows(files, kTarget, kDeleteVideos, [](CopyRows& rows, const Info& info) {
    rows.add(info.path, info.filesize, info.title, info.album, info.frame_bitrate,
             whole_seconds(info.duration), info.resolutionX, info.resolutionY, info.bitrate,
             info.frequency, info.channel, date_or_epoch(info.date), date_or_epoch(info.mdate),
             info.fs_uuid, info.video_codec, info.audio_codec, info.video_profile, info.video_level,
             info.container_type, info.frame_rate_num, info.frame_rate_den, info.video_bitrate);
  });
  TAVOIndexVideoTableDirtySet(1);
}

void save_photos(std::span<File> files) {
  constexpr const char* kTarget =
      "photo(path, filesize, title, album, camera_make, camera_model, exposure, aperture, "
      "resolutionx, resolutiony, iso, date, mdate, timetaken, fs_uuid)";
  replace_rows(files, kTarget, kDeletePhotos, [](CopyRows& rows, const Info& info) {
    rows.add(info.path, info.filesize, info.title, info.album, info.camera_make, info.camera_model,
             info.exposure, info.aperture, info.resolutionX, info.resolutionY, info.iso,
             date_or_epoch(info.date), date_or_epoch(info.mdate), date_or_epoch(info.timetaken),
             info.fs_uuid);
  });
}

void save_directories(std::span<const DIR_INFO_REC* const> folders) {
  std::map<std::string_view, std::int64_t> owners;
  Folders shared;
  Folders personal;
  FolderColumns replaced;
  for (const auto* folder : folders) {
    const auto owner = owner_of(folder->path);
    owners[folder->path] = owner;
    auto& last = (owner != 0 ? personal : shared)[folder->path];
    if (last) replaced.add(*last);
    last = folder;
  }
  Batch batch;
  if (!replaced.paths.empty()) {
    batch.run(kCheckFolders,
              {replaced.paths.value(), replaced.titles.value(), replaced.dates.value(),
               replaced.mdates.value(), replaced.fs_uuids.value()});
  }
  save_shared(batch, std::move(shared));
  save_personal(batch, std::move(personal), owners);
  batch.commit();
}

}  // namespace mediidx::many
