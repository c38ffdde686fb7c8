// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// What a media file tells about itself, as the index will hold it.
#ifndef MEDIIDX_TOOL_TAGS_MEDIA_FILE_H_
#define MEDIIDX_TOOL_TAGS_MEDIA_FILE_H_

#include <json/value.h>

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>

#include "mediidx/record.h"

namespace mediidx::tool {

/// What a file is, by its extension. Cue sheets are playlists that need their audio files indexed
/// first.
enum class Kind { kMusic, kPhoto, kVideo, kPlaylist, kCueSheet };
inline constexpr int kKinds = 5;

/// The kind of a file's name; empty for no media.
std::optional<Kind> kind_of(const std::string& path);
/// The kind as the library numbers it.
MEDIA_TABLE_TYPE table_of(Kind kind);

/// Decibels and linear peaks. Without a track gain the library stores none.
struct ReplayGain {
  std::optional<double> track_gain;
  std::optional<double> track_peak;
  std::optional<double> album_gain;
  std::optional<double> album_peak;
};

/// One file. Texts are as clean_text leaves them, of any length; 0 and empty mean unknown. Fields
/// are named and measured as those of the record.
struct MediaFile {
  std::string path;
  Kind kind = Kind::kMusic;

  std::string title;         ///< The file's name without its extension when it has no tag.
  std::string album;         ///< Of photos, videos and playlists: the folder's name.
  std::string artist;        ///< Several are separated by "; ".
  std::string album_artist;  ///< Likewise.
  std::string genre;         ///< Several are separated by ";".
  std::string composer;      ///< Several are separated by "; ".
  std::string comment;
  std::string camera_make;
  std::string camera_model;
  std::string exposure;   ///< "1/125", or seconds as "2.5".
  std::string aperture;   ///< "f/2.8"
  std::string timetaken;  ///< The camera's own time: "2004-05-01 12:00:00".
  std::string date;       ///< UTC, likewise.
  std::string mdate;      ///< UTC, likewise.
  std::string video_codec;
  std::string container_type;
  std::string audio_codec;
  std::string fs_uuid;
  int track = 0;
  int disc = 0;
  int year = 0;
  double duration = 0;
  int bitrate = 0;
  int frame_bitrate = 0;
  int video_bitrate = 0;
  int frame_rate_num = 0;
  int frame_rate_den = 0;
  int frequency = 0;
  int channel = 0;
  int resolution_x = 0;
  int resolution_y = 0;
  int covercount = 0;
  int iso = 0;
  int video_profile = 0;
  int video_level = 0;
  std::int64_t filesize = 0;
  ReplayGain gain;
};

/// A file that cannot be read as what its name says; what() is the reason, without the path.
struct ReadError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// Reads what the file system and the file's own tags tell. Throws ReadError.
MediaFile read_media_file(const std::string& path, Kind kind);

/// The file as the library's JSON requests take it: every field under its record's name.
Json::Value to_json(const MediaFile& file);

}  // namespace mediidx::tool

#endif
