// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <border.h>
#include <mediidx/record.h>
#include <tavoindex.h>
#include <utf8.h>

#include <array>
#include <cstddef>
#include <cstring>
#include <span>
#include <string>
#include <utility>

#include "json_field.h"

namespace mediidx::platform {

namespace {

using Record = __tag_TAVO_MEDIA_INFO;

enum class Kind { kText, kInt32, kUInt32, kInt64, kFloat };

template <class T>
constexpr Kind kKindOf = Kind::kText;
template <>
constexpr Kind kKindOf<std::int32_t> = Kind::kInt32;
template <>
constexpr Kind kKindOf<std::uint32_t> = Kind::kUInt32;
template <>
constexpr Kind kKindOf<std::int64_t> = Kind::kInt64;
template <>
constexpr Kind kKindOf<float> = Kind::kFloat;

struct Field {
  const char* name;
  Kind kind;
  std::size_t offset;
  std::size_t size;
};

#define FIELD(name) \
  Field { #name, kKindOf<decltype(Record::name)>, offsetof(Record, name), sizeof(Record::name) }

// Every field but the path, which stands under a name of its own, and the reserved words.
constexpr std::array kFields{
    FIELD(id),
    FIELD(track),
    FIELD(disc),
    FIELD(year),
    FIELD(title),
    FIELD(album),
    FIELD(artist),
    FIELD(album_artist),
    FIELD(genre),
    FIELD(composer),
    FIELD(comment),
    FIELD(camera_make),
    FIELD(camera_model),
    FIELD(exposure),
    FIELD(aperture),
    FIELD(timetaken),
    FIELD(date),
    FIELD(mdate),
    FIELD(duration),
    FIELD(bitrate),
    FIELD(frame_bitrate),
    FIELD(video_bitrate),
    FIELD(frame_rate_num),
    FIELD(frame_rate_den),
    FIELD(frequency),
    FIELD(channel),
    FIELD(resolutionX),
    FIELD(resolutionY),
    FIELD(filesize),
    FIELD(covercount),
    FIELD(iso),
    FIELD(video_codec),
    FIELD(container_type),
    FIELD(video_profile),
    FIELD(video_level),
    FIELD(audio_codec),
    FIELD(fs_uuid),
};

#undef FIELD

template <class T>
void store(char* place, T value) {
  std::memcpy(place, &value, sizeof value);
}

void fill_field(const Field& field, const Json::Value& value, Record& record) {
  char* place = reinterpret_cast<char*>(&record) + field.offset;
  switch (field.kind) {
    case Kind::kText:
      return copy_cut({place, field.size}, text_of(value));
    case Kind::kInt32:
      return store(place, integer_of<std::int32_t>(value));
    case Kind::kUInt32:
      return store(place, integer_of<std::uint32_t>(value));
    case Kind::kInt64:
      return store(place, integer_of<std::int64_t>(value));
    case Kind::kFloat:
      return store(place, float_of(value));
  }
}

/// Whether the path is one that a record can hold whole; a cut one would name another file.
bool fill_path(const Json::Value& path, Record& record) {
  const auto text = text_of(path);
  const bool whole = path.isString() && text.size() == path.asString().size();
  return whole && !text.empty() &&
         copy_whole(std::span(record.path).first(MEDIIDX_PATH_SIZE), text);
}

template <class T>
T load(const char* place) {
  T value;
  std::memcpy(&value, place, sizeof value);
  return value;
}

std::string text_at(const char* place, std::size_t size) { return {place, strnlen(place, size)}; }

Json::Value field_value(const Field& field, const Record& record) {
  const char* place = reinterpret_cast<const char*>(&record) + field.offset;
  switch (field.kind) {
    case Kind::kText:
      return text_at(place, field.size);
    case Kind::kInt32:
      return load<std::int32_t>(place);
    case Kind::kUInt32:
      return load<std::uint32_t>(place);
    case Kind::kInt64:
      return Json::Int64{load<std::int64_t>(place)};
    case Kind::kFloat:
      return load<float>(place);
  }
  return {};
}

}  // namespace

}  // namespace mediidx::platform

int MediaInfoJson2Object(const Json::Value& json, __tag_TAVO_MEDIA_INFO* info) {
  namespace platform = mediidx::platform;
  if (!info) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "media_json.cpp", 1);
  return platform::no_throw(-1, "media_json.cpp", 2, [&] {
    std::memset(info, 0, sizeof *info);
    if (!json.isObject() || !platform::fill_path(json["szPath"], *info)) {
      return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "media_json.cpp", 3);
    }
    for (const auto& field : platform::kFields) {
      platform::fill_field(field, json[field.name], *info);
    }
    return 0;
  });
}

int MediaInfoObject2Json(const __tag_TAVO_MEDIA_INFO* info, Json::Value* json) {
  namespace platform = mediidx::platform;
  if (!info || !json) return platform::failed(-1, TAVO_ERR_BAD_PARAMETERS, "media_json.cpp", 4);
  return platform::no_throw(-1, "media_json.cpp", 5, [&] {
    Json::Value out(Json::objectValue);
    out["szPath"] = platform::text_at(info->path, MEDIIDX_PATH_SIZE);
    for (const auto& field : platform::kFields) {
      out[field.name] = platform::field_value(field, *info);
    }
    *json = std::move(out);
    return 0;
  });
}
