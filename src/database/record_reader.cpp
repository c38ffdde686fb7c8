// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "database/record_reader.h"

#include <algorithm>
#include <charconv>
#include <cstdlib>
#include <span>
#include <string_view>

#include "mediidx/record.h"
#include "support/text.h"

namespace mediidx {
namespace {

using Info = __tag_TAVO_MEDIA_INFO;

template <std::size_t Size>
void assign(char (&field)[Size], const char* text) {
  copy_text(std::span(field).first(std::min<std::size_t>(Size, MEDIIDX_PATH_SIZE)), text);
}

template <std::integral Number>
void assign(Number& field, const char* text) {
  field = static_cast<Number>(std::strtoll(text, nullptr, 10));
}

/// Independent of the process's locale, unlike the C library's conversions.
void assign(float& field, const char* text) {
  field = 0;
  const std::string_view digits(text);
  std::from_chars(digits.data(), digits.data() + digits.size(), field);
}

struct Column {
  const char* name;
  void (*store)(Info&, const char*);
};

template <auto Field>
constexpr Column column(const char* name) {
  return {name, [](Info& info, const char* text) { assign(info.*Field, text); }};
}

constexpr Column kColumns[] = {
    column<&Info::path>("path"),
    column<&Info::title>("title"),
    column<&Info::album>("album"),
    column<&Info::id>("id"),
    column<&Info::artist>("artist"),
    column<&Info::album_artist>("album_artist"),
    column<&Info::composer>("composer"),
    column<&Info::comment>("comment"),
    column<&Info::year>("year"),
    column<&Info::genre>("genre"),
    column<&Info::bitrate>("bitrate"),
    column<&Info::track>("track"),
    column<&Info::disc>("disc"),
    column<&Info::covercount>("covercount"),
    column<&Info::video_codec>("codec"),
    column<&Info::container_type>("container"),
    column<&Info::video_codec>("video_codec"),
    column<&Info::audio_codec>("audio_codec"),
    column<&Info::container_type>("container_type"),
    column<&Info::frame_rate_num>("frame_rate_num"),
    column<&Info::frame_rate_den>("frame_rate_den"),
    column<&Info::frame_bitrate>("frame_bitrate"),
    column<&Info::video_bitrate>("video_bitrate"),
    column<&Info::bitrate>("audio_bitrate"),
    column<&Info::video_profile>("video_profile"),
    column<&Info::video_level>("video_level"),
    column<&Info::frequency>("frequency"),
    column<&Info::duration>("duration"),
    column<&Info::channel>("channel"),
    column<&Info::resolutionX>("resolutionX"),
    column<&Info::resolutionY>("resolutionY"),
    column<&Info::filesize>("filesize"),
    column<&Info::date>("date"),
    column<&Info::mdate>("mdate"),
    column<&Info::timetaken>("timetaken"),
};

}  // namespace

void read_record(tavodb_result* result, std::uint32_t row, Info& info) {
  for (const auto& column : kColumns) column.store(info, "");
  for (const auto& column : kColumns) {
    const char* text = TAVODBFetchField(result, row, column.name);
    if (text && *text) column.store(info, text);
  }
  std::ranges::fill(info.reserved, 0U);
}

}  // namespace mediidx
