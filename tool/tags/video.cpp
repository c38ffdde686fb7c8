// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tags/av_input.h"
#include "tags/file_times.h"
#include "tags/readers.h"
#include "tags/replay_gain.h"

namespace mediidx::tool {
namespace {

constexpr const char* kGainTags[] = {"REPLAYGAIN_TRACK_GAIN", "REPLAYGAIN_TRACK_PEAK",
                                     "REPLAYGAIN_ALBUM_GAIN", "REPLAYGAIN_ALBUM_PEAK"};

/// The rate that the stream's header tells, or the one that Matroska's writers leave as a tag.
int bit_rate_of(const AVStream* stream) {
  if (!stream) return 0;
  if (stream->codecpar->bit_rate > 0) return to_int(stream->codecpar->bit_rate);
  const auto* entry = av_dict_get(stream->metadata, "BPS", nullptr, 0);
  return entry ? leading_number(entry->value) : 0;
}

void read_audio_stream(const AVStream* audio, MediaFile& out) {
  if (!audio) return;
  out.bitrate = bit_rate_of(audio);
  out.frequency = to_int(audio->codecpar->sample_rate);
  out.channel = to_int(audio->codecpar->ch_layout.nb_channels);
}

void read_video_stream(const AvInput& input, AVStream* video, MediaFile& out) {
  const auto* codec = video->codecpar;
  out.video_codec = codec_of(video);
  out.video_profile = to_int(codec->profile);
  out.video_level = to_int(codec->level);
  out.resolution_x = to_int(codec->width);
  out.resolution_y = to_int(codec->height);
  out.video_bitrate = bit_rate_of(video);
  const auto rate = av_guess_frame_rate(input.context(), video, nullptr);
  if (rate.num > 0 && rate.den > 0) {
    out.frame_rate_num = rate.num;
    out.frame_rate_den = rate.den;
  }
}

}  // namespace

void read_video(MediaFile& file) {
  const AvInput input(file.path);
  const auto* video = input.stream(AVMEDIA_TYPE_VIDEO);
  const auto* audio = input.stream(AVMEDIA_TYPE_AUDIO);
  if (!video && !audio) throw ReadError("it has neither picture nor sound");
  file.title = input.tag("title");
  file.album = input.tag("album");
  file.duration = input.duration_s();
  file.frame_bitrate = input.bit_rate();
  file.container_type = input.container(file.path);
  file.audio_codec = codec_of(audio);
  read_audio_stream(audio, file);
  if (video) read_video_stream(input, input.context()->streams[video->index], file);
  // What is not sound is picture, where the sound's share of the whole is known.
  const bool sound_known = !audio || file.bitrate > 0;
  if (video && sound_known && file.video_bitrate == 0 && file.frame_bitrate > file.bitrate) {
    file.video_bitrate = file.frame_bitrate - file.bitrate;
  }
}

void read_other_music(MediaFile& file) {
  const AvInput input(file.path);
  const auto* audio = input.stream(AVMEDIA_TYPE_AUDIO);
  if (!audio || audio->codecpar->sample_rate <= 0) throw ReadError("it has no sound");
  file.title = input.tag("title");
  file.album = input.tag("album");
  file.artist = input.tag("artist");
  file.album_artist = input.tag("album_artist");
  file.genre = input.tag("genre");
  file.composer = input.tag("composer");
  file.comment = input.tag("comment");
  file.year = year_of(input.tag("date"));
  file.track = leading_number(input.tag("track"));
  file.disc = leading_number(input.tag("disc"));
  file.duration = input.duration_s();
  read_audio_stream(audio, file);
  if (file.bitrate == 0) file.bitrate = input.bit_rate();
  file.video_codec = codec_of(audio);
  file.container_type = input.container(file.path);
  std::map<std::string, std::string> gains;
  for (const char* name : kGainTags) gains[name] = input.tag(name);
  file.gain = replay_gain_of(gains);
}

}  // namespace mediidx::tool
