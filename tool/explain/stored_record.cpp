// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "explain/stored_record.h"

#include <tavoindex.h>

#include <array>
#include <cstdio>
#include <memory>
#include <stdexcept>
#include <type_traits>

#include "database/record.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

using Record = __tag_TAVO_MEDIA_INFO;

template <auto Member>
Json::Value value_of(const Record& record) {
  if constexpr (std::is_array_v<std::remove_cvref_t<decltype(record.*Member)>>) {
    return std::string(record.*Member);
  } else if constexpr (std::is_same_v<std::remove_cvref_t<decltype(record.*Member)>,
                                      std::int64_t>) {
    return Json::Int64{record.*Member};
  } else {
    return record.*Member;
  }
}

struct Field {
  const char* name;
  const char* json;  ///< Its name in the JSON that fills the record.
  Json::Value (*value)(const Record&);
};

template <auto Member>
constexpr Field field(const char* name) {
  return {name, name, value_of<Member>};
}

constexpr std::array kFields{
    Field{"path", "szPath", value_of<&Record::path>},
    field<&Record::track>("track"),
    field<&Record::disc>("disc"),
    field<&Record::year>("year"),
    field<&Record::title>("title"),
    field<&Record::album>("album"),
    field<&Record::artist>("artist"),
    field<&Record::album_artist>("album_artist"),
    field<&Record::genre>("genre"),
    field<&Record::composer>("composer"),
    field<&Record::comment>("comment"),
    field<&Record::camera_make>("camera_make"),
    field<&Record::camera_model>("camera_model"),
    field<&Record::exposure>("exposure"),
    field<&Record::aperture>("aperture"),
    field<&Record::timetaken>("timetaken"),
    field<&Record::date>("date"),
    field<&Record::mdate>("mdate"),
    field<&Record::bitrate>("bitrate"),
    field<&Record::frame_bitrate>("frame_bitrate"),
    field<&Record::video_bitrate>("video_bitrate"),
    field<&Record::frame_rate_num>("frame_rate_num"),
    field<&Record::frame_rate_den>("frame_rate_den"),
    field<&Record::frequency>("frequency"),
    field<&Record::channel>("channel"),
    field<&Record::resolutionX>("resolutionX"),
    field<&Record::resolutionY>("resolutionY"),
    field<&Record::filesize>("filesize"),
    field<&Record::covercount>("covercount"),
    field<&Record::iso>("iso"),
    field<&Record::video_codec>("video_codec"),
    field<&Record::container_type>("container_type"),
    field<&Record::video_profile>("video_profile"),
    field<&Record::video_level>("video_level"),
    field<&Record::audio_codec>("audio_codec"),
    field<&Record::fs_uuid>("fs_uuid"),
};

constexpr std::array kGains{"rg_track_gain", "rg_track_peak", "rg_album_gain", "rg_album_peak"};

bool is_unset(const Json::Value& value) {
  return value.isNull() || (value.isString() ? value.asString().empty() : value.asDouble() == 0);
}

std::string note_on(const Json::Value& read, const Json::Value& stored) {
  if (stored.isString()) {
    const auto before = read.asString();
    const auto after = stored.asString();
    if (before == after) return "";
    return before.starts_with(after) && after.size() + 1 < before.size()
               ? "cut to " + std::to_string(after.size()) + " bytes"
               : "white space around it removed";
  }
  return read.asDouble() == stored.asDouble() ? "" : "held within what the record can count";
}

StoredField duration(const Record& record, const MediaFile& file) {
  const int seconds = whole_seconds(record.duration);
  StoredField out{"duration", file.duration, seconds, ""};
  if (seconds != file.duration) {
    out.note = file.kind == Kind::kMusic ? "cut to whole seconds, but for the catalogue"
                                         : "cut to whole seconds";
  }
  return out;
}

/// Without a track gain the library stores none of them.
StoredField gain(const char* name, const Json::Value& read, bool is_stored) {
  if (!is_stored) return {name, read, Json::Value(), "not stored without a track gain"};
  std::array<char, 64> text;
  std::snprintf(text.data(), text.size(), "%f", static_cast<double>(read.asFloat()));
  return {name, read, text.data(), ""};
}

}  // namespace

std::vector<StoredField> stored_fields(const MediaFile& file) {
  const auto json = to_json(file);
  const auto record = std::make_unique<Record>();
  if (MediaInfoJson2Object(json, record.get()) != 0) {
    throw std::runtime_error(escape_for_display(file.path) + " is no path that can be stored");
  }
  trim_texts(*record);
  std::vector<StoredField> out;
  for (const auto& field : kFields) {
    const auto& read = json[field.json];
    if (is_unset(read)) continue;
    const auto stored = field.value(*record);
    out.push_back({field.name, read, stored, note_on(read, stored)});
  }
  if (file.duration != 0) out.push_back(duration(*record, file));
  const bool has_track_gain = !json[kGains[0]].isNull();
  for (const char* name : kGains) {
    if (!json[name].isNull()) out.push_back(gain(name, json[name], has_track_gain));
  }
  return out;
}

}  // namespace mediidx::tool
