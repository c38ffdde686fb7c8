// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/av_input.h"

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavutil/dict.h>
#include <libavutil/error.h>
#include <libavutil/log.h>
}

#include <algorithm>
#include <array>
#include <limits>
#include <string_view>

#include "tags/file_times.h"
#include "text/legacy_text.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

constexpr const char* kFormats =
    "matroska,webm,mov,mp4,m4a,3gp,3g2,mj2,avi,asf,flv,mpeg,mpegts,mpegvideo,m4v,h264,hevc,ogg,rm,"
    "wtv,mxf,nut,dv,ivf,nsv,mp3,aac,ac3,eac3,dts,dtshd,truehd,amr,au,caf,dsf,iff,w64,wav,aiff,flac,"
    "ape,mpc,mpc8,tta,tak,wv,voc,oma,xwma";

std::string reason_of(int error) {
  std::array<char, AV_ERROR_MAX_STRING_SIZE> text;
  av_strerror(error, text.data(), text.size());
  return text.data();
}

std::string extension_of(const std::string& path) {
  auto extension = path.substr(path.rfind('.') + 1);
  std::ranges::transform(extension, extension.begin(), [](unsigned char c) {
    return static_cast<char>(c >= 'A' && c <= 'Z' ? c - 'A' + 'a' : c);
  });
  return extension;
}

std::string find_tag(const AVDictionary* tags, const char* name) {
  const auto* entry = av_dict_get(tags, name, nullptr, 0);
  return entry ? clean_text(decode_legacy(entry->value)) : std::string();
}

bool is_cover(const AVStream* stream) {
  return (stream->disposition & AV_DISPOSITION_ATTACHED_PIC) != 0;
}

void take(const AVDictionary* tags, NamedTags& out) {
  const AVDictionaryEntry* entry = nullptr;
  while ((entry = av_dict_get(tags, "", entry, AV_DICT_IGNORE_SUFFIX))) {
    out.add(entry->key, decode_legacy(entry->value));
  }
}

}  // namespace

AvInput::AvInput(const std::string& path) {
  av_log_set_level(AV_LOG_QUIET);
  AVDictionary* options = nullptr;
  av_dict_set(&options, "protocol_whitelist", "file", 0);
  av_dict_set(&options, "format_whitelist", kFormats, 0);
  int error = avformat_open_input(&context_, ("file:" + path).c_str(), nullptr, &options);
  av_dict_free(&options);
  if (error < 0) throw ReadError(reason_of(error));
  error = avformat_find_stream_info(context_, nullptr);
  if (error < 0) {
    avformat_close_input(&context_);
    throw ReadError(reason_of(error));
  }
}

AvInput::~AvInput() { avformat_close_input(&context_); }

const AVStream* AvInput::best_stream(AVMediaType type) const {
  const int index = av_find_best_stream(context_, type, -1, -1, nullptr, 0);
  if (index < 0) return nullptr;
  const auto* found = context_->streams[index];
  return is_cover(found) ? first_stream(type) : found;
}

const AVStream* AvInput::first_stream(AVMediaType type) const {
  for (unsigned i = 0; i < context_->nb_streams; ++i) {
    const auto* found = context_->streams[i];
    if (found->codecpar->codec_type == type && !is_cover(found)) return found;
  }
  return nullptr;
}

std::string AvInput::tag(const char* name) const {
  auto text = find_tag(context_->metadata, name);
  const auto* audio = text.empty() ? first_stream(AVMEDIA_TYPE_AUDIO) : nullptr;
  return audio ? find_tag(audio->metadata, name) : text;
}

NamedTags AvInput::tags() const {
  NamedTags out{TagFamily::kOther, {}};
  take(context_->metadata, out);
  if (const auto* audio = first_stream(AVMEDIA_TYPE_AUDIO)) take(audio->metadata, out);
  for (unsigned i = 0; i < context_->nb_streams; ++i) out.covers += is_cover(context_->streams[i]);
  return out;
}

double AvInput::duration_s() const {
  return context_->duration > 0 ? static_cast<double>(context_->duration) / AV_TIME_BASE : 0;
}

int AvInput::bit_rate() const { return to_int(context_->bit_rate); }

std::string AvInput::container(const std::string& path) const {
  const std::string names = context_->iformat->name;
  auto extension = extension_of(path);
  const bool shared = ("," + names + ",").find("," + extension + ",") != std::string::npos;
  if (shared) return extension;
  // One reader serves the whole family; a file with a foreign extension is most likely this one.
  if (names.starts_with("mov,")) return "mp4";
  return names.substr(0, names.find(','));
}

int to_int(std::int64_t value) {
  return value > 0 && value <= std::numeric_limits<int>::max() ? static_cast<int>(value) : 0;
}

std::string codec_of(const AVStream* stream) {
  return stream ? avcodec_get_name(stream->codecpar->codec_id) : "";
}

int bit_rate_of(const AVStream* stream) {
  if (!stream) return 0;
  if (stream->codecpar->bit_rate > 0) return to_int(stream->codecpar->bit_rate);
  const auto* entry = av_dict_get(stream->metadata, "BPS", nullptr, 0);
  return entry ? leading_number(entry->value) : 0;
}

}  // namespace mediidx::tool
