// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/media_file.h"

#include <fcntl.h>
#include <strings.h>
#include <sys/stat.h>
#include <tavoindex.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>

#include "tags/file_times.h"
#include "tags/readers.h"
#include "tags/volume_id.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

struct TextField {
  const char* name;
  std::string MediaFile::* text;
};
constexpr TextField kTexts[] = {
    {"szPath", &MediaFile::path},
    {"title", &MediaFile::title},
    {"album", &MediaFile::album},
    {"artist", &MediaFile::artist},
    {"album_artist", &MediaFile::album_artist},
    {"genre", &MediaFile::genre},
    {"composer", &MediaFile::composer},
    {"comment", &MediaFile::comment},
    {"camera_make", &MediaFile::camera_make},
    {"camera_model", &MediaFile::camera_model},
    {"exposure", &MediaFile::exposure},
    {"aperture", &MediaFile::aperture},
    {"timetaken", &MediaFile::timetaken},
    {"date", &MediaFile::date},
    {"mdate", &MediaFile::mdate},
    {"video_codec", &MediaFile::video_codec},
    {"container_type", &MediaFile::container_type},
    {"audio_codec", &MediaFile::audio_codec},
    {"fs_uuid", &MediaFile::fs_uuid},
};

struct NumberField {
  const char* name;
  int MediaFile::* number;
};
constexpr NumberField kNumbers[] = {
    {"track", &MediaFile::track},
    {"disc", &MediaFile::disc},
    {"year", &MediaFile::year},
    {"bitrate", &MediaFile::bitrate},
    {"frame_bitrate", &MediaFile::frame_bitrate},
    {"video_bitrate", &MediaFile::video_bitrate},
    {"frame_rate_num", &MediaFile::frame_rate_num},
    {"frame_rate_den", &MediaFile::frame_rate_den},
    {"frequency", &MediaFile::frequency},
    {"channel", &MediaFile::channel},
    {"resolutionX", &MediaFile::resolution_x},
    {"resolutionY", &MediaFile::resolution_y},
    {"covercount", &MediaFile::covercount},
    {"iso", &MediaFile::iso},
    {"video_profile", &MediaFile::video_profile},
    {"video_level", &MediaFile::video_level},
};

struct GainField {
  const char* name;
  std::optional<double> ReplayGain::* value;
};
constexpr GainField kGains[] = {
    {"rg_track_gain", &ReplayGain::track_gain},
    {"rg_track_peak", &ReplayGain::track_peak},
    {"rg_album_gain", &ReplayGain::album_gain},
    {"rg_album_peak", &ReplayGain::album_peak},
};

[[noreturn]] void fail_with_errno() { throw ReadError(std::strerror(errno)); }

/// Says why a file cannot be opened before a tag library says less.
void check_readable(const std::string& path) {
  const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY);
  if (descriptor < 0) fail_with_errno();
  close(descriptor);
}

void read_file_system(MediaFile& file) {
  struct statx status{};
  if (statx(AT_FDCWD, file.path.c_str(), 0, STATX_BASIC_STATS | STATX_BTIME, &status) != 0) {
    fail_with_errno();
  }
  file.filesize = static_cast<std::int64_t>(status.stx_size);
  const auto times = file_times(status);
  file.date = times.created;
  file.mdate = times.modified;
  file.fs_uuid = volume_id(file.path);
}

void read_tags(MediaFile& file) {
  switch (file.kind) {
    case Kind::kMusic:
      return read_music(file);
    case Kind::kPhoto:
      return read_photo(file);
    case Kind::kVideo:
      return read_video(file);
    case Kind::kPlaylist:
    case Kind::kCueSheet:
      return;
  }
}

void name_after_path(MediaFile& file) {
  const std::filesystem::path path(file.path);
  if (file.title.empty()) file.title = clean_text(path.stem().native());
  if (file.album.empty() && file.kind != Kind::kMusic) {
    file.album = clean_text(path.parent_path().filename().native());
  }
}

}  // namespace

std::optional<Kind> kind_of(const std::string& path) {
  // An extension of two kinds is of the first, in the order in which the library looks for it.
  const char* extension = TAVOIndexExtGet(path.c_str());
  if (BlTAVOIndexIsMusic(extension)) return Kind::kMusic;
  if (BlTAVOIndexIsPlaylist(extension)) {
    return strcasecmp(extension, "cue") == 0 ? Kind::kCueSheet : Kind::kPlaylist;
  }
  if (BlTAVOIndexIsPhoto(extension)) return Kind::kPhoto;
  if (BlTAVOIndexIsVideo(extension)) return Kind::kVideo;
  return std::nullopt;
}

MEDIA_TABLE_TYPE table_of(Kind kind) {
  switch (kind) {
    case Kind::kMusic:
      return MEDIA_TABLE_MUSIC;
    case Kind::kPhoto:
      return MEDIA_TABLE_PHOTO;
    case Kind::kVideo:
      return MEDIA_TABLE_VIDEO;
    case Kind::kPlaylist:
    case Kind::kCueSheet:
      break;
  }
  return MEDIA_TABLE_PLAYLIST;
}

MediaFile read_media_file(const std::string& path, Kind kind) {
  MediaFile file;
  file.path = path;
  file.kind = kind;
  check_readable(path);
  read_file_system(file);
  try {
    read_tags(file);
  } catch (const ReadError&) {
    throw;
  } catch (const std::bad_alloc&) {
    throw ReadError("its tags ask for more memory than there is");
  } catch (const std::exception& error) {
    throw ReadError(clean_text(error.what()));
  }
  name_after_path(file);
  return file;
}

Json::Value to_json(const MediaFile& file) {
  Json::Value out(Json::objectValue);
  for (const auto& field : kTexts) out[field.name] = file.*field.text;
  for (const auto& field : kNumbers) out[field.name] = file.*field.number;
  for (const auto& field : kGains) {
    if (file.gain.*field.value) out[field.name] = *(file.gain.*field.value);
  }
  out["duration"] = file.duration;
  out["filesize"] = Json::Int64{file.filesize};
  return out;
}

}  // namespace mediidx::tool
