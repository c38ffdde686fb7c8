// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <json/reader.h>
#include <tavoindex.h>

#include <cmath>
#include <memory>

#include "fuzz.h"

namespace {

using namespace mediidx;
using Info = __tag_TAVO_MEDIA_INFO;

void check_every_text(const Info& info) {
  fuzz::check_texts(info);
  fuzz::check(fuzz::is_terminated(info.camera_make) && fuzz::is_terminated(info.camera_model) &&
              fuzz::is_terminated(info.exposure) && fuzz::is_terminated(info.aperture) &&
              fuzz::is_terminated(info.timetaken) && fuzz::is_terminated(info.date) &&
              fuzz::is_terminated(info.mdate) && fuzz::is_terminated(info.video_codec) &&
              fuzz::is_terminated(info.container_type) && fuzz::is_terminated(info.audio_codec) &&
              fuzz::is_terminated(info.fs_uuid));
}

}  // namespace

/// A record that could be read is written and read again as the same.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const std::unique_ptr<Json::CharReader> reader(Json::CharReaderBuilder().newCharReader());
  const auto text = fuzz::text(data, size);
  Json::Value json;
  try {
    if (!reader->parse(text.data(), text.data() + text.size(), &json, nullptr)) return 0;
  } catch (const Json::Exception&) {
    return 0;  // The reader's own limits.
  }
  const auto info = std::make_unique<Info>();
  std::memset(info.get(), 'x', sizeof(Info));
  const bool read = MediaInfoJson2Object(json, info.get()) == 0;
  fuzz::check(read == (info->path[0] != '\0'));
  check_every_text(*info);
  fuzz::check(std::isfinite(info->duration));
  if (!read) return 0;
  fuzz::check(json.isObject() && json["szPath"].asString() == info->path);

  Json::Value written;
  const auto again = std::make_unique<Info>();
  fuzz::check(MediaInfoObject2Json(info.get(), &written) == 0);
  fuzz::check(MediaInfoJson2Object(written, again.get()) == 0);
  fuzz::check(std::memcmp(info.get(), again.get(), sizeof(Info)) == 0);
  return 0;
}
