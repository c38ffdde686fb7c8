// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavoindex.h>

#include <limits>
#include <memory>
#include <set>

#include "tags/media_file.h"

namespace mediidx::tool {
namespace {

using Record = __tag_TAVO_MEDIA_INFO;

/// A file with a value of its own in every field. One that is added stops it from compiling.
MediaFile full_file() {
  MediaFile file;
  auto& [path, kind, title, album, artist, album_artist, genre, composer, comment, camera_make,
         camera_model, exposure, aperture, timetaken, date, mdate, video_codec, container_type,
         audio_codec, fs_uuid, track, disc, year, duration, bitrate, frame_bitrate, video_bitrate,
         frame_rate_num, frame_rate_den, frequency, channel, resolution_x, resolution_y, covercount,
         iso, video_profile, video_level, filesize, gain] = file;
  int number = 0;
  const auto set = [&number](auto& field) {
    ++number;
    if constexpr (std::is_same_v<std::remove_reference_t<decltype(field)>, std::string>) {
      field = "text " + std::to_string(number);
    } else {
      field = number;
    }
  };
  const auto set_all = [&set](auto&... fields) { (set(fields), ...); };
  set_all(path, title, album, artist, album_artist, genre, composer, comment, camera_make,
          camera_model, exposure, aperture, timetaken, date, mdate, video_codec, container_type,
          audio_codec, fs_uuid, track, disc, year, duration, bitrate, frame_bitrate, video_bitrate,
          frame_rate_num, frame_rate_den, frequency, channel, resolution_x, resolution_y,
          covercount, iso, video_profile, video_level, filesize);
  static_cast<void>(kind);
  gain = {-1.5, 0.5, -2.5, 0.75};
  return file;
}

std::unique_ptr<Record> record_of(const MediaFile& file) {
  auto record = std::make_unique<Record>();
  EXPECT_EQ(MediaInfoJson2Object(to_json(file), record.get()), 0);
  return record;
}

TEST(TheJsonOfAFile, FillsEveryFieldOfTheRecord) {
  const auto file = full_file();
  const auto record = record_of(file);
  EXPECT_EQ(record->path, file.path);
  EXPECT_EQ(record->track, file.track);
  EXPECT_EQ(record->disc, file.disc);
  EXPECT_EQ(record->year, file.year);
  EXPECT_EQ(record->title, file.title);
  EXPECT_EQ(record->album, file.album);
  EXPECT_EQ(record->artist, file.artist);
  EXPECT_EQ(record->album_artist, file.album_artist);
  EXPECT_EQ(record->genre, file.genre);
  EXPECT_EQ(record->composer, file.composer);
  EXPECT_EQ(record->comment, file.comment);
  EXPECT_EQ(record->camera_make, file.camera_make);
  EXPECT_EQ(record->camera_model, file.camera_model);
  EXPECT_EQ(record->exposure, file.exposure);
  EXPECT_EQ(record->aperture, file.aperture);
  EXPECT_EQ(record->timetaken, file.timetaken);
  EXPECT_EQ(record->date, file.date);
  EXPECT_EQ(record->mdate, file.mdate);
  EXPECT_EQ(record->duration, file.duration);
  EXPECT_EQ(record->bitrate, file.bitrate);
  EXPECT_EQ(record->frame_bitrate, file.frame_bitrate);
  EXPECT_EQ(record->video_bitrate, file.video_bitrate);
  EXPECT_EQ(record->frame_rate_num, file.frame_rate_num);
  EXPECT_EQ(record->frame_rate_den, file.frame_rate_den);
  EXPECT_EQ(record->frequency, file.frequency);
  EXPECT_EQ(record->channel, file.channel);
  EXPECT_EQ(record->resolutionX, file.resolution_x);
  EXPECT_EQ(record->resolutionY, file.resolution_y);
  EXPECT_EQ(record->filesize, file.filesize);
  EXPECT_EQ(record->covercount, file.covercount);
  EXPECT_EQ(record->iso, file.iso);
  EXPECT_EQ(record->video_codec, file.video_codec);
  EXPECT_EQ(record->container_type, file.container_type);
  EXPECT_EQ(record->video_profile, file.video_profile);
  EXPECT_EQ(record->video_level, file.video_level);
  EXPECT_EQ(record->audio_codec, file.audio_codec);
  EXPECT_EQ(record->fs_uuid, file.fs_uuid);
}

TEST(TheJsonOfAFile, IsTheOneThatItsRecordGivesBack) {
  const auto file = full_file();
  const auto json = to_json(file);
  Json::Value back;
  ASSERT_EQ(MediaInfoObject2Json(record_of(file).get(), &back), 0);
  const auto ours = json.getMemberNames();
  std::set<std::string> names(ours.begin(), ours.end());
  for (const char* gain : {"rg_track_gain", "rg_track_peak", "rg_album_gain", "rg_album_peak"}) {
    EXPECT_EQ(names.erase(gain), 1U) << gain;  // The request takes them, not the record.
  }
  back.removeMember("id");  // The database gives it.
  const auto theirs = back.getMemberNames();
  EXPECT_EQ(names, std::set<std::string>(theirs.begin(), theirs.end()));
  for (const auto& name : theirs) EXPECT_EQ(back[name], json[name]) << name;
}

TEST(TheJsonOfAFile, HasItsGains) {
  const auto json = to_json(full_file());
  EXPECT_EQ(json["rg_track_gain"].asDouble(), -1.5);
  EXPECT_EQ(json["rg_track_peak"].asDouble(), 0.5);
  EXPECT_EQ(json["rg_album_gain"].asDouble(), -2.5);
  EXPECT_EQ(json["rg_album_peak"].asDouble(), 0.75);
  EXPECT_FALSE(to_json(MediaFile()).isMember("rg_track_gain"));
}

TEST(TheJsonOfAFile, KeepsWithinTheRecordWhatIsTooLarge) {
  auto file = full_file();
  file.title = std::string(252, 'x') + "日本" + std::string(100'000, 'y');
  file.exposure = std::string(100, 'z');
  file.bitrate = std::numeric_limits<int>::max();
  file.filesize = std::numeric_limits<std::int64_t>::max();
  file.duration = 1e300;
  const auto record = record_of(file);
  EXPECT_EQ(record->title, std::string(252, 'x'));
  EXPECT_EQ(record->exposure, std::string(19, 'z'));
  EXPECT_EQ(record->bitrate, std::numeric_limits<std::int32_t>::max());
  EXPECT_EQ(record->filesize, std::numeric_limits<std::int64_t>::max());
  EXPECT_EQ(record->duration, std::numeric_limits<float>::max());
}

}  // namespace
}  // namespace mediidx::tool
