// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "explain/raw_tags.h"

#include <fileref.h>
#include <tfilestream.h>
#include <tpropertymap.h>

#include <exiv2/exiv2.hpp>

#include "tags/av_input.h"
#include "tags/music_format.h"

namespace mediidx::tool {
namespace {

void take(const AVDictionary* tags, const std::string& prefix, std::vector<RawTag>& out) {
  const AVDictionaryEntry* entry = nullptr;
  while ((entry = av_dict_get(tags, "", entry, AV_DICT_IGNORE_SUFFIX))) {
    out.push_back({prefix + entry->key, entry->value});
  }
}

std::vector<RawTag> container_tags(const std::string& path) {
  const AvInput input(path);
  const auto* context = input.context();
  std::vector<RawTag> out;
  take(context->metadata, "", out);
  for (unsigned i = 0; i < context->nb_streams; ++i) {
    take(context->streams[i]->metadata, "stream " + std::to_string(i) + " ", out);
  }
  return out;
}

std::vector<RawTag> music_tags(const std::string& path) {
  TagLib::FileStream stream(path.c_str(), /*openReadOnly=*/true);
  if (is_matroska(stream)) return container_tags(path);
  const TagLib::FileRef opened(&stream);
  if (opened.isNull()) return container_tags(path);
  std::vector<RawTag> out;
  for (const auto& [name, values] : opened.file()->properties()) {
    for (const auto& value : values) out.push_back({name.to8Bit(true), value.to8Bit(true)});
  }
  return out;
}

/// Settings and texts, without thumbnails, makers' notes and what else is no text.
template <class Datum>
bool is_text_or_number(const Datum& datum) {
  constexpr long kLongestValue = 4096;
  return datum.typeId() != Exiv2::undefined && datum.size() <= kLongestValue;
}

template <class Data>
void take_data(const Data& data, std::vector<RawTag>& out) {
  for (const auto& datum : data) {
    if (is_text_or_number(datum)) out.push_back({datum.key(), datum.toString()});
  }
}

std::vector<RawTag> photo_tags(const std::string& path) {
  std::vector<RawTag> out;
  try {
    const auto image = Exiv2::ImageFactory::open(path);
    image->readMetadata();
    take_data(image->exifData(), out);
    take_data(image->iptcData(), out);
    take_data(image->xmpData(), out);
  } catch (const Exiv2::Error&) {
    out.clear();  // a photo of a format that only has a size
  }
  return out;
}

}  // namespace

std::vector<RawTag> raw_tags(const std::string& path, Kind kind) {
  switch (kind) {
    case Kind::kMusic:
      return music_tags(path);
    case Kind::kPhoto:
      return photo_tags(path);
    case Kind::kVideo:
      return container_tags(path);
    case Kind::kPlaylist:
    case Kind::kCueSheet:
      break;
  }
  return {};
}

}  // namespace mediidx::tool
